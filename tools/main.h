// What the main functions of the programs have in common.
#ifndef TOOLS_MAIN_H
#define TOOLS_MAIN_H

#include <stdio.h>

#include <CLI/CLI.hpp>
#include <exception>
#include <new>
#include <string>

namespace tools {

// For numbers of frames and the like, 1 at least; `otherwise` ends the message about all others.
inline CLI::Validator at_least_one(const std::string &otherwise = "") {
    const auto fault_of = [otherwise](const std::string &text) -> std::string {
        const bool number = !text.empty() && text.size() < 19 &&
                            text.find_first_not_of("0123456789") == std::string::npos;
        if (number && std::stoll(text) > 0) return {};
        return text + " is not a number from 1 on" + otherwise;
    };
    return CLI::Validator(fault_of, "");
}

// Reads the command line, lets `check` throw a CLI::ParseError for what the options together lack,
// and does the work. Returns the exit status: that of `work`, 1 if it fails, 2 for a wrong command
// line.
template <class Check, class Work>
int run_program(CLI::App &app, int argc, char **argv, Check check, Work work) {
    const std::string name = app.get_name();
    try {
        app.parse(argc, argv);
        check();
    } catch (const CLI::Success &wish) {
        return app.exit(wish);
    } catch (const CLI::ParseError &error) {
        fprintf(stderr, "%s: %s (see --help)\n", name.c_str(), error.what());
        return 2;
    }
    try {
        return work();
    } catch (const std::bad_alloc &) {
        fprintf(stderr, "%s: not enough memory\n", name.c_str());
    } catch (const std::exception &error) {
        fprintf(stderr, "%s: %s\n", name.c_str(), error.what());
    }
    return 1;
}

}  // namespace tools

#endif
