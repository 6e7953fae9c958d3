/* A program of the time of the stored header: every kind of record and callback that crosses the border. */
#include "simgp-1.0.h"

#include <stdio.h>
#include <string.h>

static int failures;
#define EXPECT(condition)  \
    ((condition) ? (void)0 \
                 : (void)(failures++, fprintf(stderr, "line %d: %s\n", __LINE__, #condition)))

static simgp_img image(int32_t format, int32_t width, int32_t height, int32_t stride,
                       uint8_t *plane) {
    simgp_img img;
    memset(&img, 0x5A, sizeof img); /* what is not read may hold anything */
    img.format = format;
    img.width[0] = width;
    img.height[0] = height;
    img.stride[0] = stride;
    img.plane[0] = plane;
    return img;
}

/* Descriptors: red in YUYV becomes red; it is turned, resized and dithered. */
static void pictures(void) {
    uint8_t yuyv[2][8] = {{81, 90, 81, 240, 81, 90, 81, 240}, {81, 90, 81, 240, 81, 90, 81, 240}};
    uint8_t rgb[2][16], turned[4][4], large[4][8];
    simgp_img src = image(SIMGP_FMT_YUYV, 4, 2, 8, yuyv[0]);
    simgp_img dst = image(SIMGP_FMT_RGB565, 4, 2, 16, rgb[0]);
    EXPECT(simgp_csc(&src, &dst) == SIMGP_OK);
    for (int y = 0; y < 2; y++)
        for (int x = 0; x < 4; x++) EXPECT(rgb[y][2 * x] == 0x00 && rgb[y][2 * x + 1] == 0xF8);

    dst.width[0] = 4;
    dst.height[0] = 2;
    simgp_img upright = image(SIMGP_FMT_RGB565, 2, 4, 4, turned[0]);
    rgb[1][0] = 0x1F; /* bottom left: at the top left after a turn to the right */
    EXPECT(simgp_rot(&dst, SIMGP_ROT_90R, &upright) == SIMGP_OK);
    EXPECT(turned[0][0] == 0x1F && turned[0][2] == 0x00 && turned[3][1] == 0xF8);
    EXPECT(simgp_tbl_fn_rot_16b[SIMGP_ROT_90R] == simgp_rot_16b_90r);

    simgp_img enlarged = image(SIMGP_FMT_RGB565, 4, 4, 8, large[0]);
    EXPECT(simgp_rsz(&upright, &enlarged) == SIMGP_OK);
    EXPECT(large[0][0] == 0x1F && large[0][1] == 0xF8);
    EXPECT(simgp_rsz(&upright, &src) == SIMGP_ERR_PARAM);
    src.format = 77777;
    EXPECT(simgp_csc(&src, &dst) == SIMGP_ERR_UNSUPPORTED);

    uint8_t grey[16] = {0};
    simgp_img any = image(SIMGP_FMT_YUV400, 4, 2, 8, grey);
    EXPECT(simgp_csc_any(&dst, &any, SIMGP_COLOUR_BT709_FULL) == SIMGP_OK &&
           grey[0] == (54 * 248) >> 8);
}

static int32_t refills, completed;

static int32_t refill(scmn_bsr_ctx *ctx, int32_t nbytes) {
    refills++;
    return scmn_bsr_flush(ctx, nbytes);
}

static int32_t complete(scmn_bsw_ctx *ctx) {
    completed += *ctx->cur;
    return 0;
}

static void bits(void) {
    static const uint8_t bytes[] = {0xA5, 0x0F, 0x12, 0x34, 0x56};
    uint8_t written[2] = {0};
    scmn_bsr_ctx reader;
    scmn_bsr_init(&reader, bytes, sizeof bytes, refill);
    EXPECT(scmn_bsr_read(&reader, 4) == 0xA && scmn_bsr_read(&reader, 8) == 0x50);
    EXPECT(reader.bits == 20 && reader.cache == 0xF1234000u && reader.cur == bytes + 4);
    EXPECT(reader.last == bytes + 4 && reader.size == 5 && reader.refill == refill && refills == 1);
    scmn_bsw_ctx writer;
    scmn_bsw_init(&writer, written, sizeof written, complete);
    EXPECT(scmn_bsw_write(&writer, 0xA50, 12) == 0 && writer.free_bits == 4);
    EXPECT(written[0] == 0xA5 && completed == 0xA5 && writer.cur == written + 1);
}

static void bands(void) {
    static const uint8_t lines[4][4] = {
        {0, 8, 16, 24}, {32, 40, 48, 56}, {64, 72, 80, 88}, {96, 104, 112, 120}};
    uint8_t out[2][2] = {{0}};
    scmn_irsz_param param = {SCMN_IRSZ_8B, SCMN_IRSZ_LINE, 4, 4, 4, 2, 2, 2, 2, out};
    int32_t error = 1;
    scmn_irsz_ctx *resizer = scmn_irsz_create(&param, &error);
    EXPECT(resizer && error == SCMN_IRSZ_OK);
    if (!resizer) return;
    EXPECT(resizer->dst_w == 2 && resizer->inc_x == (3 << 18) / 2 && resizer->dst == out);
    for (int line = 0; line < 4; line += 2) EXPECT(scmn_irsz(resizer, lines[line], line, 2) == 0);
    EXPECT(resizer->row == 2 && resizer->carry == 0);
    EXPECT(out[0][0] == 0 && out[0][1] == 12 && out[1][0] == 48 && out[1][1] == 60);
    scmn_irsz_delete(resizer);
    param.mode = 3;
    EXPECT(!scmn_irsz_create(&param, &error) && error == SCMN_IRSZ_ERR_MODE);
}

int main(void) {
    pictures();
    bits();
    bands();
    EXPECT(scmn_fcc2mt(SCMN_FOURCC('a', 'v', 'c', '1')) == SCMN_MT_H264);
    EXPECT(simgp_tbl_rsz_weight[0] == 64 && memcmp(tbl_rsz_weight, simgp_tbl_rsz_weight, 256) == 0);
    return failures != 0;
}
