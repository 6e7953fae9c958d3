// simgp-bench: the comparisons, measured in rotation.
#include "bench/report.h"

#include <benchmark/benchmark.h>
#include <libyuv.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <time.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <map>
#include <numeric>
#include <random>

#include "rows/choose.h"

namespace bench {

void fail(const std::string &message) {
    fprintf(stderr, "simgp-bench: %s\n", message.c_str());
    exit(1);
}

std::function<void()> memory_traffic(std::shared_ptr<void> keep, const uint8_t *read, size_t n,
                                     uint8_t *written, size_t m) {
    return [=] {
        (void)keep;
        const size_t both = std::min(n, m);
        memcpy(written, read, both);
        if (m > both) memset(written + both, 1, m - both);
        uint8_t near[4096];
        for (size_t i = both; i < n; i += sizeof near) {
            memcpy(near, read + i, std::min(sizeof near, n - i));
            benchmark::DoNotOptimize(near);
        }
        benchmark::ClobberMemory();
    };
}

// With the widest vectors there are, as the C library's memcpy; x86 is compiled for the oldest.
#ifdef __x86_64__
[[gnu::target_clones("avx512f", "avx2", "default")]]
#endif
static void
invert(uint8_t *p, size_t n) {
    typedef uint64_t vector [[gnu::vector_size(64), gnu::aligned(1), gnu::may_alias]];
    for (size_t i = 0; i + sizeof(vector) <= n; i += sizeof(vector)) {
        vector &v = *reinterpret_cast<vector *>(p + i);
        v = ~v;
    }
}

std::function<void()> memory_traffic_in_place(std::shared_ptr<void> keep, uint8_t *p, size_t n) {
    return [=] {
        (void)keep;
        invert(p, n);
        benchmark::ClobberMemory();
    };
}

namespace {

using simgp::target;

struct settings {
    std::vector<target> targets;
    int rounds = 41;
    double batch_us = 100;
};

// Runs all contenders of a match in rotation; the lines have what came out.
class rotation {
  public:
    rotation(const match &m, const settings &s) : m_(m), s_(s), random_(1) {
        add(target::scalar, m.ours, m.restore, m.units);
        for (target t : s.targets) add(t, m.ours, m.restore, m.units);
        if (m.twin.run)
            for (target t : s.targets) add(t, m.twin.run, m.twin.restore, m.twin.units);
        for (const contender &p : m.peers) add(target::count, p.run, m.restore, m.units);
        if (m.limit) add(target::count, m.limit, m.restore, m.units);
        order_.resize(all_.size());
        std::iota(order_.begin(), order_.end(), size_t(0));
        for (entry &e : all_) {
            const double call_ns = std::max(1.0, batch(e) * e.units);
            e.calls = std::max(1, int(s.batch_us * 1e3 / call_ns));
            e.warm_ns = call_ns < 5e6 ? 200e3 : 0;
        }
    }

    // One round; the seconds that it took.
    double round() {
        std::shuffle(order_.begin(), order_.end(), random_);
        double seconds = 0;
        for (size_t i : order_) {
            entry &e = all_[i];
            const double ns = batch(e);
            e.ns.push_back(ns);
            seconds += ns * e.units * e.calls * 1e-9;
        }
        return seconds;
    }

    std::vector<line> lines(const std::string &name, const std::string &size) const {
        std::vector<line> lines;
        const size_t first_twin = 1 + s_.targets.size();
        const size_t first_peer = first_twin + (m_.twin.run ? s_.targets.size() : 0);
        const size_t limit = first_peer + m_.peers.size();
        size_t best = first_peer;
        for (size_t p = first_peer; p < limit; p++)
            if (median(p) < median(best)) best = p;
        for (size_t t = 0; t < s_.targets.size(); t++) {
            line l;
            l.name = name;
            l.size = size;
            l.target_name = simgp::target_name(s_.targets[t]);
            l.ns = median(1 + t);
            l.scalar = quotient(0, 1 + t);
            if (!m_.peers.empty()) {
                l.best_peer = m_.peers[best - first_peer].name;
                l.peer_ns = median(best);
                l.peer = quotient(best, 1 + t);
            }
            if (m_.twin.run) l.twin = quotient(first_twin + t, 1 + t);
            if (m_.limit) l.limit = quotient(limit, 1 + t);
            l.goals = m_.goals;
            l.twin_goal = m_.twin.goal;
            l.twin_name = m_.twin.name;
            lines.push_back(l);
        }
        return lines;
    }

    // Median times by contender.
    std::map<std::string, double> times() const {
        std::map<std::string, double> times;
        times["scalar_ns"] = median(0);
        for (size_t t = 0; t < s_.targets.size(); t++)
            times[std::string(simgp::target_name(s_.targets[t])) + "_ns"] = median(1 + t);
        const size_t first_peer = 1 + s_.targets.size() * (m_.twin.run ? 2 : 1);
        for (size_t p = 0; p < m_.peers.size(); p++)
            times[m_.peers[p].name + "_ns"] = median(first_peer + p);
        if (m_.limit) times["limit_ns"] = median(all_.size() - 1);
        return times;
    }

  private:
    struct entry {
        target rows;  // count: not ours
        std::function<void()> run, restore;
        double units;
        int calls = 1;
        double warm_ns = 200e3;
        std::vector<double> ns = {};  // per unit, by round
    };

    void add(target rows, const std::function<void()> &run, const std::function<void()> &restore,
             double units) {
        all_.push_back({rows, run, restore, units});
    }

    // Time of this thread: what others run on the machine meanwhile does not count, but for what it
    // takes of caches and memory.
    static double cpu_ns() {
        timespec t;
        clock_gettime(CLOCK_THREAD_CPUTIME_ID, &t);
        return double(t.tv_sec) * 1e9 + double(t.tv_nsec);
    }

    // What two readings of the clock differ by with nothing in between. It is a call into the kernel,
    // a few hundred nanoseconds, which count where each run is timed by itself.
    static double clock_ns() {
        static const double ns = [] {
            std::vector<double> between;
            for (int i = 0; i < 1001; i++) {
                const double start = cpu_ns();
                between.push_back(cpu_ns() - start);
            }
            return quartiles_of(between).middle;
        }();
        return ns;
    }

    // A batch; nanoseconds per unit. Processors switch the upper lanes of their vector units off
    // when these have not been used for half a millisecond, and run at a quarter of their speed
    // for up to 150 microseconds when they switch them on: so each contender warms up unmeasured,
    // unless a call takes so long that it does not matter.
    static double batch(const entry &e) {
        const auto run = [&e](int calls) {
            if (e.restore) {
                double ns = 0;
                for (int i = 0; i < calls; i++) {
                    e.restore();
                    const double start = cpu_ns();
                    e.run();
                    ns += std::max(1.0, cpu_ns() - start - clock_ns());
                }
                return ns;
            }
            const double start = cpu_ns();
            for (int i = 0; i < calls; i++) e.run();
            return cpu_ns() - start;
        };
        if (e.rows != target::count) simgp::force_rows(&simgp::rows_of(e.rows));
        for (double warm = 0; warm < e.warm_ns;) warm += run(1);
        const double ns = run(e.calls);
        simgp::force_rows(nullptr);
        return ns / e.calls / e.units;
    }

    double median(size_t i) const { return quartiles_of(all_[i].ns).middle; }

    // Speed of `mine` divided by that of `other`.
    quartiles quotient(size_t other, size_t mine) const {
        std::vector<double> q;
        for (size_t r = 0; r < all_[mine].ns.size(); r++)
            q.push_back(all_[other].ns[r] / all_[mine].ns[r]);
        return quartiles_of(q);
    }

    match m_;
    settings s_;
    std::mt19937 random_;
    std::vector<entry> all_;
    std::vector<size_t> order_;
};

// Prints the lines that the benchmarks leave behind, and keeps them.
class table : public benchmark::BenchmarkReporter {
  public:
    std::vector<line> fresh, all;

    bool ReportContext(const Context &) override {
        print_head();
        return true;
    }
    void ReportRuns(const std::vector<Run> &) override {
        for (const line &l : fresh) print(l);
        all.insert(all.end(), fresh.begin(), fresh.end());
        fresh.clear();
    }
};

// Leaves libyuv the instruction sets up to one; "all" is its own choice.
void limit_libyuv(const std::string &set) {
    using namespace libyuv;
    if (set == "all") return;
    int flags = kCpuInitialized | kCpuHasX86 | kCpuHasSSE2 | kCpuHasSSSE3 | kCpuHasSSE41;
    if (set == "avx2")
        flags |= kCpuHasSSE42 | kCpuHasAVX | kCpuHasAVX2 | kCpuHasERMS | kCpuHasFMA3 | kCpuHasF16C;
    else if (set != "sse41")
        fail("--libyuv takes all, avx2 or sse41");
    MaskCpuFlags(flags);
}

std::vector<target> parse_targets(const std::vector<std::string> &names) {
    std::vector<target> targets;
    for (int i = 1; i < int(target::count); i++) {
        const target t = target(i);
        const bool named =
            std::find(names.begin(), names.end(), simgp::target_name(t)) != names.end();
        const bool of_itself =
            names.empty() && (t == target::avx2 || t == target::avx512 || t == target::neon);
        if (!simgp::target_available(t)) {
            if (named) fail(std::string(simgp::target_name(t)) + " is not available here");
        } else if (named || of_itself) {
            targets.push_back(t);
        }
    }
    if (targets.empty()) targets.push_back(simgp::live_target());
    return targets;
}

// The sizes that were asked for. One alone also stands for an operation's own "<that size> to ...".
std::vector<std::string> sizes_like(const std::vector<std::string> &own,
                                    const std::vector<std::string> &asked) {
    std::vector<std::string> chosen;
    for (const std::string &size : asked) {
        const size_t before = chosen.size();
        for (const std::string &s : own)
            if (s.rfind(size + " to ", 0) == 0) chosen.push_back(s);
        if (chosen.size() == before) chosen.push_back(size);
    }
    return chosen;
}

int run(int argc, char **argv) {
    CLI::App app(
        "Measures the library against libyuv, swscale, OpenCV, its own scalar rows, and memcpy and "
        "memset\nof the same bytes, all in rotation. Times are nanoseconds per pixel (or byte); "
        "'x' columns are\nquotients of speeds, ours divided by the other's, medians over the "
        "rounds.");
    app.footer(
        "Options of Google Benchmark (--benchmark_...) are passed on.\n\n"
        "  simgp-bench --quick\n"
        "  simgp-bench --filter 'nv12_to' --size 1920x1080 --target avx2\n"
        "  simgp-bench --json speed.json");
    settings s;
    std::string filter = ".", json, markdown, report, libyuv_set = "all";
    std::vector<std::string> sizes, target_names;
    bool quick = false, list = false;
    app.add_option("--filter", filter, "only operations whose name matches this expression");
    app.add_option(
        "--size", sizes,
        "only these sizes, such as 1920x1080 or '1920x1080 to 1280x720' (any may be named)");
    app.add_option("--target", target_names,
                   "instruction sets (neon, sse41, avx2, avx512); otherwise avx2, avx512, neon");
    app.add_option("--rounds", s.rounds, "rounds per comparison; a third for large pictures")
        ->check(CLI::PositiveNumber);
    app.add_option("--batch", s.batch_us, "microseconds a batch takes at least")
        ->check(CLI::PositiveNumber);
    app.add_option("--libyuv", libyuv_set, "instruction sets for libyuv: all, avx2, sse41");
    app.add_option("--json", json, "write all times to this file as well");
    app.add_option("--markdown", markdown, "write tables with one row per operation to this file");
    app.add_option("--report", report, "put tables and charts into this page, or docs/speed.md")
        ->expected(0, 1)
        ->default_str("docs/speed.md");
    app.add_flag("--quick", quick, "320x240 and 1920x1080 alone, few rounds");
    app.add_flag("--list", list, "list the operations and sizes");
    app.allow_extras();
    CLI11_PARSE(app, argc, argv);

    if (quick) {
        if (sizes.empty()) sizes = {"320x240", "1920x1080"};
        s.rounds = std::min(s.rounds, 15);
    }
    s.targets = parse_targets(target_names);
    limit_libyuv(libyuv_set);

    table out;
    struct family {
        const char *name;
        std::vector<comparison> (*comparisons)();
    };
    const family families[] = {{"YUV to RGB", yuv2rgb_comparisons},
                               {"RGB to RGB565", packed2rgb_comparisons},
                               {"RGB to YUV", rgb2yuv_comparisons},
                               {"Layouts", layout_comparisons},
                               {"Copies", copy_comparisons},
                               {"Any to any", csc_any_comparisons},
                               {"Tiles", tile_comparisons},
                               {"Dithering", dither_comparisons},
                               {"Deblocking", deblock_comparisons},
                               {"Turns and mirrors", rotate_comparisons},
                               {"Resize", resize_comparisons},
                               {"Resize and turn", resize_rot_comparisons},
                               {"Resize and convert", resize_csc_comparisons},
                               {"Line resizer", irsz_comparisons},
                               {"Common", scmn_comparisons},
                               {"Stores", stores_comparisons}};
    std::vector<std::pair<std::string, comparison>> all;
    for (const family &f : families)
        for (comparison &c : f.comparisons()) all.emplace_back(f.name, std::move(c));
    if (sizes.empty()) {
        for (size_t i = 0, count = all.size(); i < count; i++) {
            comparison c = all[i].second;
            if (std::find(small_operations.begin(), small_operations.end(), c.name) ==
                small_operations.end())
                continue;
            c.sizes = small_sizes;
            all.emplace_back("Small pictures", std::move(c));
        }
    }
    for (const auto &[family_name, c] : all) {
        for (const std::string &size : sizes.empty() ? c.sizes : sizes_like(c.sizes, sizes)) {
            const auto body = [&out, name = family_name, c = c, size, s](benchmark::State &state) {
                rotation r(c.make(size), s);
                for (auto _ : state) state.SetIterationTime(r.round());
                for (const auto &[name, ns] : r.times()) state.counters[name] = ns;
                out.fresh = r.lines(c.name, size);
                for (line &l : out.fresh) l.family = name;
            };
            int w = 0, h = 0, to_w = 0, to_h = 0;
            sscanf(size.c_str(), "%dx%d to %dx%d", &w, &h, &to_w, &to_h);
            const bool large = std::max(double(w) * h, double(to_w) * to_h) > 4e6;
            benchmark::RegisterBenchmark((c.name + "/" + size).c_str(), body)
                ->UseManualTime()
                ->Iterations(large ? (s.rounds + 2) / 3 : s.rounds);
        }
    }

    std::vector<std::string> words = {argv[0], "--benchmark_filter=" + filter};
    if (!json.empty()) words.push_back("--benchmark_out=" + json);
    if (list) words.push_back("--benchmark_list_tests");
    for (const std::string &w : app.remaining()) words.push_back(w);
    std::vector<char *> arguments;
    for (std::string &w : words) arguments.push_back(w.data());
    int count = int(arguments.size());
    benchmark::Initialize(&count, arguments.data());
    if (benchmark::ReportUnrecognizedArguments(count, arguments.data())) return 1;
    if (benchmark::RunSpecifiedBenchmarks(&out) == 0) return 1;
    if (list) return 0;
    print_summary(out.all);
    if (!markdown.empty()) write_markdown(markdown, out.all);
    if (!report.empty()) {
        std::string command = "./run bench";
        for (int i = 1; i < argc; i++) command.append(" ").append(argv[i]);
        write_report(report, command, out.all);
    }
    return 0;
}

}  // namespace
}  // namespace bench

int main(int argc, char **argv) { return bench::run(argc, argv); }
