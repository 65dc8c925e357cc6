#pragma once
// A picture as the host writes it to a file: 8-bit straight RGBA, rows from the top down.
#include <cstdint>
#include <ostream>
#include <vector>

#include "ixTile.h"

namespace Zr {

struct ZrImage {
    int width = 0;
    int height = 0;
    std::vector<std::uint8_t> rgba;  // width * height * 4 bytes

    // The pixels of an RGBA 8-bit tile. The renderer's pixel rows count upwards (row y0 is the
    // bottom of the picture), so the rows are turned over.
    static ZrImage fromTile(const IxTile& tile);

    // How two pictures differ: channels compared exactly, byte for byte.
    struct Difference {
        bool sizesDiffer = false;
        long pixelsDiffering = 0;
        int largestChannelDifference = 0;
        bool any() const { return sizesDiffer || pixelsDiffering > 0; }
    };
    static Difference compare(const ZrImage& a, const ZrImage& b);
};

std::ostream& operator<<(std::ostream& os, const ZrImage::Difference& difference);

}  // namespace Zr
