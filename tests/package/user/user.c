/* Converts one pixel, as a user of the library would: red from limited-range YUV. */
#include <simgp/simgp.h>
#include <stdio.h>

int main(void) {
    uint8_t y = 81, u = 90, v = 240, pixel[2] = {0, 0};
    simgp_img src = {0}, dst = {0};
    src.format = SIMGP_FMT_YUV420;
    src.width[0] = src.width[1] = src.width[2] = 1;
    src.height[0] = src.height[1] = src.height[2] = 1;
    src.stride[0] = src.stride[1] = src.stride[2] = 1;
    src.plane[0] = &y;
    src.plane[1] = &u;
    src.plane[2] = &v;
    dst.format = SIMGP_FMT_RGB565;
    dst.stride[0] = 2;
    dst.plane[0] = pixel;
    int32_t result = simgp_csc(&src, &dst);
    if (result == SIMGP_OK && pixel[0] == 0x00 && pixel[1] == 0xF8) return 0;
    fprintf(stderr, "result %d, pixel %02X%02X instead of F800\n", (int)result, pixel[1], pixel[0]);
    return 1;
}
