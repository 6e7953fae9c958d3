#include "tools/input.h"

#include <errno.h>
#include <string.h>
#include <sys/stat.h>

#include <algorithm>

namespace tools {

input::input(const std::string &path) {
    const bool standard = path == "-";
    name_ = standard ? "standard input" : path;
    file_ = standard ? stdin : fopen(path.c_str(), "rb");
    if (!file_) throw fault(name_, ": ", strerror(errno));
    struct stat about;
    if (fstat(fileno(file_), &about) == 0) {
        if (S_ISDIR(about.st_mode)) {
            if (!standard) fclose(file_);
            throw fault(name_, ": is a directory");
        }
        if (S_ISREG(about.st_mode)) size_ = about.st_size;
    }
}

input::~input() {
    if (file_ != stdin) fclose(file_);
}

std::string input::peek(size_t count) {
    while (peeked_.size() < count) {
        const int byte = getc(file_);
        if (byte == EOF) break;
        peeked_.push_back(char(byte));
    }
    return peeked_.substr(0, count);
}

size_t input::read(void *to, size_t count) {
    const size_t held = std::min(count, peeked_.size());
    memcpy(to, peeked_.data(), held);
    peeked_.erase(0, held);
    size_t got = held;
    if (got < count) got += fread(static_cast<char *>(to) + got, 1, count - got, file_);
    offset_ += int64_t(got);
    if (got < count && ferror(file_)) fail(-1, offset_, strerror(errno));
    return got;
}

bool input::line(std::string &to, size_t limit) {
    to.clear();
    char byte;
    while (to.size() <= limit && read(&byte, 1) == 1) {
        if (byte == '\n') return true;
        to.push_back(byte);
    }
    return false;
}

std::vector<uint8_t> input::rest() {
    std::vector<uint8_t> all;
    size_t got = 1;
    while (got != 0) {
        const size_t before = all.size();
        all.resize(before + (1 << 16));
        got = read(all.data() + before, 1 << 16);
        all.resize(before + got);
    }
    return all;
}

}  // namespace tools
