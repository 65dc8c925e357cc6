#include "zrImage.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <stdexcept>

#include "ixReadGuard.h"

namespace Zr {

ZrImage ZrImage::fromTile(const IxTile& tile) {
    const IxPixelFormat& format = tile.getPixelFormat();
    if (format._comps != IxPixelFormat::RGBA || format._depth != IxPixelFormat::UINT8)
        throw std::invalid_argument("ZrImage::fromTile needs an RGBA 8-bit tile");
    const GeRectangle<int>& rectangle = tile.getRectangle();
    ZrImage image;
    image.width = rectangle.getWidth();
    image.height = rectangle.getHeight();
    image.rgba.resize(static_cast<std::size_t>(image.width) * image.height * 4);
    const IxReadGuard guard(tile);
    const std::size_t rowBytes = static_cast<std::size_t>(image.width) * 4;
    for (int row = 0; row < image.height; ++row) {
        const int y = rectangle.y1 - 1 - row;
        std::memcpy(&image.rgba[row * rowBytes], guard.getPixelAddress(rectangle.x0, y), rowBytes);
    }
    return image;
}

ZrImage::Difference ZrImage::compare(const ZrImage& a, const ZrImage& b) {
    Difference difference;
    if (a.width != b.width || a.height != b.height || a.rgba.size() != b.rgba.size()) {
        difference.sizesDiffer = true;
        return difference;
    }
    for (std::size_t pixel = 0; pixel < a.rgba.size(); pixel += 4) {
        int largest = 0;
        for (std::size_t c = pixel; c < pixel + 4; ++c) largest = std::max(largest, std::abs(a.rgba[c] - b.rgba[c]));
        if (largest > 0) ++difference.pixelsDiffering;
        difference.largestChannelDifference = std::max(difference.largestChannelDifference, largest);
    }
    return difference;
}

std::ostream& operator<<(std::ostream& os, const ZrImage::Difference& difference) {
    if (difference.sizesDiffer) return os << "the pictures differ in size";
    if (!difference.any()) return os << "the pictures are equal";
    return os << difference.pixelsDiffering << " pixels differ, by up to "
              << difference.largestChannelDifference << " in a channel";
}

}  // namespace Zr
