// simgp-convert's refusals and failures: what it says, and what is left of its files.
#include "tests/convert_program.h"

namespace {

namespace fs = std::filesystem;

// Each fault: one line that names what and where, the exit status, and no file that was not there.
TEST_F(convert_test, bad_input_ends_in_one_clear_line_and_no_file) {
    good("testcard:64x48@3 -o good.y4m");
    good("testcard:64x48@3 -o good.nv21 --format nv21");
    good("testcard:64x48 -o good.png");
    const std::string y4m = read("good.y4m"), png = read("good.png");
    const std::string nv21 = read("good.nv21");
    const size_t frame = 64 * 48 * 3 / 2;
    write("cut.y4m", y4m.substr(0, y4m.size() - 100));
    write("cut.nv21", nv21.substr(0, frame + 1));
    write("cut.png", png.substr(0, png.size() / 2));
    write("huge.png", png.substr(0, 16) + std::string("\x7f\xff\xff\xff", 4) + png.substr(20));
    write("empty", "");
    write("text", "This is no picture at all.");
    write("photo.jpg", "\xFF\xD8\xFF\xE0 JFIF");
    write("odd0.png", "P6 2 1 255 " + std::string(6, 'x'));
    write("odd1.png", "P6 4 1 255 " + std::string(12, 'x'));
    write("word.ppm", "P6 4 x 255 ");
    write("comment.ppm", "P6 4 # 4");
    write("deep.ppm", "P6 4 4 65535 ");
    write("zero.ppm", "P6 0 4 255 ");
    write("cut.pgm", "P5 4 4 255 " + std::string(15, 'x'));
    const size_t second = y4m.find("FRAME", y4m.find("FRAME") + 5);
    write("lost.y4m", y4m.substr(0, second) + "x" + y4m.substr(second));
    auto header = [&](const std::string &name, const std::string &tags) {
        write(name, "YUV4MPEG2 " + tags + "\nFRAME\n" + std::string(100, 'x'));
    };
    header("deep.y4m", "W4 H4 C420p10");
    header("tag.y4m", "W4 H4 Z7");
    header("colour.y4m", "W4 H4 C411");
    header("matrix.y4m", "W4 H4 XCOLORMATRIX=XYZ");
    header("wide.y4m", "W99999999999999999999 H4");
    header("big.y4m", "W65535 H65535");
    header("zero.y4m", "W0 H4");
    header("negative.y4m", "W4 H-4");
    header("nowidth.y4m", "H4");
    header("number.y4m", "W4x H4");
    header("nonumber.y4m", "W H4");
    header("mono.y4m", "W4 H4 Cmono16");
    header("range.y4m", "W4 H4 XCOLORRANGE=HALF");
    write("magic.y4m", "YUV4MPEG2x W4 H4\nFRAME\n");
    write("framex.y4m", "YUV4MPEG2 W4 H4 Cmono\nFRAMEx\n" + std::string(16, 'x'));
    write("long.y4m", "YUV4MPEG2 W4 H4 X" + std::string(3000, 'x') + "\nFRAME\n");
    write("none.y4m", "YUV4MPEG2 W4 H4\n");
    write("endless.y4m", "YUV4MPEG2 W4 H4 X" + std::string(5000, 'x'));
    const std::set<std::string> before = files();

    const struct {
        const char *arguments, *message;
        int status;
    } cases[] = {
        {"cut.y4m -o o.y4m",
         "cut.y4m: frame 2, byte 13783: the input ends within the frame: 4508 of its 4608", 1},
        {"cut.nv21 -s 64x48 -o o.raw",
         "cut.nv21: frame 1, byte 4609: the input ends within the frame: 1 of", 1},
        {"cut.png -o o.ppm", "cut.png: PNG of", 1},
        {"huge.png -o o.ppm", "huge.png: ", 1},
        {"empty -o o.png", "empty: byte 0: the input is empty", 1},
        {"- -o o.png </dev/null", "standard input: byte 0: the input is empty", 1},
        {"text -o o.png", "text: neither Y4M nor PNG nor PPM", 1},
        {"photo.jpg -o o.png", "photo.jpg: a JPEG file; ffmpeg reads it: ffmpeg -i 'photo.jpg' ",
         1},
        {"good.y4m -o o.mp4", "o.mp4: this program does not write .mp4; ffmpeg does", 1},
        {"good.y4m -o o.JPG", "o.JPG: this program does not write .jpg; ffmpeg does", 1},
        {"good.nv21 -f nv2l -s 64x48 -o o.png", "unknown format 'nv2l'; did you mean 'nv21'?", 1},
        {"odd%d.png -o o.y4m", "odd1.png: rgb888 4x1 among pictures of rgb888 2x1", 1},
        {"odd%d.ppm -o o.y4m", "odd1.ppm: No such file", 1},
        {"word.ppm -o o.png", "word.ppm: byte 5: not a number in the PPM header", 1},
        {"comment.ppm -o o.png", "comment.ppm: byte 8: the PPM header has no end", 1},
        {"deep.ppm -o o.png", "deep.ppm: byte 13: PPM with values up to 65535; only", 1},
        {"zero.ppm -o o.png", "zero.ppm: byte 2: PPM header: impossible size 0x4", 1},
        {"cut.pgm -o o.png", "cut.pgm: byte 26: the input ends within the picture", 1},
        {"lost.y4m -o o.raw", "lost.y4m: frame 1, byte 4655: no FRAME line", 1},
        {"deep.y4m -o o.png", "deep.y4m: byte 16: colour space C420p10 has more than 8 bits", 1},
        {"tag.y4m -o o.png", "tag.y4m: byte 16: unknown tag 'Z7'", 1},
        {"colour.y4m -o o.png", "colour.y4m: byte 16: unknown colour space tag C411", 1},
        {"wide.y4m -o o.png", "wide.y4m: byte 10: impossible size 99999999999999999999", 1},
        {"big.y4m -o o.png", "big.y4m: byte 0: Y4M header: impossible size 65535x65535", 1},
        {"zero.y4m -o o.png", "impossible size 0x4", 1},
        {"negative.y4m -o o.png", "impossible size 4x-4", 1},
        {"number.y4m -o o.png", "number.y4m: byte 10: '4x' is not a number", 1},
        {"nonumber.y4m -o o.png", "nonumber.y4m: byte 10: '' is not a number", 1},
        {"mono.y4m -o o.png", "mono.y4m: byte 16: colour space Cmono16 has more than 8 bits", 1},
        {"range.y4m -o o.png", "range.y4m: byte 16: unknown colour in tag XCOLORRANGE=HALF", 1},
        {"magic.y4m -o o.png", "magic.y4m: ", 1},
        {"framex.y4m -o o.png", "framex.y4m: frame 0, byte 22: no FRAME line", 1},
        {"long.y4m -o o.png", "long.y4m: byte 0: the Y4M header has no end", 1},
        {"good.png -f yuv420 -o o.raw", "good.png: a PNG picture comes as rgb888 or rgba8888", 1},
        {"nowidth.y4m -o o.png", "nowidth.y4m: byte 0: the Y4M header lacks W", 1},
        {"none.y4m -o o.png", "none.y4m: holds no frame", 1},
        {"none.y4m -o o.png --sheet", "none.y4m: holds no frame", 1},
        {"endless.y4m -o o.png", "endless.y4m: byte 0: the Y4M header has no end", 1},
        {"missing.y4m -o o.png", "missing.y4m: No such file", 1},
        {"good.nv21 -s 0x48 -o o.png", "--size: impossible size 0x48", 1},
        {"good.nv21 -s 65536x1 -o o.png", "--size: impossible size 65536x1", 1},
        {"good.nv21 -s 4294967297x4294967297 -o o.png",
         "--size: impossible size 4294967297x4294967297", 1},
        {"good.nv21 -s 99999999999999999999x48 -o o.png", "impossible size 99999999999999999999x48",
         1},
        {"good.nv21 -s 64by48 -o o.png", "--size: '64by48' is not a size", 1},
        {"text -s 64x48 -o o.png", "text: raw frames need --format", 1},
        {"good.nv21 -f xy12 -s 64x48 -o o.png", "unknown format 'xy12'; there are yuv400", 1},
        {"good.nv21 -f i999999 -s 64x48 -o o.png", "unknown format 'i999999'; there are yuv400", 1},
        {"good.y4m -f nv12 -o o.png", "good.y4m: holds yuv420, not nv12", 1},
        {"good.png -t nv12 -o o.png", "png files hold RGB pictures, not nv12", 1},
        {"good.png -t nv12 -o o.y4m", "Y4M files hold", 1},
        {"good.png -o o.bgra8888 --dither",
         "no conversion leads from rgb888 to bgra8888 with dithering", 1},
        {"matrix.y4m -o o.png", "matrix.y4m: byte 16: unknown colour in tag XCOLORMATRIX=XYZ", 1},
        {"good.y4m -o o.png --colour bt470", "--colour: bt470 not in", 2},
        {"good.y4m -o o.png --chroma last", "--chroma: last not in", 2},
        {"good.y4m -o o.png", "o.png: holds one picture, but more frames follow", 1},
        {"good.y4m -o o-%d-%d.png", "o-%d-%d.png: one number such as", 1},
        {"good.y4m -o o.y4m --sheet", "o.y4m: a contact sheet is a still picture", 1},
        {"good.y4m -o nowhere/o.raw", "nowhere/o.raw: No such file", 1},
        {"good.png -o o.png --deblock 3", "--deblock smooths planes of YUV", 1},
        {"good.y4m -o o.y4m --resize 0x48", "--resize: impossible size 0x48", 1},
        {"good.y4m -o o.y4m --resize 64", "--resize: '64' is not a size", 1},
        {"testcard:9000x2 -o o.y4m --resize 8000x2", "--resize: 9000x2 cannot become 8000x2", 1},
        {"testcard:2x9000 -o o.y4m --resize 4000x2 --rotate 90l", "9000 cannot become 2x4000", 1},
        {"good.y4m -o o.y4m --deblock 16", "--deblock: Value 16 not in range", 2},
        {"good.y4m -o o.y4m --rotate 45", "--rotate: 45 not in {90l,90r,180,hori,vert}", 2},
        {"good.y4m -o o.y4m --rotate 90l --thumbnail", "--rotate excludes --thumbnail", 2},
        {"testcard:64x48@0 -o o.png", "testcard:64x48@0: '0' is not a number of frames", 1},
        {"good.y4m -o o.png --frames 0", "0 is not a number of frames from 1 on; leave it out", 2},
        {"good.y4m", "--output is required", 2},
        {"--nonsense", "--nonsense", 2},
    };
    for (const auto &c : cases) {
        SCOPED_TRACE(c.arguments);
        EXPECT_EQ(run(c.arguments), c.status);
        EXPECT_NE(got.err.find(c.message), std::string::npos) << got.err;
        EXPECT_EQ(got.err.rfind("simgp-convert: ", 0), 0u) << got.err;
        EXPECT_EQ(std::count(got.err.begin(), got.err.end(), '\n'), 1) << got.err;
        EXPECT_EQ(got.out, "");
        EXPECT_EQ(files(), before);
    }
}

TEST_F(convert_test, a_failure_keeps_what_was_there) {
    good("testcard:64x48@3 -o good.y4m");
    const std::string y4m = read("good.y4m");
    write("cut.y4m", y4m.substr(0, y4m.size() - 1));
    write("old.raw", "precious");
    EXPECT_EQ(run("cut.y4m -o old.raw"), 1);
    EXPECT_EQ(read("old.raw"), "precious");
    // Complete pictures stay, and the message says so.
    EXPECT_EQ(run("cut.y4m -o p%d.png"), 1);
    EXPECT_NE(got.err.find("(2 complete pictures stay)"), std::string::npos) << got.err;
    EXPECT_EQ(files(),
              (std::set<std::string>{"cut.y4m", "good.y4m", "old.raw", "p0.png", "p1.png"}));
    EXPECT_EQ(run("good.y4m -o old.raw --no-clobber"), 1);
    EXPECT_NE(got.err.find("old.raw: File exists"), std::string::npos) << got.err;
    EXPECT_EQ(read("old.raw"), "precious");
    good("good.y4m -o new.raw --no-clobber");
    // A file that is replaced leaves its mode, and a link stays one.
    shell("chmod 640 old.raw; mkdir there; mv old.raw there; ln -s there/old.raw link.raw");
    good("good.y4m -o link.raw");
    EXPECT_TRUE(fs::is_symlink(at("link.raw")));
    EXPECT_EQ(read("there/old.raw"), read("new.raw"));
    EXPECT_EQ(fs::status(at("there/old.raw")).permissions(), fs::perms(0640));
    EXPECT_EQ(files("there"), std::set<std::string>{"old.raw"});
    // A file may be converted onto itself.
    good("good.y4m -o good.y4m --to yuv422n");
    EXPECT_EQ(read("good.y4m").find("C422\n") != std::string::npos, true);
}

TEST_F(convert_test, broken_pipes_full_disks_and_interruptions_end_cleanly) {
    EXPECT_EQ(shell("$C testcard:320x240@100 -o - | head -c 10 >/dev/null; exit ${PIPESTATUS[0]}"),
              1);
    EXPECT_NE(got.err.find("standard output: Broken pipe"), std::string::npos) << got.err;
    if (fs::exists("/dev/full"))
        for (const std::string size : {"4x4", "320x240"}) {  // at the end, and on the way
            EXPECT_EQ(run("testcard:" + size + " -o /dev/full"), 1);
            EXPECT_NE(got.err.find("/dev/full: No space left"), std::string::npos) << got.err;
            EXPECT_EQ(run("testcard:" + size + " -o - >/dev/full"), 1);
            EXPECT_NE(got.err.find("standard output: No space left"), std::string::npos) << got.err;
        }
    // The unfinished file lies beside the one that it will be, and goes with the program.
    fs::create_directory(at("sub"));
    for (const auto &[name, number] : {std::pair("INT", 2), {"TERM", 15}, {"HUP", 1}}) {
        EXPECT_EQ(shell("$C testcard:640x480@1000000 -q -o sub/long.raw & for i in {1..500}; do "
                        "ls -A sub | grep . && break; sleep 0.02; done; kill -" +
                        std::string(name) + " $!; wait $!"),
                  128 + number);
        EXPECT_EQ(got.out.rfind(".long.raw.", 0), 0u) << "it was over too soon";
        EXPECT_EQ(files("sub"), std::set<std::string>{});
        EXPECT_EQ(files(), std::set<std::string>{"sub"});
    }
}

// Whatever goes wrong with the file, the old one stays or the new one is complete.
TEST_F(convert_test, files_appear_when_they_are_complete) {
    for (const auto &[mask, mode] : {std::pair("0", 0666), {"022", 0644}, {"077", 0600}}) {
        ASSERT_EQ(shell("umask " + std::string(mask) + "; rm -f m.raw; $C testcard:4x4 -o m.raw"),
                  0);
        EXPECT_EQ(int(fs::status(at("m.raw")).permissions()), mode);
    }
    // Writes the first frame of two, waits until the output has been begun, and does something.
    const auto meanwhile = [&](const std::string &deed) {
        return shell(
            "rm -rf in late; mkfifo in; { printf 0123456789abcdef; for i in {1..500}; do "
            "[ -n \"$(ls -A | grep ^.late.)\" ] && break; sleep 0.02; done; " +
            deed + "; printf fedcba9876543210; } >in & $C in -f yuv400 -s 4x4 -o late");
    };
    EXPECT_EQ(meanwhile("echo old >late; ls -A | grep -c ^.late. >count"), 0) << got.err;
    EXPECT_EQ(read("count"), "1\n");
    EXPECT_EQ(read("late"), "0123456789abcdeffedcba9876543210");
    EXPECT_EQ(meanwhile("mkdir late"), 1);
    EXPECT_NE(got.err.find("late: Is a directory"), std::string::npos) << got.err;
    EXPECT_EQ(files(), (std::set<std::string>{"count", "in", "late", "m.raw"}));
    // A file that can grow no longer.
    EXPECT_EQ(shell("rm -r in late count; echo old >full; (ulimit -f 1; trap '' XFSZ; $C "
                    "testcard:64x48 -o full)"),
              1);
    EXPECT_NE(got.err.find("full: File too large"), std::string::npos) << got.err;
    EXPECT_EQ(read("full"), "old\n");
    EXPECT_EQ(files(), (std::set<std::string>{"full", "m.raw"}));
}

}  // namespace
