// Still pictures in files of their own.
#include "tools/fault.h"
#include "tools/numbered.h"
#include "tools/sink.h"

namespace tools {

namespace {

class still_sink : public sink {
  public:
    still_sink(const destination &to, still_writer write)
        : pattern_(to.path), may_replace_(to.may_replace), write_(write) {}

    void put(const picture &p) override {
        if (!pattern_.numbered && frame_ == 1)
            throw fault(pattern_.name(0),
                        ": holds one picture, but more frames follow; use a name such "
                        "as out-%04d.png, --sheet or --frames 1");
        output_ = std::make_unique<output>(destination{pattern_.name(frame_), may_replace_});
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
    numbered_name pattern_;
    bool may_replace_;
    still_writer write_;
    std::unique_ptr<output> output_;  // of a single picture, until it is known to be the only one
    int64_t frame_ = 0, kept_ = 0;
};

}  // namespace

std::unique_ptr<sink> open_still_sink(const destination &to, still_writer write) {
    return std::make_unique<still_sink>(to, write);
}

}  // namespace tools
