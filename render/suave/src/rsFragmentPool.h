#pragma once
// The allocator of a buffer's fragments: whole chunks are taken and handed out by bumping a
// pointer; single fragments are never freed. Everything goes when the pool dies.
//
// A chunk is an image tile one row high, of one byte per pixel, so that fragment memory comes
// from the same memory manager as pixels and is accounted with them. The pool holds a write guard
// on each chunk, which keeps its memory alive and locked.
#include <cstddef>
#include <cstdint>
#include <ostream>
#include <vector>

#include "ixTileManip.h"
#include "rsFragment.h"

namespace Zr {

class RsFragmentPool {
public:
    // A pool without chunks; its chunks will hold chunkFragments fragments each (at least one,
    // so that a pool made for an empty region can still grow).
    explicit RsFragmentPool(std::int32_t chunkFragments);
    ~RsFragmentPool();
    RsFragmentPool(const RsFragmentPool&) = delete;
    RsFragmentPool& operator=(const RsFragmentPool&) = delete;

    // An uninitialised fragment. Takes a new chunk of getChunkFragments() fragments when the
    // current one is used up. Throws ExOutOfMemory when no chunk can be had.
    RsFragment* allocate() {
        if (_current == _end) startChunk(getGrowthBytes());
        RsFragment* fragment = reinterpret_cast<RsFragment*>(_current);
        _current += sizeof(RsFragment);
        return fragment;
    }

    // Adds a chunk of the given number of bytes and makes it the current one; what was left of
    // the previous chunk is not used any more. A chunk of less than one fragment is held but
    // hands out nothing.
    void allocateChunk(std::size_t bytes);

    std::int32_t getChunkFragments() const { return _chunkFragments; }
    void setChunkFragments(std::int32_t chunkFragments);
    std::size_t getChunkCount() const { return _chunks.size(); }
    // Fragments that the current chunk can still hand out.
    std::size_t getFreeFragments() const {
        return static_cast<std::size_t>(_end - _current) / sizeof(RsFragment);
    }

    // The chunk count times the bytes of the first chunk's row; 0 without chunks.
    std::size_t getMemorySize() const;

    void dump(std::ostream& os) const;

private:
    void startChunk(std::size_t bytes);
    std::size_t getGrowthBytes() const {
        return static_cast<std::size_t>(_chunkFragments > 0 ? _chunkFragments : 1) * sizeof(RsFragment);
    }

    // One write guard per chunk, oldest first.
    std::vector<IxTileManip::WriteGuardNoCheck> _chunks;
    std::int32_t _chunkFragments;
    // The next free byte of the current chunk, and the end of the fragments that fit in it.
    unsigned char* _current = nullptr;
    unsigned char* _end = nullptr;
};

}  // namespace Zr
