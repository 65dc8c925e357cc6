#pragma once
// The per-pixel arrays and the fragment pool of a fragment buffer, with or without antialiasing:
// a list head per pixel, the Z-buffer of the Z mode or the closed flags of the other, and the pool
// the fragments come from. A buffer takes them from the arrays that the previous region's buffer
// gave back, when those are large enough, and gives them back when it dies, so that the regions of
// a render, drawn one after the other, map their memory once.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <ostream>

#include "rsFragmentPool.h"

namespace Zr {

template <class Fragment, class Closed>
struct RsFragmentArrays {
    // The depth that an empty Z-buffer entry holds: the largest finite double.
    static constexpr double kEmptyDepth = 1.7976931348623157e308;

    std::size_t _arrayPixels = 0;  // the length of each per-pixel array
    std::unique_ptr<Closed[]> _closed;
    std::unique_ptr<double[]> _zBuffer;
    std::unique_ptr<Fragment*[]> _lists;
    std::unique_ptr<RsFragmentPool> _pool;

    // Makes the arrays ready for a buffer of pixels pixels: empty lists, and either an empty
    // Z-buffer or every pixel open. lent, when given, lends what it holds.
    void acquire(std::size_t pixels, bool zBuffer, RsFragmentArrays* lent) {
        if (lent != nullptr && lent->_pool) {
            _pool = std::move(lent->_pool);
            _pool->rewind(static_cast<std::int32_t>(pixels));
        } else {
            // One fragment per pixel in the first chunk: a region without overlap needs no other.
            _pool = std::make_unique<RsFragmentPool>(static_cast<std::int32_t>(pixels), sizeof(Fragment));
            _pool->allocateChunk(pixels * sizeof(Fragment));
        }
        if (lent != nullptr && lent->_arrayPixels >= pixels) {
            _arrayPixels = lent->_arrayPixels;
            _lists = std::move(lent->_lists);
            // Only the array of this buffer's mode: the other one's presence tells the mode.
            if (zBuffer) _zBuffer = std::move(lent->_zBuffer);
            else _closed = std::move(lent->_closed);
        } else {
            _arrayPixels = pixels;
            _lists = std::make_unique_for_overwrite<Fragment*[]>(pixels);
        }
        std::fill(_lists.get(), _lists.get() + pixels, nullptr);
        if (zBuffer) {
            if (!_zBuffer) _zBuffer = std::make_unique_for_overwrite<double[]>(_arrayPixels);
            std::fill(_zBuffer.get(), _zBuffer.get() + pixels, kEmptyDepth);
        } else {
            if (!_closed) _closed = std::make_unique_for_overwrite<Closed[]>(_arrayPixels);
            std::fill(_closed.get(), _closed.get() + pixels, Closed(0));  // all open
        }
    }

    // Gives everything back to lent when given; frees it otherwise, before the buffer's other
    // members go.
    void release(RsFragmentArrays* lent) {
        if (lent != nullptr) {
            lent->_arrayPixels = _arrayPixels;
            lent->_lists = std::move(_lists);
            lent->_zBuffer = std::move(_zBuffer);
            lent->_closed = std::move(_closed);
            lent->_pool = std::move(_pool);
            return;
        }
        _zBuffer.reset();
        _closed.reset();
        _lists.reset();
        _pool.reset();
    }

    void dumpArrays(std::ostream& os) const {
        os << " _closed: " << static_cast<const void*>(_closed.get())
           << " _zBuffer: " << static_cast<const void*>(_zBuffer.get())
           << " _lists: " << static_cast<const void*>(_lists.get()) << " _pool: ";
        _pool->dump(os);
    }

    // The bytes of the arrays and the pool.
    std::size_t getArrayBytes() const {
        std::size_t bytes = 0;
        if (_pool) bytes += sizeof(RsFragmentPool) + _pool->getMemorySize();
        if (_closed) bytes += _arrayPixels * sizeof(Closed);
        if (_zBuffer) bytes += _arrayPixels * sizeof(double);
        if (_lists) bytes += _arrayPixels * sizeof(Fragment*);
        return bytes;
    }
};

}  // namespace Zr
