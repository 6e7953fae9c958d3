// simgp-play as its users meet it: in a window on a screen of its own (Xvfb), with keys from xdotool. What
// it shows is held against what simgp-convert makes of the same frames, pixel for pixel.
#include <gtest/gtest.h>
#include <signal.h>
#include <string.h>
#include <sys/prctl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <map>
#include <thread>
#include <vector>

#include "tests/program.h"
#include "tools/picture.h"
#include "tools/play_overlay.h"
#include "tools/source.h"

namespace {

using tools::picture;

constexpr auto patience = std::chrono::seconds(20);

// Until `done` says so, or patience is at its end.
template <class Done>
bool wait_until(Done done) {
    const auto end = std::chrono::steady_clock::now() + patience;
    while (!done()) {
        if (std::chrono::steady_clock::now() > end) return false;
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    }
    return true;
}

// Starts a program that ends with the test; `before` runs in it first.
template <class Before>
pid_t start(std::vector<std::string> line, Before before) {
    std::vector<char *> arguments;
    for (std::string &word : line) arguments.push_back(word.data());
    arguments.push_back(nullptr);
    const pid_t pid = fork();
    if (pid == 0) {
        prctl(PR_SET_PDEATHSIG, SIGKILL);
        before();
        execvp(arguments[0], arguments.data());
        _exit(127);
    }
    return pid;
}

// A screen of 800 x 600 pixels.
class screen {
  public:
    explicit screen(int depth) {
        int ends[2];
        if (pipe(ends) != 0) abort();
        pid_ = start({"Xvfb", "-displayfd", std::to_string(ends[1]), "-screen", "0",
                      "800x600x" + std::to_string(depth), "-nolisten", "tcp"},
                     [&] {
                         close(ends[0]);
                         if (!freopen("/dev/null", "w", stderr)) _exit(127);
                     });
        close(ends[1]);
        char byte;
        while (read(ends[0], &byte, 1) == 1 && byte != '\n') name_ += byte;
        close(ends[0]);
        if (!name_.empty()) name_ = ":" + name_;
    }
    ~screen() {
        kill(pid_, SIGTERM);
        waitpid(pid_, nullptr, 0);
    }
    const std::string &name() const { return name_; }

  private:
    pid_t pid_;
    std::string name_;
};

struct shot {
    picture p;
    double time = -1;  // of its frame
};

class play_test : public testing::Test {
  protected:
    static void TearDownTestSuite() { screens.clear(); }
    ~play_test() override {
        if (player > 0) kill(player, SIGKILL), waitpid(player, nullptr, 0);
    }

    // Runs a line of bash in the folder, the converter's name written as $C.
    std::string shell(const std::string &line) {
        place.write("line", "cd '" + place / "" + "'; export DISPLAY=" + display +
                                " C=" SIMGP_CONVERT "; { " + line + "; }");
        const auto got = program::run(place, "bash -e '" + place / "line" + "'");
        EXPECT_EQ(got.status, 0) << line << "\n" << got.err;
        return got.out;
    }
    // A clip of 60 frames of 160 x 120, by FFmpeg, and as Y4M what FFmpeg decodes from it.
    void encode(const std::string &file, const std::string &options) {
        shell("ffmpeg -v error -y -f lavfi -i testsrc2=size=160x120:rate=25 -frames:v 60 " +
              options + " " + file + " && ffmpeg -v error -y -i " + file +
              " -f yuv4mpegpipe -strict -1 -vsync passthrough clip.y4m");
    }

    // Starts the player, paused, on a screen of that depth, and waits for its window.
    void play(const std::string &arguments, int depth = 24) {
        auto &on = screens[depth];
        if (!on) on = std::make_unique<screen>(depth);
        display = on->name();
        ASSERT_FALSE(display.empty()) << "Xvfb does not start";
        finish();
        player = start(
            {"bash", "-c", "exec " SIMGP_PLAY " --pause --screenshot shot.png " + arguments}, [&] {
                if (chdir((place / "").c_str()) || !freopen("said", "w", stdout) ||
                    !freopen("complained", "w", stderr))
                    _exit(127);
                setenv("DISPLAY", display.c_str(), 1);
                setenv("SDL_VIDEODRIVER", "x11", 1);
            });
        // xdotool ends in an error if a window goes while it is asked for its name.
        const std::string found = shell(
            "for again in 1 2 3 4 5; do timeout 20 xdotool search --sync --onlyvisible --name "
            "'^simgp-play:' && break; done");
        window = found.substr(0, found.find('\n'));
        ASSERT_FALSE(window.empty()) << place.read("complained");
        shell("xdotool windowfocus --sync " + window);
    }
    void press(const std::string &keys) { shell("xdotool key --delay 20 " + keys); }
    // The key s.
    shot shoot() {
        const auto lines = [this] {
            const std::string said = place.read("said");
            return std::count(said.begin(), said.end(), '\n');
        };
        const auto before = lines();
        press("s");
        EXPECT_TRUE(wait_until([&] { return lines() > before; })) << place.read("complained");
        shot s = {png("shot.png")};
        const std::string said = place.read("said");
        sscanf(said.c_str() + said.rfind("frame at"), "frame at %lf", &s.time);
        return s;
    }
    shot shoot_after(const std::string &keys) {
        press(keys);
        return shoot();
    }
    // The player ends by itself, or by the key q; its exit status.
    int finish(bool by_key = true) {
        if (player <= 0) return 0;
        if (by_key) press("q");
        int status = -1;
        const bool gone = wait_until([&] { return waitpid(player, &status, WNOHANG) == player; });
        EXPECT_TRUE(gone) << "the player goes on";
        if (gone) player = 0;
        return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }

    picture png(const std::string &name) const {
        auto source = tools::open_source({.path = place / name});
        picture p;
        source->next(p);
        return p;
    }
    // Frame `number` of `input`, through simgp-convert.
    picture converted(const std::string &input, const std::string &options, int number = 0) {
        shell("rm -f made-*.png; $C " + input + " -q -n " + std::to_string(number + 1) + " " +
              options + " -o made-%d.png");
        return png("made-" + std::to_string(number) + ".png");
    }
    // What the screen itself holds where the window is (X's own format, a header of 32-bit words).
    picture on_screen() {
        shell("xwd -silent -id " + window + " -out window.xwd");
        const std::string file = place.read("window.xwd");
        const auto word = [&](int n) {
            uint32_t value = 0;
            for (int k = 0; k < 4; ++k) value = value << 8 | uint8_t(file[size_t(4 * n + k)]);
            return value;
        };
        const uint32_t width = word(4), height = word(5), bits = word(11), line = word(12);
        const size_t pixels = word(0) + 12 * word(19);
        picture p({&tools::format_named("rgb888"), int(width), int(height)});
        for (int y = 0; y < p.height(); ++y)
            for (int x = 0; x < p.width(); ++x) {
                const size_t at = pixels + size_t(y) * line + size_t(x) * bits / 8;
                const auto byte = [&](size_t k) { return uint8_t(file[at + k]); };
                if (bits == 32) {
                    for (int c = 0; c < 3; ++c) *p.sample(c, x, y) = byte(size_t(2 - c));
                } else {
                    const int pixel = byte(0) | byte(1) << 8;
                    const int r = pixel >> 11, g = pixel >> 5 & 63, b = pixel & 31;
                    *p.sample(0, x, y) = uint8_t(r << 3 | r >> 2);
                    *p.sample(1, x, y) = uint8_t(g << 2 | g >> 4);
                    *p.sample(2, x, y) = uint8_t(b << 3 | b >> 2);
                }
            }
        return p;
    }

    static std::map<int, std::unique_ptr<screen>> screens;
    program::folder place;
    std::string display, window;
    pid_t player = 0;
};

std::map<int, std::unique_ptr<screen>> play_test::screens;

// `part` lies in the middle of `all`, black around it.
void expect_in(const picture &all, const picture &part, const std::string &what) {
    const int left = (all.width() - part.width()) / 2, top = (all.height() - part.height()) / 2;
    ASSERT_TRUE(left >= 0 && top >= 0) << what << ": " << all.width() << " x " << all.height();
    for (int y = 0; y < all.height(); ++y)
        for (int x = 0; x < all.width(); ++x)
            for (int c = 0; c < 3; ++c) {
                const int px = x - left, py = y - top;
                const bool inside = px >= 0 && py >= 0 && px < part.width() && py < part.height();
                ASSERT_EQ(*all.sample(c, x, y), inside ? *part.sample(c, px, py) : 0)
                    << what << ": x " << x << ", y " << y << ", channel " << c;
            }
}
void expect_same(const picture &a, const picture &b, const std::string &what) {
    ASSERT_EQ(a.width(), b.width()) << what;
    ASSERT_EQ(a.height(), b.height()) << what;
    expect_in(a, b, what);
}
bool same(const picture &a, const picture &b) {
    for (int y = 0; y < a.height(); ++y)
        if (memcmp(a.line(0, y), b.line(0, y), a.line_bytes(0)) != 0) return false;
    return true;
}

// pixel(x, y) of `from` goes to (x', y').
template <class Where>
picture moved(const picture &from, bool quarter, Where where) {
    picture to({&from.format(), quarter ? from.height() : from.width(),
                quarter ? from.width() : from.height()});
    for (int y = 0; y < from.height(); ++y)
        for (int x = 0; x < from.width(); ++x) {
            const auto [tx, ty] = where(x, y);
            memcpy(to.sample(0, tx, ty), from.sample(0, x, y), 3);
        }
    return to;
}
picture turned_by(char key, const picture &p) {
    const int w = p.width(), h = p.height();
    return moved(p, key == 'r', [&](int x, int y) {
        return key == 'r'   ? std::pair(h - 1 - y, x)
               : key == 'h' ? std::pair(w - 1 - x, y)
                            : std::pair(x, h - 1 - y);
    });
}

TEST_F(play_test, a_test_card_step_by_step_and_the_screen_holds_what_is_saved) {
    play("testcard:320x240");
    for (int frame = 0; frame < 3; ++frame) {
        const shot s = shoot();
        EXPECT_NEAR(s.time, frame / 25., 1e-3);
        expect_same(s.p, converted("testcard:320x240@3", "--to bgra8888", frame), "saved");
        expect_same(on_screen(), s.p, "screen");
        press("period");
    }
    // It goes on by itself, and stands again.
    press("space");
    std::this_thread::sleep_for(std::chrono::milliseconds(300));
    const shot later = shoot_after("space");
    EXPECT_GT(later.time, 5 / 25.);
    EXPECT_EQ(shoot().time, later.time);
    // It has no key frames.
    EXPECT_EQ(shoot_after("Left Right").time, later.time);
    EXPECT_EQ(finish(), 0);
}

// Tiled as by hardware, resized on the way to the 16-bit pixels that this screen has; 32 bits on request.
TEST_F(play_test, tiles_to_a_screen_of_16_bits) {
    shell("$C testcard:160x120 -q -o card.t64x32");
    const std::string tiles = "card.t64x32 --size 160x120";
    play("testcard:160x120 --tiled --size 401x300", 16);
    shot s = shoot();
    expect_in(s.p, converted(tiles, "--resize 400x300 --to rgb565"), "rgb565");
    expect_same(on_screen(), s.p, "screen");
    expect_in(shoot_after("f").p, converted(tiles, "--resize 400x300 --to bgra8888"), "bgra8888");
    expect_in(shoot_after("f").p, converted(tiles, "--resize 400x300 --to rgb565"), "again");
}

TEST_F(play_test, turns_and_mirrors_follow_what_is_seen) {
    for (const std::string options : {"", "--tiled --rgb565"}) {
        play("testcard:160x120 --size 200x200 " + options);
        const bool tiled = !options.empty();
        if (tiled) shell("$C testcard:160x120 -q -o card.t64x32");
        picture seen = converted(tiled ? "card.t64x32 --size 160x120" : "testcard:160x120",
                                 tiled ? "--resize 200x150 --to rgb565" : "--resize 200x150");
        expect_in(shoot().p, seen, "upright");
        std::string keys;
        for (const char key : std::string("rhrrvrhvrv")) {
            keys += key;
            seen = turned_by(key, seen);
            expect_in(shoot_after(std::string(1, key)).p, seen, keys + " " + options);
        }
    }
}

TEST_F(play_test, dithering_and_deblocking) {
    encode("clip.mp4", "-c:v libx264 -pix_fmt yuv420p -crf 40 -colorspace bt709 -color_range tv");
    const std::string c709 = "--colour bt709 ";
    play("clip.mp4 --rgb565");
    const picture plain = shoot().p, dithered = shoot_after("d").p;
    expect_same(plain, converted("clip.y4m", c709 + "--to rgb565"), "plain");
    expect_same(dithered, converted("clip.y4m", c709 + "--to rgb565 --dither"), "d");
    EXPECT_FALSE(same(plain, dithered));
    const picture both = shoot_after("b").p;
    expect_same(both, converted("clip.y4m", c709 + "--to rgb565 --dither --deblock 4"), "d b");
    EXPECT_FALSE(same(both, dithered));
    expect_same(shoot_after("period").p,
                converted("clip.y4m", c709 + "--to rgb565 --dither --deblock 4", 1), "d b .");
    // 32 bits need no dithering, and get none.
    expect_same(shoot_after("f").p, converted("clip.y4m", c709 + "--deblock 4", 1), "f");
    expect_same(shoot_after("d").p, converted("clip.y4m", c709 + "--deblock 4", 1), "f d");
    EXPECT_NE(place.read("complained").find("dithering"), std::string::npos);
    expect_same(shoot_after("b").p, converted("clip.y4m", c709, 1), "f b");
}

// Deblocking comes before the tiles, in the planes that were coded.
TEST_F(play_test, tiles_of_what_was_deblocked) {
    encode("clip.mp4", "-c:v libx264 -pix_fmt yuv420p -crf 40");
    shell("$C clip.y4m -q -n 1 --deblock 4 -o smooth.t64x32");
    play("clip.mp4 --tiled --deblock --rgb565");
    expect_same(shoot().p, converted("smooth.t64x32 --size 160x120", "--to rgb565"), "tiled");
}

// The stream's matrix and range, and the layouts that decoders give; the overlay says which.
TEST_F(play_test, colours_of_the_stream) {
    const struct {
        std::string options, convert, line;
    } clips[] = {
        {"-c:v libx264 -pix_fmt yuv420p", "", "yuv420 160x120 bt601 (by size) limited (not said)"},
        {"-c:v libx264 -pix_fmt yuv444p -colorspace bt709 -color_range pc", "--colour bt709-full",
         "yuv444 160x120 bt709 (stream) full (stream)"},
        {"-c:v libx264 -pix_fmt yuv422p -colorspace bt2020nc", "--colour bt2020",
         "yuv422n 160x120 bt2020 (stream) limited (stream)"},
        {"-c:v mjpeg -pix_fmt yuvj420p -q:v 2", "--colour bt601-full",
         "yuv420 160x120 bt601 (stream) full (stream)"},
        {"-c:v ffv1 -pix_fmt yuv420p -color_range pc", "--colour bt601-full",
         "yuv420 160x120 bt601 (by size) full (stream)"},
    };
    for (const auto &clip : clips) {
        encode("clip.mkv", clip.options);
        play("clip.mkv --size 320x240");
        const picture plain = converted("clip.y4m", clip.convert + " --resize 320x240");
        expect_same(shoot().p, plain, clip.options);
        // White on black in the corner, and nothing else.
        const picture over = shoot_after("o").p;
        const picture label = tools::text_box({clip.line}, 1);
        for (int y = 0; y < label.height(); ++y)
            ASSERT_EQ(memcmp(over.line(0, y), label.line(0, y),
                             std::min(label.line_bytes(0), over.line_bytes(0))),
                      0)
                << clip.line << ": line " << y;
        for (int y = 120; y < 240; ++y)
            ASSERT_EQ(memcmp(over.line(0, y), plain.line(0, y), plain.line_bytes(0)), 0) << y;
        expect_same(shoot_after("o").p, plain, "without the overlay");
    }
}

// The arrows lead where scmn_is_vkeyfrm finds key frames, and nowhere else.
TEST_F(play_test, arrows_lead_to_key_frames) {
    const struct {
        std::string file, options;
        std::vector<int> keys;
    } clips[] = {
        {"clip.mp4",
         "-c:v libx264 -pix_fmt yuv420p -g 20 -keyint_min 20 -bf 2 -sc_threshold 0",
         {0, 20, 40}},
        {"clip.mkv",
         "-c:v libx264 -pix_fmt yuv420p -g 25 -keyint_min 25 -sc_threshold 0",
         {0, 25, 50}},
        {"clip.h264",
         "-c:v libx264 -pix_fmt yuv420p -g 20 -keyint_min 20 -bf 0 -sc_threshold 0",
         {0, 20, 40}},
        {"clip.avi", "-c:v mpeg4 -g 20 -bf 0 -sc_threshold 1000000000", {0, 20, 40}},
        // I-pictures at 19, 37 and 55 in the stream; two B-pictures behind each are shown before it.
        {"clip.mp4", "-c:v mpeg4 -g 20 -bf 2 -sc_threshold 1000000000", {0, 21, 39, 57}},
        {"clip.wmv", "-c:v wmv2 -g 20 -sc_threshold 1000000000", {0, 20, 40}},
        // A codec that is the container's business.
        {"clip.mkv", "-c:v mpeg2video -g 20 -bf 0 -sc_threshold 1000000000", {0, 20, 40}},
        // The container marks the I-pictures of open groups, but none of them is an IDR picture.
        {"open.mp4",
         "-c:v libx264 -pix_fmt yuv420p -x264-params open-gop=1:keyint=20:scenecut=0 -bf 2",
         {0}},
    };
    for (const auto &clip : clips) {
        encode(clip.file, clip.options);
        shell("rm -f all-*.png; $C clip.y4m -q -o all-%d.png");
        play(clip.file);
        const auto expect = [&](const std::string &keys, int frame) {
            const shot s = shoot_after(keys);
            expect_same(s.p, png("all-" + std::to_string(frame) + ".png"),
                        clip.file + " " + keys + ": frame " + std::to_string(frame));
            EXPECT_NEAR(s.time, frame / 25., .021) << clip.file << " " << keys;
        };
        const int last = clip.keys.back();
        for (const int key : clip.keys)
            if (key > 0) expect("Right", key);
        expect("period", last + 1);
        expect("Right", last + 1);  // there is none, and nothing is lost
        expect("period", last + 2);
        expect("Left", last);
        for (size_t k = clip.keys.size() - 1; k-- > 0;) expect("Left", clip.keys[k]);
        expect("period", 1);
        expect("Left", 0);
        expect("Left", 0);
        if (clip.keys.size() > 1) expect("Right", clip.keys[1]);
        expect("period", clip.keys.size() > 1 ? clip.keys[1] + 1 : 1);
    }
}

TEST_F(play_test, the_picture_takes_the_size_of_the_window) {
    play("testcard:160x120");
    for (const char *size : {"320x240", "333x251", "50x300", "64x48"}) {
        int w = 0, h = 0;
        tools::parse_size(size, size, w, h);
        shell("xdotool windowsize " + window + " " + std::to_string(w) + " " + std::to_string(h));
        shot s;
        ASSERT_TRUE(wait_until([&] {
            s = shoot();
            return s.p.width() == w && s.p.height() == h;
        })) << size;
        // The largest of 4 : 3.
        const int pw = std::min(w, int(h * 4 / 3. + .5)), ph = std::min(h, int(w * .75 + .5));
        expect_in(s.p,
                  converted("testcard:160x120", "--to bgra8888 --resize " + std::to_string(pw) +
                                                    "x" + std::to_string(ph)),
                  size);
        expect_same(on_screen(), s.p, "screen");
    }
    // Of the flattest pictures a line is left.
    const auto fitted = [&](const std::string &card, const std::string &size) {
        play("testcard:" + card + " --size 100x50");
        expect_in(shoot().p, converted("testcard:" + card, "--to bgra8888 --resize " + size), card);
    };
    fitted("600x2", "100x1");
    fitted("2x600", "1x50");
}

// FFmpeg itself turns them when it converts.
TEST_F(play_test, films_that_were_taken_upright_stand_upright) {
    encode("lying.mp4", "-c:v libx264 -pix_fmt yuv420p");
    shell(
        "ffmpeg -v error -i lying.mp4 -c copy -metadata:s:v rotate=90 upright.mp4"
        "; ffmpeg -v error -i upright.mp4 -frames:v 1 -f yuv4mpegpipe upright.y4m");
    play("upright.mp4");
    const picture upright = converted("upright.y4m", "");
    ASSERT_EQ(upright.height(), 160);
    expect_same(shoot().p, upright, "as it was taken");
}

TEST_F(play_test, pixels_that_are_not_square_give_the_window_its_width) {
    encode("clip.mp4", "-vf setsar=2 -c:v libx264 -pix_fmt yuv420p");
    play("clip.mp4");
    expect_same(shoot().p, converted("clip.y4m", "--resize 320x120"), "upright");
    expect_in(shoot_after("r").p, converted("clip.y4m", "--resize 45x120 --rotate 90r"), "turned");
    // Of a film that lies on its side, the height.
    shell("ffmpeg -v error -i clip.mp4 -c copy -metadata:s:v rotate=90 lying.mp4");
    play("lying.mp4");
    expect_same(shoot().p, converted("clip.y4m", "--resize 120x320 --rotate 90l"), "lying");
}

TEST_F(play_test, ends_by_itself_after_its_frames) {
    encode("clip.mp4", "-c:v libx264 -pix_fmt yuv420p -bf 2");
    play("clip.mp4 --frames 4 --size 80x60");
    press("period period period");
    EXPECT_EQ(finish(false), 0);
    expect_same(png("shot.png"), converted("clip.y4m", "--resize 80x60", 3), "the last frame");

    // Nobody asked for a screenshot.
    shell("SDL_VIDEODRIVER=dummy timeout 20 " SIMGP_PLAY
          " -n 1 testcard:64x48; test ! -e simgp-play.png");
}

TEST_F(play_test, what_cannot_be_shown_ends_in_one_line) {
    shell(
        "mkdir folder; echo Not a film. >text.mp4; : >empty.mp4"
        "; ffmpeg -v error -f lavfi -i sine=duration=1 sound.wav"
        "; ffmpeg -v error -f lavfi -i testsrc2=size=64x64 -frames:v 2 -pix_fmt yuv420p10le -c:v "
        "ffv1 ten.mkv"
        "; ffmpeg -v error -f lavfi -i testsrc2=size=64x64 -frames:v 9 -c:v libx264 whole.mkv"
        "; head -c 900 whole.mkv >cut.mkv");
    for (const char *file : {"missing.mp4", "folder", "text.mp4", "empty.mp4", "sound.wav",
                             "ten.mkv", "cut.mkv", "testcard:0x0"}) {
        const auto got = program::run(
            place,
            "cd " + place / "" + "; SDL_VIDEODRIVER=dummy timeout 20 " SIMGP_PLAY " -n 1 " + file);
        EXPECT_EQ(got.status, 1) << file;
        EXPECT_EQ(std::count(got.err.begin(), got.err.end(), '\n'), 1) << file << ": " << got.err;
        EXPECT_EQ(got.err.find(std::string("simgp-play: ") + file), 0u) << got.err;
        EXPECT_EQ(got.out, "") << file;
    }
    for (const char *nowhere : {"DISPLAY=:nowhere SDL_VIDEODRIVER=x11 ",
                                "env -u DISPLAY -u WAYLAND_DISPLAY -u SDL_VIDEODRIVER "}) {
        const auto got =
            program::run(place, nowhere + std::string("timeout 20 " SIMGP_PLAY " testcard:"));
        EXPECT_EQ(got.status, 1) << nowhere;
        EXPECT_NE(got.err.find("simgp-play: no screen: "), std::string::npos) << got.err;
    }
}

// As with the keys: a line, and the film goes on.
TEST_F(play_test, what_the_options_ask_for_in_vain_stays_off) {
    shell("$C testcard:64x48 -o card.png");
    for (const std::string options : {"testcard:64x48 --dither --rgb32", "card.png --deblock"}) {
        const auto got = program::run(place, "cd " + place / "" +
                                                 "; SDL_VIDEODRIVER=dummy timeout 20 " SIMGP_PLAY
                                                 " -n 1 --screenshot shot.png " +
                                                 options);
        EXPECT_EQ(got.status, 0) << options;
        EXPECT_EQ(std::count(got.err.begin(), got.err.end(), '\n'), 1) << got.err;
        expect_same(png("shot.png"), png("card.png"), options);
    }
}

}  // namespace
