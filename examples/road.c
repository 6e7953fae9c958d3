/* The road of a frame, from a hardware decoder to the screen: is the stream known, may playback
 * begin here, and how do the decoder's tiles become pixels of the screen's size and sense. */
#include <scmn/scmn.h>
#include <simgp/simgp.h>
#include <stdio.h>

/* Shows a decoded frame of any size, in 64 x 32 tiles, on a screen of 16-bit RGB of any size. If
 * the screen is mounted sideways, the picture is made upright in `memory`, which holds as many
 * pixels as the screen, and turned from there. */
static int32_t show(const simgp_img *frame, int32_t turn, uint8_t *memory,
                    const simgp_img *screen) {
    simgp_img upright = *screen;
    if (turn == SIMGP_ROT_90L || turn == SIMGP_ROT_90R) {
        upright.width[0] = screen->height[0];
        upright.height[0] = screen->width[0];
    }
    if (turn != SIMGP_ROT_NONE) {
        upright.stride[0] = 2 * upright.width[0];
        upright.plane[0] = memory;
    }
    const int same_size =
        upright.width[0] == frame->width[0] && upright.height[0] == frame->height[0];
    int32_t result = same_size ? simgp_csc(frame, &upright) : simgp_rsz_csc(frame, &upright);
    if (result == SIMGP_OK && turn != SIMGP_ROT_NONE) result = simgp_rot(&upright, turn, screen);
    return result;
}

/* What stands for the decoder: a frame with a red left half and a blue right half. Red is 81, 90,
 * 240 in YUV, and 0xF800 on the screen; blue is 41, 240, 110, and 0x001F. */
enum { WIDTH = 256, HEIGHT = 128 };
static uint8_t luma[WIDTH * HEIGHT], chroma[WIDTH * HEIGHT / 2];

static void decode(void) {
    for (int32_t y = 0; y < HEIGHT; y++)
        for (int32_t x = 0; x < WIDTH; x++)
            luma[simgp_get_tile_offset(WIDTH, HEIGHT, x, y)] = x < WIDTH / 2 ? 81 : 41;
    for (int32_t y = 0; y < HEIGHT / 2; y++)
        for (int32_t x = 0; x < WIDTH; x += 2) {
            uint8_t *pair = chroma + simgp_get_tile_offset(WIDTH, HEIGHT / 2, x, y);
            pair[0] = x < WIDTH / 2 ? 90 : 240;
            pair[1] = x < WIDTH / 2 ? 240 : 110;
        }
}

/* Is pixel (x, y) of the screen of this colour? */
static int is(const simgp_img *screen, int32_t x, int32_t y, uint16_t colour) {
    const uint8_t *pixel = screen->plane[0] + (ptrdiff_t)y * screen->stride[0] + 2 * x;
    return (pixel[0] | pixel[1] << 8) == colour;
}

/* Shows the frame, and looks whether the screen is red and blue where it should be: turned to the
 * right, what was left is above. At most two columns between them are mixed. */
static int try_screen(const simgp_img *frame, int32_t width, int32_t height, int32_t turn) {
    static uint8_t pixels[2 * WIDTH * HEIGHT], memory[2 * WIDTH * HEIGHT];
    const int32_t red_end = turn == SIMGP_ROT_90R ? height / 2 : width / 2;
    simgp_img screen;
    if (simgp_describe(&screen, SIMGP_FMT_RGB565, width, height, 1, pixels, sizeof pixels, NULL))
        return 0;
    if (show(frame, turn, memory, &screen) != SIMGP_OK) return 0;
    int wrong = 0;
    for (int32_t y = 0; y < height; y++)
        for (int32_t x = 0; x < width; x++) {
            const int32_t at = turn == SIMGP_ROT_90R ? y : x;
            if (at < red_end - 1) wrong += !is(&screen, x, y, 0xF800);
            if (at > red_end + 1) wrong += !is(&screen, x, y, 0x001F);
        }
    printf("%d x %d in tiles -> %d x %d%s: %s\n", WIDTH, HEIGHT, (int)width, (int)height,
           turn == SIMGP_ROT_90R ? ", turned right" : "", wrong ? "WRONG" : "red and blue");
    return !wrong;
}

int main(void) {
    /* An access unit as it comes from the container: parameter sets and a slice of an IDR picture. */
    static const uint8_t unit[] = {0,    0,    0,    1,    0x67, 0x42, 0xC0, 0x0A, 0,    0,   1,
                                   0x68, 0xCE, 0x38, 0x80, 0,    0,    1,    0x65, 0x88, 0x84};
    const int32_t type = scmn_fcc2mt(SCMN_FOURCC('a', 'v', 'c', '1'));
    if (type != SCMN_MT_H264 || !scmn_is_vkeyfrm(type, unit, (int32_t)sizeof unit)) {
        fprintf(stderr, "no key frame of H.264\n");
        return 1;
    }
    decode();

    simgp_img frame;
    const char *why = "";
    if (simgp_describe_planes(&frame, SIMGP_FMT_T64X32, WIDTH, HEIGHT, luma, 0, chroma, 0, NULL, 0,
                              &why)) {
        fprintf(stderr, "no picture: %s\n", why);
        return 1;
    }
    if (!try_screen(&frame, WIDTH, HEIGHT, SIMGP_ROT_NONE) ||
        !try_screen(&frame, 160, 96, SIMGP_ROT_NONE) ||
        !try_screen(&frame, 96, 160, SIMGP_ROT_90R)) {
        fprintf(stderr, "the frame did not arrive\n");
        return 1;
    }
    return 0;
}
