#pragma once
// The pixels of a tile: one aligned block, shared by the tile and every guard taken on it, so
// that pixels outlive the IxTile object for as long as a guard holds them.
//
// Rows are stored top to bottom, each exactly width * bytes-per-pixel long. Addresses follow the
// tile's own coordinates: the base pointer addresses pixel (0, 0), which lies outside the block
// unless the rectangle starts at the origin. Pixel (x, y) of the rectangle is at
// base + y * rowStride + x * bytesPerPixel.
#include <cstddef>

#include "geRectangle.h"
#include "ixPixelFormat.h"
#include "lkCounter.h"
#include "rcBase.h"

namespace Zr {

class IxTileStorage : public RCObject {
public:
    // Allocates the pixels, left uninitialised. An empty or inverted rectangle has no pixels.
    // Throws ExOutOfMemory when the block cannot be had or its size not be represented.
    IxTileStorage(const IxPixelFormat& format, const GeRectangle<int>& rectangle);
    ~IxTileStorage() override;
    IxTileStorage(const IxTileStorage&) = delete;
    IxTileStorage& operator=(const IxTileStorage&) = delete;

    const IxPixelFormat& getPixelFormat() const { return _format; }
    const GeRectangle<int>& getRectangle() const { return _rectangle; }
    int getWidth() const { return _width; }
    int getHeight() const { return _height; }
    int getRowStride() const { return _rowStride; }
    std::size_t getByteSize() const { return _byteSize; }
    // The address of pixel (0, 0) of the tile's coordinates.
    unsigned char* getBasePointer() const { return _basePointer; }
    // The first byte of the block: the pixel at the rectangle's top-left corner.
    unsigned char* getPixels() const { return _pixels; }

    // Guards keep the pixels locked in memory while they live; a count, not a mutex.
    void lockMemory() const { _memoryLocks.increment(); }
    void unlockMemory() const { _memoryLocks.decrement(); }
    int getMemoryLockCount() const { return _memoryLocks.get(); }

private:
    IxPixelFormat _format;
    GeRectangle<int> _rectangle;
    int _width;
    int _height;
    int _rowStride;
    std::size_t _byteSize;
    unsigned char* _pixels;
    unsigned char* _basePointer;
    mutable LkCounter<int> _memoryLocks;
};

}  // namespace Zr
