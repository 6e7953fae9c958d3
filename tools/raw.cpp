#include "tools/raw.h"

#include "tools/sink.h"
#include "tools/source.h"

namespace tools {

void read_frame(Input &input, Picture &to, int64_t frame) {
    const int64_t begin = input.offset();
    for (int k = 0; k < to.planes(); ++k)
        for (int y = 0; y < to.rows(k); ++y)
            if (input.read(to.row(k, y), to.row_bytes(k)) != to.row_bytes(k))
                input.fail(frame, input.offset(),
                           "the input ends within the frame: ", input.offset() - begin, " of its ",
                           to.raw_bytes(), " bytes are there");
}

void write_frame(Output &output, const Picture &picture) {
    for (int k = 0; k < picture.planes(); ++k)
        for (int y = 0; y < picture.rows(k); ++y)
            output.write(picture.row(k, y), picture.row_bytes(k));
}

namespace {

class RawSource : public Source {
  public:
    RawSource(std::unique_ptr<Input> input, const Shape &shape) : input_(std::move(input)) {
        name_ = input_->name();
        shape_ = shape;
        if (input_->peek(1).empty()) input_->fail(-1, 0, "the input is empty");
    }
    bool next(Picture &to) override {
        if (input_->peek(1).empty()) return false;
        read_frame(*input_, to, frame_++);
        return true;
    }
    double done() const override {
        return input_->size() > 0 ? double(input_->offset()) / double(input_->size()) : -1;
    }

  private:
    std::unique_ptr<Input> input_;
    int64_t frame_ = 0;
};

class RawSink : public Sink {
  public:
    explicit RawSink(const std::string &path) : output_(path) {}
    void put(const Picture &picture) override { write_frame(output_, picture); }
    void finish() override { output_.commit(); }

  private:
    Output output_;
};

}  // namespace

std::unique_ptr<Source> open_raw(std::unique_ptr<Input> input, const Shape &shape) {
    return std::make_unique<RawSource>(std::move(input), shape);
}

std::unique_ptr<Sink> raw_sink(const std::string &path) { return std::make_unique<RawSink>(path); }

}  // namespace tools
