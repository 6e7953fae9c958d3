/* simgp: from decoded frames to pixels on a screen.
 *
 * Fill one descriptor for the picture you have and one for the picture you want, and call:
 *
 *     simgp_img src = {0}, dst = {0};
 *     src.format = SIMGP_FMT_NV12;
 *     src.width[0]  = 640;   src.width[1]  = 320;
 *     src.height[0] = 480;   src.height[1] = 240;
 *     src.stride[0] = 640;   src.stride[1] = 640;
 *     src.plane[0]  = luma;  src.plane[1]  = chroma;
 *     dst.format    = SIMGP_FMT_RGB565;
 *     dst.stride[0] = 1280;
 *     dst.plane[0]  = screen;
 *     if (simgp_csc(&src, &dst) != SIMGP_OK) ...
 *
 * What holds for every function:
 *
 * - Each result is defined by a scalar integer formula, given at the function, and is the same to
 *   the byte on every processor, for every width, stride and alignment. The vector units make it
 *   fast, they never change it.
 * - Any size works. No plane needs padding or alignment, and no byte outside the visible samples is
 *   read or written, unless the function says so. A width or height of 0 or less does nothing.
 * - Strides are in bytes, from the first byte of a line to that of the next, and may be negative.
 *   The plane's pointer is then that of the line that is processed first, the one with the highest
 *   address.
 * - Source and destination must not share memory, unless the function says so.
 * - Nothing is allocated, unless the function is there to allocate. No threads, no state that a
 *   caller can see, no configuration, nothing to start up or shut down. All functions may run on
 *   any number of threads at once, on separate destinations.
 * - Functions that take descriptors check the formats, and codes and strengths that they are given,
 *   before they write anything; those that resize check the sizes as well. The kernels below them,
 *   which may be called directly, check nothing. Strides, pointers and all other sizes are yours to
 *   get right: offsets are computed in ptrdiff_t, so pictures may be as large as memory.
 *
 * Most kernels are declared by a type, which explains their parameters: simgp_csc_fn works on whole
 * pictures, simgp_plane_fn on one plane (both in img.h), simgp_rsz_fn resizes one plane (resize.h).
 *
 * Names give the operation and then the formats in the direction of the data:
 * simgp_csc_nv12_to_rgb565 reads NV12 and writes RGB565. csc is colour conversion, cpy copy, dbf8x8
 * deblocking, dit dithering, rot turns and mirrors, rsz resizing.
 */
#ifndef SIMGP_SIMGP_H
#define SIMGP_SIMGP_H

#include "simgp/copy.h"
#include "simgp/csc.h"
#include "simgp/csc_any.h"
#include "simgp/csc_rot.h"
#include "simgp/deblock.h"
#include "simgp/describe.h"
#include "simgp/dither.h"
#include "simgp/img.h"
#include "simgp/layout.h"
#include "simgp/names.h"
#include "simgp/packed2rgb.h"
#include "simgp/resize.h"
#include "simgp/resize_csc.h"
#include "simgp/resize_rot.h"
#include "simgp/rgb2yuv.h"
#include "simgp/rotate.h"
#include "simgp/tile.h"
#include "simgp/yuv2rgb.h"

#endif
