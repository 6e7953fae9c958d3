// simgp-convert, run on files and pipes in a folder of its own.
#ifndef TESTS_CONVERT_PROGRAM_H
#define TESTS_CONVERT_PROGRAM_H

#include <gtest/gtest.h>

#include <filesystem>
#include <set>
#include <string>

#include "tests/program.h"
#include "tools/picture.h"
#include "tools/source.h"

class convert_test : public testing::Test {
  protected:
    convert_test() { std::filesystem::create_directory(at("")); }

    // Files of the program lie apart from what it prints.
    std::string at(const std::string &name) const { return place / ("work/" + name); }
    std::string read(const std::string &name) const { return place.read("work/" + name); }
    void write(const std::string &name, const std::string &bytes) const {
        place.write("work/" + name, bytes);
    }
    std::set<std::string> files(const std::string &folder = "") const {
        std::set<std::string> names;
        for (const auto &entry : std::filesystem::directory_iterator(at(folder)))
            names.insert(entry.path().filename());
        return names;
    }

    // Runs a line of bash in the folder, the program's name written as $C.
    int shell(const std::string &line) {
        place.write("line", "cd '" + at("") + "' && C=" SIMGP_CONVERT " && { " + line + "; }");
        got = program::run(place, "bash '" + place / "line" + "'");
        return got.status;
    }
    int run(const std::string &arguments) { return shell("$C " + arguments); }
    void good(const std::string &arguments) {
        ASSERT_EQ(run(arguments), 0) << arguments << "\n" << got.err;
    }

    // The picture of a PNG in the folder.
    tools::picture png(const std::string &name) const {
        auto source = tools::open_source({.path = at(name)});
        tools::picture p;
        source->next(p);
        return p;
    }

    program::folder place;
    program::outcome got;
};

#endif
