#include "zrPngFile.h"

#include <png.h>

#include <stdexcept>

namespace Zr {

namespace {

// libpng's simplified interface keeps its state in a png_image that must be freed on every way
// out once a read has begun.
struct PngImage {
    png_image image{};
    PngImage() { image.version = PNG_IMAGE_VERSION; }
    ~PngImage() { png_image_free(&image); }
    [[noreturn]] void fail(const std::string& what, const std::string& path) const {
        throw std::runtime_error(what + " " + path + ": " + image.message);
    }
};

}  // namespace

void ZrPngFile::write(const std::string& path, const ZrImage& image) {
    PngImage png;
    png.image.width = static_cast<png_uint_32>(image.width);
    png.image.height = static_cast<png_uint_32>(image.height);
    png.image.format = PNG_FORMAT_RGBA;
    if (!png_image_write_to_file(&png.image, path.c_str(), 0, image.rgba.data(), 0, nullptr))
        png.fail("cannot write", path);
}

ZrImage ZrPngFile::read(const std::string& path) {
    PngImage png;
    if (!png_image_begin_read_from_file(&png.image, path.c_str())) png.fail("cannot read", path);
    png.image.format = PNG_FORMAT_RGBA;
    ZrImage image;
    image.width = static_cast<int>(png.image.width);
    image.height = static_cast<int>(png.image.height);
    image.rgba.resize(PNG_IMAGE_SIZE(png.image));
    if (!png_image_finish_read(&png.image, nullptr, image.rgba.data(), 0, nullptr)) png.fail("cannot read", path);
    return image;
}

}  // namespace Zr
