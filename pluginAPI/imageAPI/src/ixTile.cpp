#include "ixTile.h"

#include <cstring>

#include "ixRowCodec.h"

namespace Zr {

IxTile::IxTile(const IxPixelFormat& format, const GeRectangle<int>& rectangle,
               const CoRgbaColorTyped<float>& fill)
    : _storage(makeShared<IxTileStorage>(format, rectangle)) {
    const IxTileStorage& storage = *_storage;
    const int width = storage.getWidth();
    const int height = storage.getHeight();
    if (width == 0 || height == 0) return;

    // Convert the colour once, then replicate its bytes: first along the top row, doubling the
    // copied part each time, then row by row.
    unsigned char* top = storage.getPixels();
    const int bytesPerPixel = format.getBytesPerPixel();
    IxRowCodec::selectWriter(format)(top, &fill, 1);
    const std::size_t rowBytes = static_cast<std::size_t>(storage.getRowStride());
    for (std::size_t done = bytesPerPixel; done < rowBytes;) {
        const std::size_t chunk = done < rowBytes - done ? done : rowBytes - done;
        std::memcpy(top + done, top, chunk);
        done += chunk;
    }
    for (int y = 1; y < height; ++y) std::memcpy(top + y * rowBytes, top, rowBytes);
}

IxTile::~IxTile() = default;

}  // namespace Zr
