// Still pictures in files of their own.
#include "tools/fault.h"
#include "tools/sink.h"

namespace tools {

namespace {

/// "out-%04d.png" as what stands before and behind the number, and its width.
struct Pattern {
    std::string before, behind;
    size_t digits = 0;
    bool numbered = false;

    explicit Pattern(const std::string &path) {
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
                    throw Fault(path,
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

class StillSink : public Sink {
  public:
    StillSink(const std::string &path, WriteStill write) : pattern_(path), write_(write) {}

    void put(const Picture &picture) override {
        if (!pattern_.numbered && frame_ == 1)
            throw Fault(pattern_.name(0),
                        ": holds one picture, but more frames follow; use a name such "
                        "as out-%04d.png, --sheet or --frames 1");
        output_ = std::make_unique<Output>(pattern_.name(frame_));
        write_(*output_, picture);
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
    Pattern pattern_;
    WriteStill write_;
    std::unique_ptr<Output> output_;  // of a single picture, until it is known to be the only one
    int64_t frame_ = 0, kept_ = 0;
};

}  // namespace

std::unique_ptr<Sink> still_sink(const std::string &path, WriteStill write) {
    return std::make_unique<StillSink>(path, write);
}

}  // namespace tools
