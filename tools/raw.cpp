#include "tools/raw.h"

#include "tools/sink.h"
#include "tools/source.h"

namespace tools {

void read_frame(input &in, picture &to, int64_t frame) {
    const int64_t begin = in.offset();
    for (int k = 0; k < to.planes(); ++k)
        for (int y = 0; y < to.lines(k); ++y)
            if (in.read(to.line(k, y), to.line_bytes(k)) != to.line_bytes(k))
                in.fail(frame, in.offset(),
                        "the input ends within the frame: ", in.offset() - begin, " of its ",
                        to.raw_bytes(), " bytes are there");
}

void write_frame(output &out, const picture &p) {
    for (int k = 0; k < p.planes(); ++k)
        for (int y = 0; y < p.lines(k); ++y) out.write(p.line(k, y), p.line_bytes(k));
}

namespace {

class raw_source : public source {
  public:
    raw_source(std::unique_ptr<input> in, const picture_shape &shape) : input_(std::move(in)) {
        name_ = input_->name();
        shape_ = shape;
        if (input_->peek(1).empty()) input_->fail(-1, 0, "the input is empty");
    }
    bool next(picture &to) override {
        if (input_->peek(1).empty()) return false;
        read_frame(*input_, to, frame_++);
        return true;
    }
    double done() const override { return input_->done(); }

  private:
    std::unique_ptr<input> input_;
    int64_t frame_ = 0;
};

class raw_sink : public sink {
  public:
    explicit raw_sink(const destination &to) : output_(to) {}
    void put(const picture &p) override { write_frame(output_, p); }
    void finish() override { output_.commit(); }

  private:
    output output_;
};

}  // namespace

std::unique_ptr<source> open_raw(std::unique_ptr<input> in, const picture_shape &shape) {
    return std::make_unique<raw_source>(std::move(in), shape);
}

std::unique_ptr<sink> open_raw_sink(const destination &to) {
    return std::make_unique<raw_sink>(to);
}

}  // namespace tools
