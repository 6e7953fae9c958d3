// PNG through libpng's simplified interface, which brings every kind of PNG to 8-bit sRGB.
#include <png.h>

#include "tools/rgb.h"
#include "tools/sink.h"
#include "tools/source.h"

namespace tools {

namespace {

// The one frame of a PNG file as RGB888 or RGBA8888.
class png_source : public source {
  public:
    png_source(std::unique_ptr<input> in, const pixel_format &format) {
        name_ = in->name();
        if (format.code != SIMGP_FMT_RGB888 && format.code != SIMGP_FMT_RGBA8888)
            throw fault(name_, ": a PNG picture comes as rgb888 or rgba8888, not ", format.name);
        const std::vector<uint8_t> bytes = in->rest();
        png_image image = {};
        image.version = PNG_IMAGE_VERSION;
        if (!png_image_begin_read_from_memory(&image, bytes.data(), bytes.size()))
            fail(image, bytes);
        struct Free {
            png_image *image;
            ~Free() { png_image_free(image); }
        } free{&image};
        check_size(image.width, image.height, name_ + ": byte 16: PNG header");
        // 16-bit samples are nearly always sRGB, whatever they leave unsaid.
        image.flags |= PNG_IMAGE_FLAG_16BIT_sRGB;
        image.format = PNG_FORMAT_RGBA;
        picture rgba({&format_coded(SIMGP_FMT_RGBA8888), int(image.width), int(image.height)});
        const ptrdiff_t stride =
            rgba.height() > 1 ? rgba.line(0, 1) - rgba.line(0, 0) : ptrdiff_t(rgba.line_bytes(0));
        if (!png_image_finish_read(&image, nullptr, rgba.line(0, 0), png_int_32(stride), nullptr))
            fail(image, bytes);
        // As the library does, leave A out rather than mix in some background.
        picture_ = format.code == SIMGP_FMT_RGB888 ? to_rgb888(rgba) : std::move(rgba);
        shape_ = picture_.shape();
    }

    bool next(picture &to) override {
        if (delivered_) return false;
        delivered_ = true;
        to = picture_;
        return true;
    }
    double done() const override { return delivered_; }

  private:
    // The decoder reads ahead: of the place it is only known whether it is the end.
    [[noreturn]] void fail(const png_image &image, const std::vector<uint8_t> &bytes) const {
        throw fault(name_, ": PNG of ", bytes.size(),
                    " bytes is damaged or cut off: ", image.message);
    }

    picture picture_;
    bool delivered_ = false;
};

}  // namespace

std::unique_ptr<source> open_png(std::unique_ptr<input> in, const pixel_format &format) {
    return std::make_unique<png_source>(std::move(in), format);
}

void write_png(output &out, const picture &p) {
    picture rgb = to_rgb888(p);
    png_image image = {};
    image.version = PNG_IMAGE_VERSION;
    image.width = png_uint_32(rgb.width());
    image.height = png_uint_32(rgb.height());
    image.format = PNG_FORMAT_RGB;
    const png_int_32 stride = rgb.descriptor().stride[0];
    png_alloc_size_t size = PNG_IMAGE_PNG_SIZE_MAX(image);
    std::vector<uint8_t> bytes(size);
    if (!png_image_write_to_memory(&image, bytes.data(), &size, 0, rgb.line(0, 0), stride, nullptr))
        throw fault(out.name(), ": PNG: ", image.message);
    out.write(bytes.data(), size);
}

}  // namespace tools
