#include "ipFormatChange.h"

#include <algorithm>
#include <cstring>
#include <memory>

#include "ixRowCodec.h"
#include "osMemoryArch.h"

namespace Zr {

void ipFormatChange(const IxWriteGuard& to, const IxReadGuard& from, const GeRectangle<int>* rectangle) {
    if (!to.holdsTile() || !from.holdsTile()) return;

    const GeRectangle<int>& limit = rectangle ? *rectangle : from._rectangle;
    const int x0 = std::max({limit.x0, from._rectangle.x0, to._rectangle.x0});
    const int x1 = std::min({limit.x1, from._rectangle.x1, to._rectangle.x1});
    const int y0 = std::max({limit.y0, from._rectangle.y0, to._rectangle.y0});
    const int y1 = std::min({limit.y1, from._rectangle.y1, to._rectangle.y1});
    if (x0 >= x1 || y0 >= y1) return;

    // The same layout on both sides is a plain copy of the bytes of each row.
    const bool sameLayout = from._pixelFormat._comps == to._pixelFormat._comps &&
                            from._pixelFormat._depth == to._pixelFormat._depth;
    if (sameLayout) {
        const std::size_t rowBytes =
            static_cast<std::size_t>(x1 - x0) * static_cast<std::size_t>(to.getBytesPerPixel());
        for (int y = y0; y < y1; ++y) {
            std::memmove(to.getPixelAddress(x0, y), from.getPixelAddress(x0, y), rowBytes);
        }
        return;
    }

    const IxRowCodec::Reader read = IxRowCodec::selectReader(from._pixelFormat);
    const IxRowCodec::Writer write = IxRowCodec::selectWriter(to._pixelFormat);
    // One row of colours for the whole call, released on every way out.
    const int width = x1 - x0;
    std::unique_ptr<void, void (*)(void*)> block(
        OsMemoryArch::allocate(static_cast<std::size_t>(width) * sizeof(IxRowCodec::Rgba)),
        &OsMemoryArch::release);
    auto* row = static_cast<IxRowCodec::Rgba*>(block.get());
    for (int y = y0; y < y1; ++y) {
        read(from.getPixelAddress(x0, y), row, width);
        write(to.getPixelAddress(x0, y), row, width);
    }
}

}  // namespace Zr
