#include "ixTileStorage.h"

#include <cstdint>
#include <limits>
#include <string>

#include "exOutOfMemory.h"
#include "osMemoryArch.h"

namespace Zr {

namespace {

constexpr const char* kSourceFile = ".\\pluginAPI/imageAPI/src/ixTileStorage.cpp";

int extent(int from, int to) { return to > from ? to - from : 0; }

}  // namespace

IxTileStorage::IxTileStorage(const IxPixelFormat& format, const GeRectangle<int>& rectangle)
    : _format(format),
      _rectangle(rectangle),
      _width(extent(rectangle.x0, rectangle.x1)),
      _height(extent(rectangle.y0, rectangle.y1)),
      _rowStride(0),
      _byteSize(0),
      _pixels(nullptr),
      _basePointer(nullptr) {
    // Sizes in 64 bits first: the stride must fit an int, the block a size_t.
    const std::int64_t bytesPerPixel = format.getBytesPerPixel();
    const std::int64_t stride = static_cast<std::int64_t>(_width) * bytesPerPixel;
    if (stride > std::numeric_limits<int>::max()) {
        throw ExOutOfMemory(kSourceFile, __LINE__,
                            "tile row of " + std::to_string(stride) + " bytes is too long");
    }
    _rowStride = static_cast<int>(stride);
    _byteSize = static_cast<std::size_t>(stride) * static_cast<std::size_t>(_height);
    _pixels = static_cast<unsigned char*>(OsMemoryArch::allocate(_byteSize));

    // The base lies before the block by the rectangle's offset from the origin, possibly far
    // outside it; the arithmetic is done on integers so that no out-of-range pointer is formed.
    const std::int64_t originOffset =
        static_cast<std::int64_t>(rectangle.y0) * stride +
        static_cast<std::int64_t>(rectangle.x0) * bytesPerPixel;
    _basePointer = reinterpret_cast<unsigned char*>(reinterpret_cast<std::uintptr_t>(_pixels) -
                                                    static_cast<std::uintptr_t>(originOffset));
}

IxTileStorage::~IxTileStorage() { OsMemoryArch::release(_pixels); }

}  // namespace Zr
