/* The version of the library, and texts: of results, and of formats by name. */
#ifndef SIMGP_NAMES_H
#define SIMGP_NAMES_H

#include "simgp/img.h"

SIMGP_BEGIN_DECLS

/* Of the headers that a program is compiled with. Minor versions add to the interface, patches
 * correct; programs built with an older version of the same major version go on working. */
#define SIMGP_VERSION_MAJOR 1
#define SIMGP_VERSION_MINOR 0
#define SIMGP_VERSION_PATCH 0
/* In one number: 0x010203 is version 1.2.3. */
#define SIMGP_VERSION (SIMGP_VERSION_MAJOR << 16 | SIMGP_VERSION_MINOR << 8 | SIMGP_VERSION_PATCH)

/* SIMGP_VERSION of the library that the program runs with. The date of the build is that of
 * scmn_version (scmn/mem.h). */
SIMGP_API int32_t simgp_version(void);

/* The texts are constants, and need no release. All functions may run on any number of threads at
 * once. */

/* What a result means, in a few words of English: "success" of SIMGP_OK; "unknown result" of every
 * number that is none. Never NULL. */
SIMGP_API const char *simgp_result_text(int32_t result);

/* The name of a format as functions have it: "nv12" of SIMGP_FMT_NV12. NULL for a code that has no
 * name. */
SIMGP_API const char *simgp_format_name(int32_t format);

/* The format of that name, in capitals or small letters; -1 if there is none, or name is NULL. Some
 * have more names than the one that simgp_format_name gives:
 *
 *   yuv400     gray, gray8, grey, y800       uyvy       uyvy422
 *   yuv420     i420, iyuv, yuv420p           yuyv       yuyv422, yuy2
 *   yuv422n    i422, yuv422, yuv422p         rgb565     rgb565le
 *   yuv444     i444, yuv444p                 bgr565     bgr565le
 *   yuv422w    yuv440p                       rgb888     rgb24
 *   rgba8888   rgba                          bgr888     bgr24
 *   bgra8888   bgra                          argb8888   argb
 *
 * All of them name bytes in memory order, or the bits of a 16-bit word from the top. Where 32-bit
 * formats are named as words, "ARGB" has its B at the lowest address: that is bgra8888 here. */
SIMGP_API int32_t simgp_format_of_name(const char *name);

SIMGP_END_DECLS

#endif
