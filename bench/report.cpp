#include "bench/report.h"

#include <stdarg.h>
#include <stdio.h>
#include <stdlib.h>
#include <time.h>

#include <algorithm>
#include <cmath>
#include <fstream>
#include <iterator>
#include <memory>

namespace bench {
namespace {

std::string format(const char *f, ...) {
    char s[200];
    va_list arguments;
    va_start(arguments, f);
    vsnprintf(s, sizeof s, f, arguments);
    va_end(arguments);
    return s;
}

std::string number(double v, int digits = 2) { return v == 0 ? "" : format("%.*f", digits, v); }

constexpr int widths[] = {-26, -9, -6, 6, 8, -20, 6, 6, -11, 7, -11, -20};

template <class... Cells>
void print_cells(const Cells &...cells) {
    int column = 0;
    (printf("| %*s ", widths[column++], std::string(cells).c_str()), ...);
    printf("|\n");
}

// Goals are held against figures as they are printed, with two digits.
bool falls_short(double goal, const quartiles &got) {
    return goal != 0 && got.middle != 0 && got.middle + 0.005 < goal;
}

// Distinct values of a member, in the order of first appearance.
std::vector<std::string> distinct(const std::vector<line> &lines, std::string line::*member) {
    std::vector<std::string> values;
    for (const line &l : lines)
        if (std::find(values.begin(), values.end(), l.*member) == values.end())
            values.push_back(l.*member);
    return values;
}

}  // namespace

quartiles quartiles_of(std::vector<double> v) {
    std::sort(v.begin(), v.end());
    const auto at = [&](double part) { return v[size_t(part * double(v.size() - 1) + 0.5)]; };
    return {at(0.25), at(0.5), at(0.75)};
}

std::string line::missed() const {
    std::string text;
    const auto want = [&](const std::string &what, double goal, const quartiles &got) {
        if (!falls_short(goal, got)) return;
        text += format("%s%s %.2g", text.empty() ? "" : ", ", what.c_str(), goal);
    };
    want("peer", goals.peer, peer);
    want("scalar", goals.scalar, scalar);
    want("limit", goals.limit, limit);
    want(twin_name, twin_goal, twin);
    return text;
}

bool line::has_goals() const {
    return (goals.peer && peer.middle) || (goals.scalar && scalar.middle) ||
           (goals.limit && limit.middle) || (twin_goal && twin.middle);
}

void print_head() {
    print_cells("operation", "size", "rows", "ns", "x scalar", "best peer", "its ns", "x peer",
                "quartiles", "x limit", "x twin", "goals");
    for (int w : widths)
        printf("|%s", std::string(size_t(abs(w)) + 1, '-').append(w > 0 ? ":" : "-").c_str());
    printf("|\n");
}

void print(const line &l) {
    const std::string missed = l.missed();
    print_cells(l.name, l.size, l.target_name, number(l.ns, 3), number(l.scalar.middle, 1),
                l.best_peer, number(l.peer_ns, 3), number(l.peer.middle),
                l.peer.middle ? number(l.peer.low) + "-" + number(l.peer.high) : "",
                number(l.limit.middle),
                l.twin.middle ? number(l.twin.middle) + " " + l.twin_name : "",
                !missed.empty() ? "SHORT: " + missed
                : l.has_goals() ? "met"
                                : "");
    fflush(stdout);
}

void print_summary(const std::vector<line> &lines) {
    int met = 0, all = 0;
    for (const line &l : lines) all += l.has_goals(), met += l.has_goals() && l.missed().empty();
    printf("\n%d of %d lines with goals meet them", met, all);
    for (const line &l : lines)
        if (!l.missed().empty())
            printf("\n  short: %s %s %s: %s", l.name.c_str(), l.size.c_str(), l.target_name.c_str(),
                   l.missed().c_str());
    printf("\n");
}

namespace {

// Lines of operations that were measured at the same sizes, for one target.
struct block {
    std::vector<std::string> sizes;
    std::vector<std::vector<line>> operations;  // the lines of each, by size
};

std::vector<block> blocks_of(const std::vector<line> &lines, const std::string &target) {
    std::vector<block> blocks;
    for (const std::string &name : distinct(lines, &line::name)) {
        std::vector<line> own;
        for (const line &l : lines)
            if (l.name == name && l.target_name == target) own.push_back(l);
        const std::vector<std::string> sizes = distinct(own, &line::size);
        const auto same = std::find_if(blocks.begin(), blocks.end(),
                                       [&](const block &b) { return b.sizes == sizes; });
        if (same == blocks.end())
            blocks.push_back({sizes, {own}});
        else
            same->operations.push_back(own);
    }
    return blocks;
}

// A quotient, in bold if it falls short of its goal.
std::string cell(double goal, const quartiles &got, int digits) {
    return format(falls_short(goal, got) ? "**%s**" : "%s",
                  got.middle ? number(got.middle, digits).c_str() : "-");
}

void write_row(FILE *file, const std::vector<line> &lines) {
    std::string peer_goal, peers, scalar, limit, twin;
    for (const line &l : lines) {
        if (peer_goal.empty()) peer_goal = l.goals.peer ? format("%g", l.goals.peer) : "";
        peers.append(" ").append(cell(l.goals.peer, l.peer, 2)).append(" |");
        scalar.append(scalar.empty() ? "" : " / ").append(cell(l.goals.scalar, l.scalar, 1));
        limit.append(limit.empty() ? "" : " / ").append(cell(l.goals.limit, l.limit, 2));
        if (l.twin.middle) {
            twin.append(twin.empty() ? "" : " / ").append(cell(l.twin_goal, l.twin, 2));
            twin.append(" ").append(l.twin_name);
        }
    }
    fprintf(file, "| %s | %s | %s |%s %s | %s | %s |\n", lines[0].name.c_str(),
            lines[0].best_peer.c_str(), peer_goal.c_str(), peers.c_str(), scalar.c_str(),
            limit.c_str(), twin.c_str());
}

}  // namespace

static void write_tables(FILE *file, const std::vector<line> &lines, const char *heading) {
    for (const std::string &target : distinct(lines, &line::target_name)) {
        fprintf(file, "%s %s\n\n", heading, target.c_str());
        for (const block &b : blocks_of(lines, target)) {
            fprintf(file, "| operation | best peer | goal |");
            for (const std::string &s : b.sizes) fprintf(file, " %s |", s.c_str());
            fprintf(file, " x scalar | x limit | x twin |\n|---|---|---|");
            for (size_t i = 0; i < b.sizes.size() + 3; i++) fprintf(file, "---:|");
            fprintf(file, "\n");
            for (const std::vector<line> &operation : b.operations) write_row(file, operation);
            fprintf(file, "\n");
        }
    }
}

namespace {

struct closed {
    void operator()(FILE *f) const { fclose(f); }
};
using owned_file = std::unique_ptr<FILE, closed>;

owned_file create(const std::string &path) {
    owned_file file(fopen(path.c_str(), "w"));
    if (!file) fail("cannot write " + path);
    return file;
}
void finish(owned_file file, const std::string &path) {
    if (fclose(file.release())) fail("cannot write " + path);
}

std::string contents_of(const std::string &path) {
    std::ifstream in(path);
    if (!in) fail("cannot read " + path);
    return {std::istreambuf_iterator<char>(in), {}};
}

std::string processor() {
    const std::string info = contents_of("/proc/cpuinfo");
    for (const char *key : {"model name", "Model", "uarch"}) {
        const size_t at = info.find(key);
        if (at == std::string::npos) continue;
        const size_t colon = info.find(':', at);
        return info.substr(colon + 2, info.find('\n', colon) - colon - 2);
    }
    return "unknown processor";
}

double geometric_mean(const std::vector<double> &v) {
    double sum = 0;
    for (double x : v) sum += log(x);
    return v.empty() ? 0 : exp(sum / double(v.size()));
}

// What a bar of a chart stands for: the quotients to the best peer, by target, and the shares of the
// memory limit at the largest size.
struct bar {
    std::string label;
    std::vector<double> peer, limit;  // by target; 0: not measured
};

std::vector<line> only(const std::vector<line> &lines, std::string line::*member,
                       const std::string &value) {
    std::vector<line> own;
    for (const line &l : lines)
        if (l.*member == value) own.push_back(l);
    return own;
}

bar bar_of(const std::string &label, const std::vector<line> &lines,
           const std::vector<std::string> &targets) {
    bar b{label, {}, {}};
    for (const std::string &target : targets) {
        std::vector<double> peer, limit;
        for (const std::string &name : distinct(lines, &line::name)) {
            double largest = 0;
            for (const line &l : only(lines, &line::name, name)) {
                if (l.target_name != target) continue;
                if (l.peer.middle) peer.push_back(l.peer.middle);
                if (l.limit.middle && l.size.rfind("3840", 0) == 0) largest = l.limit.middle;
            }
            if (largest) limit.push_back(largest);
        }
        b.peer.push_back(geometric_mean(peer));
        b.limit.push_back(geometric_mean(limit));
    }
    return b;
}

std::string escaped(const std::string &text) {
    std::string out;
    for (char c : text) out += c == '&' ? "&amp;" : c == '<' ? "&lt;" : std::string(1, c);
    return out;
}

// Bars on a logarithmic scale from a half to 16: they begin at 1, where we are as fast as the best peer.
// To their right, the share of the memory limit.
void write_chart(const std::string &path, const std::string &title, const std::vector<bar> &bars,
                 const std::vector<std::string> &targets) {
    constexpr int label = 250, scale = 440, share = 90, top = 62, thick = 9, gap = 7;
    const char *const colours[] = {"#4878a8", "#e0913a", "#6aa86a", "#a05a9c"};
    const int row = thick * int(targets.size()) + gap;
    const int width = label + scale + share, height = top + row * int(bars.size()) + 12;
    const auto at = [](double quotient) {
        return label + scale * (log2(std::clamp(quotient, .5, 16.)) + 1) / 5;
    };
    const owned_file owner = create(path);
    FILE *const file = owner.get();
    fprintf(file,
            "<svg xmlns=\"http://www.w3.org/2000/svg\" viewBox=\"0 0 %d %d\" width=\"%d\" "
            "font-family=\"sans-serif\" font-size=\"11\">\n"
            "<rect width=\"%d\" height=\"%d\" fill=\"#fff\"/>\n"
            "<text x=\"8\" y=\"18\" font-size=\"14\" font-weight=\"bold\">%s</text>\n",
            width, height, width, width, height, escaped(title).c_str());
    for (size_t t = 0; t < targets.size(); t++)
        fprintf(file,
                "<rect x=\"%zu\" y=\"27\" width=\"10\" height=\"10\" fill=\"%s\"/><text x=\"%zu\" "
                "y=\"36\">%s</text>\n",
                8 + 80 * t, colours[t % 4], 22 + 80 * t, targets[t].c_str());
    fprintf(file,
            "<text x=\"%d\" y=\"36\" text-anchor=\"middle\">times the speed of the best peer</text>"
            "<text x=\"%d\" y=\"36\" text-anchor=\"end\">of memory\'s</text>\n",
            label + scale / 2, width - 8);
    for (double mark : {.5, 1., 2., 4., 8., 16.})
        fprintf(file,
                "<line x1=\"%.1f\" x2=\"%.1f\" y1=\"%d\" y2=\"%d\" stroke=\"%s\"/><text x=\"%.1f\" "
                "y=\"%d\" text-anchor=\"middle\" fill=\"#555\">%g</text>\n",
                at(mark), at(mark), top - 8, height - 8, mark == 1 ? "#000" : "#ddd", at(mark),
                top - 11, mark);
    int y = top;
    for (const bar &b : bars) {
        fprintf(file, "<text x=\"%d\" y=\"%d\" text-anchor=\"end\">%s</text>\n", label - 8,
                y + row / 2 + 1, escaped(b.label).c_str());
        for (size_t t = 0; t < targets.size(); t++, y += thick) {
            if (const double q = b.peer[t]; q > 0) {
                const double from = std::min(at(1), at(q)), to = std::max(at(1), at(q));
                fprintf(file,
                        "<rect x=\"%.1f\" y=\"%d\" width=\"%.1f\" height=\"%d\" "
                        "fill=\"%s\"/><text x=\"%.1f\" y=\"%d\" font-size=\"9\">%.2f</text>\n",
                        from, y, std::max(to - from, 1.), thick - 1, colours[t % 4], to + 3,
                        y + thick - 2, q);
            }
            if (b.limit[t] > 0)
                fprintf(file,
                        "<text x=\"%d\" y=\"%d\" font-size=\"9\" text-anchor=\"end\" "
                        "fill=\"%s\">%.2f</text>\n",
                        width - 8, y + thick - 2, colours[t % 4], b.limit[t]);
        }
        y += gap;
    }
    fprintf(file, "</svg>\n");
    if (fflush(file)) fail("cannot write " + path);
}

// "YUV to RGB" as a part of a file's name.
std::string slug(std::string text) {
    for (char &c : text) c = isalnum(c) ? char(tolower(c)) : '-';
    return text;
}

constexpr char results_begin[] = "<!-- results -->\n", results_end[] = "<!-- end of results -->\n";

}  // namespace

void write_markdown(const std::string &path, const std::vector<line> &lines) {
    owned_file file = create(path);
    write_tables(file.get(), lines, "###");
    finish(std::move(file), path);
}

void write_report(const std::string &page, const std::string &command,
                  const std::vector<line> &lines) {
    const std::string old = contents_of(page);
    const size_t begin = old.find(results_begin), end = old.find(results_end);
    if (begin == std::string::npos || end == std::string::npos || end < begin)
        fail(page + " has no place for results");
    const std::vector<std::string> targets = distinct(lines, &line::target_name);
    const std::string stem = page.substr(0, page.rfind('.'));
    const std::string local = stem.substr(stem.rfind('/') + 1);

    owned_file file = create(page);
    fwrite(old.data(), 1, begin + sizeof results_begin - 1, file.get());
    char date[20];
    const time_t now = time(nullptr);
    strftime(date, sizeof date, "%Y-%m-%d", localtime(&now));
    fprintf(file.get(), "\n    %s\n\non %s, %s, by GCC %s.\n\n", command.c_str(), date,
            processor().c_str(), __VERSION__);
    std::vector<bar> families;
    for (const std::string &family : distinct(lines, &line::family)) {
        const std::vector<line> own = only(lines, &line::family, family);
        const bar b = bar_of(family, own, targets);
        if (*std::max_element(b.peer.begin(), b.peer.end()) > 0) families.push_back(b);
    }
    write_chart(stem + ".svg", "All families, geometric means", families, targets);
    fprintf(file.get(), "![all families](%s.svg)\n\n", local.c_str());
    for (const std::string &family : distinct(lines, &line::family)) {
        const std::vector<line> own = only(lines, &line::family, family);
        std::vector<bar> bars;
        for (const std::string &name : distinct(own, &line::name))
            bars.push_back(bar_of(name, only(own, &line::name, name), targets));
        fprintf(file.get(), "### %s\n\n", family.c_str());
        if (std::any_of(own.begin(), own.end(), [](const line &l) { return l.peer.middle > 0; })) {
            const std::string chart = std::string("-").append(slug(family)).append(".svg");
            write_chart(stem + chart, family, bars, targets);
            fprintf(file.get(), "![%s](%s%s)\n\n", family.c_str(), local.c_str(), chart.c_str());
        }
        write_tables(file.get(), own, "####");
    }
    fwrite(old.data() + end, 1, old.size() - end, file.get());
    finish(std::move(file), page);
}

}  // namespace bench
