// Still pictures in files of their own.
#include "tools/fault.h"
#include "tools/sink.h"

namespace tools {

namespace {

// "out-%04d.png" as what stands before and behind the number, and its width.
struct pattern {
    std::string before, behind;
    size_t digits = 0;
    bool numbered = false;

    explicit pattern(const std::string &path) {
        for (size_t at = 0; at < path.size(); ++at) {
            std::string &part = numbered ? behind : before;
            if (path[at] != '%') {
                part += path[at];
            } else if (path.compare(at, 2, "%%") == 0) {
                part += '%';
                ++at;
            } else {
                size_t end = at + 1;
                while (end < path.size() && path[end] >= '0' && path[end] <= '9') ++end;
                const std::string width = path.substr(at + 1, end - at - 1);
                const bool good = end < path.size() && path[end] == 'd' && width.size() <= 2 &&
                                  (width.empty() || width[0] == '0');
                if (!good || numbered)
                    throw fault(path,
                                ": one number such as %d or %04d may stand in the name; for '%' "
                                "itself write %%");
                digits = width.empty() ? 0 : std::stoul(width);
                numbered = true;
                at = end;
            }
        }
    }
    std::string name(int64_t number) const {
        if (!numbered) return before;
        std::string text = std::to_string(number);
        if (text.size() < digits) text.insert(0, digits - text.size(), '0');
        return before + text + behind;
    }
};

class still_sink : public sink {
  public:
    still_sink(const std::string &path, still_writer write) : pattern_(path), write_(write) {}

    void put(const picture &p) override {
        if (!pattern_.numbered && frame_ == 1)
            throw fault(pattern_.name(0),
                        ": holds one picture, but more frames follow; use a name such "
                        "as out-%04d.png, --sheet or --frames 1");
        output_ = std::make_unique<output>(pattern_.name(frame_));
        write_(*output_, p);
        ++frame_;
        if (!pattern_.numbered) return;
        output_->commit();
        ++kept_;
        output_.reset();
    }
    void finish() override {
        if (output_) output_->commit();
    }
    int64_t kept() const override { return kept_; }

  private:
    pattern pattern_;
    still_writer write_;
    std::unique_ptr<output> output_;  // of a single picture, until it is known to be the only one
    int64_t frame_ = 0, kept_ = 0;
};

}  // namespace

std::unique_ptr<sink> open_still_sink(const std::string &path, still_writer write) {
    return std::make_unique<still_sink>(path, write);
}

}  // namespace tools
