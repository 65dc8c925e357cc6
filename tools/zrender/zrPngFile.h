#pragma once
// Reading and writing PNG files of 8-bit straight RGBA pictures. Failures (a file that cannot be
// opened, a broken PNG) are std::runtime_error with libpng's message.
#include <string>

#include "zrImage.h"

namespace Zr {

class ZrPngFile {
public:
    static void write(const std::string& path, const ZrImage& image);
    // Any PNG, converted to 8-bit RGBA.
    static ZrImage read(const std::string& path);
};

}  // namespace Zr
