// simgp-check: a checksum of what each exported function does, to hold against those of other
// processors and compilers.
#include <stdio.h>
#if __has_include(<sys/utsname.h>)
#include <sys/utsname.h>
#endif

#include <fstream>
#include <iterator>
#include <map>
#include <optional>
#include <sstream>

#include "fingerprints.h"  // the table, docs/fingerprints.txt, as the build made it
#include "tools/fault.h"
#include "tools/main.h"
#include "tools/trial.h"

namespace {

using tools::fault;

constexpr uint64_t seed_of_table = 1;

constexpr const char *notes = R"(
Every function is called with made-up formats, sizes, strides, alignments, contents and parameters, the
same on every machine. Its line is a CRC-32 of all that it returned and wrote, bytes around the planes
included. "all" is that of all lines. They are the same on every processor and with every compiler.

Examples:
  simgp-check                                  the lines, one for each function
  simgp-check --compare                        against the table of this release
  simgp-check --compare theirs.txt             against the lines of another machine
  simgp-check --function simgp_rsz_8b --calls  each call: its number, checksum and arguments
)";

struct options {
    std::vector<std::string> only;
    uint64_t seed = seed_of_table;
    bool compare = false, list = false, calls = false;
    std::string table;  // a file; otherwise the one that is built in
};

// The lines of a table, by their names.
std::map<std::string, uint32_t> table_of(std::istream &in, const std::string &name) {
    std::map<std::string, uint32_t> table;
    int number = 0;
    for (std::string line; std::getline(in, line);) {
        ++number;
        if (line.empty() || line[0] == '#') continue;
        char function[64];
        unsigned checksum;
        if (sscanf(line.c_str(), "%63s %8x", function, &checksum) != 2)
            throw fault(name, ": no table of checksums: line ", number,
                        " is not a name and eight digits");
        table[function] = checksum;
    }
    if (table.empty()) throw fault(name, ": no table of checksums");
    return table;
}

std::map<std::string, uint32_t> expected(const std::string &path) {
    if (path.empty()) {
        std::istringstream in(tools::fingerprints);
        return table_of(in, "the table that is built in");
    }
    std::ifstream in(path);
    if (!in) throw fault(path, ": cannot be read");
    return table_of(in, path);
}

// What the system says about the processor.
std::string processor() {
    std::ifstream in("/proc/cpuinfo");
    for (std::string line; std::getline(in, line);)
        for (const char *key : {"model name", "CPU part", "uarch", "isa", "machine"})
            if (line.starts_with(key)) return line;
    return "unknown";
}

// Name and release of the system, and what it calls the machine.
std::string system_name() {
#if __has_include(<sys/utsname.h>)
    utsname system{};
    uname(&system);
    return std::string(system.sysname) + " " + system.release + ", " + system.machine;
#else
    return "Windows";
#endif
}

void describe_machine() {
#ifdef __clang__
    const char *const compiler = __VERSION__;
#else
    const char *const compiler = "GCC " __VERSION__;
#endif
    printf(
        "\nPlease send in the lines above and these, with the options of the compiler and the "
        "flags of\n"
        "/proc/cpuinfo:\n"
        "  system     %s, %d bits, %s-endian\n"
        "  processor  %s\n"
        "  compiler   %s\n",
        system_name().c_str(), int(8 * sizeof(void *)),
        __BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__ ? "little" : "big", processor().c_str(),
        compiler);
}

std::vector<tools::function> chosen(const options &o) {
    std::vector<tools::function> all = tools::all_functions();
    if (o.only.empty()) return all;
    std::vector<tools::function> some;
    for (const std::string &name : o.only) {
        const auto found =
            std::find_if(all.begin(), all.end(), [&](const auto &f) { return f.name == name; });
        if (found == all.end()) throw fault("--function: ", name, " is not known (see --list)");
        some.push_back(*found);
    }
    return some;
}

int run(const options &o) {
    const std::vector<tools::function> functions = chosen(o);
    std::map<std::string, uint32_t> table;
    if (o.compare) table = expected(o.table);

    tools::crc32 all;
    int different = 0;
    for (const tools::function &f : functions) {
        if (o.list) {
            puts(f.name.c_str());
            continue;
        }
        const uint32_t checksum = f.fingerprint(o.seed, o.calls ? stdout : nullptr);
        all.number(checksum);
        if (!o.compare) {
            printf("%s %08x\n", f.name.c_str(), unsigned(checksum));
            fflush(stdout);
            continue;
        }
        const auto line = table.find(f.name);
        if (line != table.end() && line->second == checksum) continue;
        different++;
        if (line == table.end())
            printf("%s %08x, which the table lacks\n", f.name.c_str(), unsigned(checksum));
        else
            printf("%s %08x, should be %08x\n", f.name.c_str(), unsigned(checksum),
                   unsigned(line->second));
    }
    const size_t known = functions.size();
    if (o.compare && o.only.empty()) {
        const auto line = table.find("all");
        if (table.size() != known + 1 || line == table.end() || line->second != all.value()) {
            if (different == 0) printf("The table is not that of these functions.\n");
            different++;
        }
    }
    if (o.compare) {
        if (different == 0)
            printf("OK, %zu function%s, all %08x\n", known, known == 1 ? "" : "s",
                   unsigned(all.value()));
        else
            describe_machine();
    } else if (!o.list && o.only.empty()) {
        printf("all %08x\n", unsigned(all.value()));
    }
    if (fflush(stdout) != 0 || ferror(stdout)) throw fault("standard output: cannot be written");
    return different == 0 ? 0 : 1;
}

}  // namespace

int main(int argc, char **argv) {
    CLI::App app("Checks that the library gives the same results as everywhere else.",
                 "simgp-check");
    app.footer(notes);
    options o;
    auto *compare =
        app.add_option("-c,--compare", o.table,
                       "compare with the table, or with the lines in a file; exit status 1 "
                       "if a function differs");
    compare->expected(0, 1);
    app.add_option("-f,--function", o.only, "only this function; may be repeated")
        ->allow_extra_args(false);
    auto *seed = app.add_option("-s,--seed", o.seed, "another seed than that of the table");
    auto *list = app.add_flag("-l,--list", o.list, "list the functions");
    auto *calls = app.add_flag("--calls", o.calls, "a line for each call as well");
    list->excludes(compare, seed, calls);
    const auto check = [&] {
        o.compare = compare->count() > 0;
        if (o.compare && o.table.empty() && o.seed != seed_of_table)
            throw CLI::ValidationError("--seed", "the table is that of seed 1");
    };
    return tools::run_program(app, argc, argv, check, [&] { return run(o); });
}
