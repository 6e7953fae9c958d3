/* All cores for one picture: each thread converts a band of it. Prints how long a picture takes with
 * 1, 2, 4, ... threads, and that the result is that of one. */
#define _POSIX_C_SOURCE 200809L
#include <pthread.h>
#include <simgp/describe.h>
#include <simgp/simgp.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <time.h>

enum { MOST = 16, ROUNDS = 50 };

static simgp_img src, dst;
static int parts;
static pthread_barrier_t begin, end;

/* Bands of conversions, joined, are what the whole call gives. */
static void convert_part(int part) {
    simgp_img from, to;
    int32_t first, rows;
    const int32_t a = simgp_band_step(src.format), b = simgp_band_step(dst.format);
    simgp_share_rows(src.height[0], a > b ? a : b, parts, part, &first, &rows);
    if (rows == 0) return;
    if (simgp_band(&src, first, rows, &from, NULL) == SIMGP_OK &&
        simgp_band(&dst, first, rows, &to, NULL) == SIMGP_OK)
        simgp_csc(&from, &to);
}

static void *work(void *part) {
    for (int i = 0; i < ROUNDS; i++) {
        pthread_barrier_wait(&begin);
        convert_part((int)(intptr_t)part);
        pthread_barrier_wait(&end);
    }
    return NULL;
}

static double milliseconds(void) {
    struct timespec t;
    clock_gettime(CLOCK_MONOTONIC, &t);
    return (double)t.tv_sec * 1e3 + (double)t.tv_nsec * 1e-6;
}

/* The shortest time of a picture with so many threads. */
static double measure(int threads) {
    pthread_t thread[MOST];
    double best = 1e9;
    parts = threads;
    pthread_barrier_init(&begin, NULL, (unsigned)threads);
    pthread_barrier_init(&end, NULL, (unsigned)threads);
    for (int t = 1; t < threads; t++)
        if (pthread_create(&thread[t], NULL, work, (void *)(intptr_t)t) != 0) exit(1);
    for (int i = 0; i < ROUNDS; i++) {
        const double start = milliseconds();
        pthread_barrier_wait(&begin);
        convert_part(0);
        pthread_barrier_wait(&end);
        const double time = milliseconds() - start;
        if (time < best) best = time;
    }
    for (int t = 1; t < threads; t++) pthread_join(thread[t], NULL);
    pthread_barrier_destroy(&begin);
    pthread_barrier_destroy(&end);
    return best;
}

int main(int argc, char **argv) {
    const int32_t width = argc > 2 ? atoi(argv[1]) : 1280, height = argc > 2 ? atoi(argv[2]) : 720;
    simgp_layout from, to;
    const char *why = "";
    if (simgp_lay_out(&from, SIMGP_FMT_NV12, width, height, 64, &why) != SIMGP_OK ||
        simgp_lay_out(&to, SIMGP_FMT_RGB565, width, height, 64, &why) != SIMGP_OK) {
        fprintf(stderr, "%s\n", why);
        return 1;
    }
    uint8_t *frame = malloc(from.bytes), *screen = malloc(to.bytes), *whole = malloc(to.bytes);
    if (!frame || !screen || !whole) return 1;
    for (size_t i = 0; i < from.bytes; i++) frame[i] = (uint8_t)(i * 31 + i / 977);
    simgp_describe(&src, SIMGP_FMT_NV12, width, height, 64, frame, from.bytes, NULL);
    simgp_describe(&dst, SIMGP_FMT_RGB565, width, height, 64, whole, to.bytes, NULL);
    memset(whole, 0, to.bytes);
    if (simgp_csc(&src, &dst) != SIMGP_OK) return 1;
    simgp_describe(&dst, SIMGP_FMT_RGB565, width, height, 64, screen, to.bytes, NULL);

    double one = 0;
    int status = 0;
    for (int threads = 1; threads <= 4; threads *= 2) {
        memset(screen, 0, to.bytes);
        const double time = measure(threads);
        const int same = memcmp(screen, whole, to.bytes) == 0;
        if (threads == 1) one = time;
        printf("%d thread%s: %.3f ms a picture, %.2f times as fast, %s\n", threads,
               threads == 1 ? "" : "s", time, one / time, same ? "the same bytes" : "OTHER BYTES");
        if (!same) status = 1;
    }
    free(frame);
    free(screen);
    free(whole);
    return status;
}
