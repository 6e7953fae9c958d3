// What came out of the comparisons, as lines of a table.
#ifndef BENCH_REPORT_H
#define BENCH_REPORT_H

#include "bench/bench.h"

namespace bench {

struct quartiles {
    double low = 0, middle = 0, high = 0;
};
quartiles quartiles_of(std::vector<double> v);

// One comparison with our rows of one target.
struct line {
    std::string family, name, size, target_name, best_peer;
    double ns = 0, peer_ns = 0;
    quartiles peer, scalar, limit, twin;  // quotients of speeds; 0: not measured
    goal goals;
    double twin_goal = 0;
    std::string twin_name;

    // The goals that are not met, and whether there are any at all.
    std::string missed() const;
    bool has_goals() const;
};

// The table on stdout, line by line.
void print_head();
void print(const line &l);

// How many lines meet their goals, and which do not.
void print_summary(const std::vector<line> &lines);

// One table for each target, one row for each operation, as Markdown.
void write_markdown(const std::string &path, const std::vector<line> &lines);

// Puts the tables into a page, between the lines "<!-- results -->" and "<!-- end of results -->", under
// the machine, the command and the date, and charts over them: an SVG file beside the page for all
// families, and one for each.
void write_report(const std::string &page, const std::string &command,
                  const std::vector<line> &lines);

}  // namespace bench

#endif
