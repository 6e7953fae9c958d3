// simgp-convert's refusals and failures: what it says, and what is left of its files.
#include "tests/convert_program.h"

namespace {

namespace fs = std::filesystem;

class refusal_test : public convert_test {
  protected:
    refusal_test() {
        good(
            "testcard:64x48@3 -o good.y4m && $C testcard:64x48@3 -o good.nv21 && $C testcard:64x48 "
            "-o good.png");
    }
    // One line that names what and where, the exit status, and no file that was not there.
    void refuse(const std::string &arguments, const std::string &message, int status = 1) {
        SCOPED_TRACE(arguments);
        const std::set<std::string> before = files();
        EXPECT_EQ(run(arguments), status);
        EXPECT_EQ(got.err.rfind("simgp-convert: ", 0), 0u) << got.err;
        EXPECT_NE(got.err.find(message), std::string::npos) << message << "\n" << got.err;
        EXPECT_EQ(std::count(got.err.begin(), got.err.end(), '\n'), 1) << got.err;
        EXPECT_EQ(got.out, "");
        EXPECT_EQ(files(), before);
    }
};

TEST_F(refusal_test, bad_files) {
    using namespace std::string_literals;
    const std::string y4m = read("good.y4m"), png = read("good.png");
    const size_t second = y4m.find("FRAME", y4m.find("FRAME") + 5);
    const auto frame = [](const std::string &tags) {
        return "YUV4MPEG2 " + tags + "\nFRAME\n" + std::string(100, 'x');
    };
    const struct {
        std::string bytes;
        const char *message, *options = "";
    } cases[] = {
        {y4m.substr(0, y4m.size() - 100),
         "frame 2, byte 13783: the input ends within the frame: 4508 of its 4608"},
        {std::string(4609, 'x'), "frame 1, byte 4609: the input ends within the frame: 1 of",
         "-f nv21 -s 64x48"},
        {png.substr(0, png.size() / 2), "PNG of"},
        {png.substr(0, 16) + "\x7f\xff\xff\xff" + png.substr(20), ""},
        {"", "byte 0: the input is empty"},
        {"This is no picture at all.", "neither Y4M nor PNG nor PPM"},
        {"This is no picture at all.", "raw frames need --format", "-s 64x48"},
        {"\xFF\xD8\xFF\xE0 JFIF", "a JPEG file; ffmpeg reads it: ffmpeg -i 'in' "},
        {"\0\0\0\1\x67"s, "an H.264 or H.265 file; ffmpeg reads it"},
        {y4m.substr(0, second) + "x" + y4m.substr(second), "frame 1, byte 4655: no FRAME line"},
        {"YUV4MPEG2 W4 H4 Cmono\nFRAMEx\n" + std::string(16, 'x'),
         "frame 0, byte 22: no FRAME line"},
        {"YUV4MPEG2 W4 H4\n", "holds no frame"},
        {"YUV4MPEG2 W4 H4\n", "holds no frame", "--sheet --as png"},
        {"YUV4MPEG2x W4 H4\nFRAME\n", ""},
        {frame("W4 H4 X" + std::string(3000, 'x')), "byte 0: the Y4M header has no end"},
        {"YUV4MPEG2 W4 H4 X" + std::string(5000, 'x'), "byte 0: the Y4M header has no end"},
        {frame("W4 H4 C420p10"), "byte 16: colour space C420p10 has more than 8 bits"},
        {frame("W4 H4 Cmono16"), "byte 16: colour space Cmono16 has more than 8 bits"},
        {frame("W4 H4 C411"), "byte 16: unknown colour space tag C411"},
        {frame("W4 H4 Z7"), "byte 16: unknown tag 'Z7'"},
        {frame("W4 H4 XCOLORMATRIX=XYZ"), "byte 16: unknown colour in tag XCOLORMATRIX=XYZ"},
        {frame("W4 H4 XCOLORRANGE=HALF"), "byte 16: unknown colour in tag XCOLORRANGE=HALF"},
        {frame("W99999999999999999999 H4"), "byte 10: impossible size 99999999999999999999"},
        {frame("W65535 H65535"), "byte 0: Y4M header: impossible size 65535x65535"},
        {frame("W0 H4"), "byte 0: Y4M header: impossible size 0x4"},
        {frame("W4 H-4"), "byte 0: Y4M header: impossible size 4x-4"},
        {frame("H4"), "byte 0: the Y4M header lacks W"},
        {frame("W4x H4"), "byte 10: '4x' is not a number"},
        {frame("W H4"), "byte 10: '' is not a number"},
        {"P6 4 x 255 ", "byte 5: not a number in the PPM header"},
        {"P6 4 # 4", "byte 8: the PPM header has no end"},
        {"P6 4 4 65535 ", "byte 13: PPM with values up to 65535; only"},
        {"P6 0 4 255 ", "byte 2: PPM header: impossible size 0x4"},
        {"P5 4 4 255 " + std::string(15, 'x'), "byte 26: the input ends within the picture"},
    };
    for (const auto &c : cases) {
        write("in", c.bytes);
        refuse(std::string("in -o o.raw ") + c.options, std::string("in: ") + c.message);
    }
    refuse("- -o o.png </dev/null", "standard input: byte 0: the input is empty");
    refuse("missing.y4m -o o.png", "missing.y4m: No such file");
    write("odd0.png", "P6 2 1 255 " + std::string(6, 'x'));
    write("odd1.png", "P6 4 1 255 " + std::string(12, 'x'));
    refuse("odd%d.png -o o.y4m", "odd1.png: rgb888 4x1 among pictures of rgb888 2x1");
    refuse("odd%d.ppm -o o.y4m", "odd1.ppm: No such file");
}

TEST_F(refusal_test, wishes_that_cannot_be_met) {
    refuse("good.nv21 -o o.png", "good.nv21: raw frames of nv21 need --size");
    refuse("good.nv21 -s 0x48 -o o.png", "--size: impossible size 0x48");
    refuse("good.nv21 -s 65536x1 -o o.png", "--size: impossible size 65536x1");
    refuse("good.nv21 -s 4294967297x1 -o o.png", "--size: impossible size 4294967297x1");
    refuse("good.nv21 -s 99999999999999999999x48 -o o.png",
           "impossible size 99999999999999999999x48");
    refuse("good.nv21 -s 64by48 -o o.png", "--size: '64by48' is not a size");
    refuse("good.png -s 64x48 -o o.png", "good.png: --size is for raw frames; this file says");
    refuse("testcard:64x48@0 -o o.png", "testcard:64x48@0: '0' is not a number of frames");
    refuse("good.nv21 -f nv2l -s 64x48 -o o.png", "format 'nv2l'; did you mean 'nv21'?");
    refuse("good.nv21 -f i999999 -s 64x48 -o o.png", "format 'i999999'; there are yuv400");
    refuse("good.nv21 -f xy12 -s 64x48 -o o.png", "format 'xy12'; there are yuv400");
    refuse("good.y4m -f nv12 -o o.png", "good.y4m: holds yuv420, not nv12");
    refuse("good.png -f yuv420 -o o.raw", "good.png: a PNG picture comes as rgb888 or rgba8888");
    refuse("good.png -t nv12 -o o.png", "png files hold RGB pictures, not nv12");
    refuse("good.png -t nv12 -o o.y4m", "Y4M files hold");
    refuse("good.png -o o.bgra8888 --dither", "from rgb888 to bgra8888 with dithering");
    refuse("good.png -o o.png --deblock 3", "--deblock smooths planes of YUV");
    refuse("good.y4m -o o.y4m --resize 0x48", "--resize: impossible size 0x48");
    refuse("good.y4m -o o.y4m --resize 64", "--resize: '64' is not a size");
    refuse("testcard:9000x2 -o o.y4m --resize 8000x2", "--resize: 9000x2 cannot become 8000x2");
    refuse("testcard:2x9000 -o o.y4m --resize 4000x2 --rotate 90l", "9000 cannot become 2x4000");

    refuse("good.y4m -o o.mp4", "o.mp4: this program does not write .mp4; ffmpeg does");
    refuse("good.y4m -o o.JPG", "o.JPG: this program does not write .jpg; ffmpeg does");
    refuse("good.y4m -o o.png", "o.png: holds one picture, but more frames follow");
    refuse("good.y4m -o o-%d-%d.png", "o-%d-%d.png: one number such as");
    refuse("good.y4m -o o.y4m --sheet", "o.y4m: a contact sheet is a still picture");
    refuse("good.y4m -o nowhere/o.raw", "nowhere/o.raw: No such file");

    refuse("good.y4m", "--output is required", 2);
    refuse("--nonsense", "--nonsense", 2);
    const std::string in = "good.y4m -o o.png ";
    refuse(in + "--colour bt470", "--colour: bt470 not in", 2);
    refuse(in + "--chroma last", "--chroma: last not in", 2);
    refuse(in + "--deblock 16", "--deblock: Value 16 not in range", 2);
    refuse(in + "--rotate 45", "--rotate: 45 not in {90l,90r,180,hori,vert}", 2);
    refuse(in + "--rotate 90l --thumbnail", "--rotate excludes --thumbnail", 2);
    refuse(in + "--frames 0", "0 is not a number from 1 on; leave it out", 2);
    refuse(in + "--sheet --columns 0", "0 is not a number from 1 on", 2);
    refuse(in + "--columns 2", "--columns requires --sheet", 2);
    refuse(in + "--demo o", "--demo excludes --output", 2);
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
