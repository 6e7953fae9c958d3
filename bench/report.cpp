#include "bench/report.h"

#include <stdarg.h>
#include <stdio.h>
#include <stdlib.h>

#include <algorithm>

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

void write_markdown(const std::string &path, const std::vector<line> &lines) {
    FILE *file = fopen(path.c_str(), "w");
    if (!file) fail("cannot write " + path);
    for (const std::string &target : distinct(lines, &line::target_name)) {
        fprintf(file, "### %s\n\n", target.c_str());
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
    if (fclose(file)) fail("cannot write " + path);
}

}  // namespace bench
