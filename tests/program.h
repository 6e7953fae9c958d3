// Programs run by tests, in a folder of their own.
#ifndef TESTS_PROGRAM_H
#define TESTS_PROGRAM_H

#include <stdlib.h>
#include <sys/wait.h>

#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>

namespace program {

// A folder that goes away with its owner.
class folder {
  public:
    folder() {
        std::string name = (std::filesystem::temp_directory_path() / "simgp-test-XXXXXX").string();
        if (!mkdtemp(name.data())) abort();
        path_ = name;
    }
    ~folder() { std::filesystem::remove_all(path_); }
    folder(const folder &) = delete;

    std::string operator/(const std::string &name) const { return (path_ / name).string(); }
    std::string write(const std::string &name, const std::string &bytes) const {
        std::ofstream(path_ / name, std::ios::binary) << bytes;
        return *this / name;
    }
    std::string read(const std::string &name) const {
        std::ostringstream text;
        text << std::ifstream(path_ / name, std::ios::binary).rdbuf();
        return text.str();
    }

  private:
    std::filesystem::path path_;
};

struct outcome {
    int status;  // of the program; -1 after a signal
    std::string out, err;
};

// Runs a line of shell.
inline outcome run(const folder &place, const std::string &line) {
    const int status =
        system(("{ " + line + " ; } >" + (place / "out") + " 2>" + (place / "err")).c_str());
    return {WIFEXITED(status) ? WEXITSTATUS(status) : -1, place.read("out"), place.read("err")};
}

}  // namespace program

#endif
