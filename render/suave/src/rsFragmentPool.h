#pragma once
// The allocator of a buffer's fragments: whole chunks are taken and handed out by bumping a
// pointer; single fragments are never freed. Everything goes when the pool dies.
//
// A chunk is an image tile one row high, of one byte per pixel, so that fragment memory comes
// from the same memory manager as pixels and is accounted with them. The pool holds a write guard
// on each chunk, which keeps its memory alive and locked.
//
// One pool hands out records of one kind: RsFragment by default, or another fragment record (the
// A-buffer's RsAFragment) whose size is given at construction and which allocate<Record>() then
// hands out.
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
    // so that a pool made for an empty region can still grow), each of fragmentBytes.
    explicit RsFragmentPool(std::int32_t chunkFragments, std::size_t fragmentBytes = sizeof(RsFragment));
    ~RsFragmentPool();
    RsFragmentPool(const RsFragmentPool&) = delete;
    RsFragmentPool& operator=(const RsFragmentPool&) = delete;

    // An uninitialised fragment. Takes a new chunk of getChunkFragments() fragments when the
    // current one is used up. Throws ExOutOfMemory when no chunk can be had. Record must be of the
    // size that the pool was made for.
    template <class Record = RsFragment>
    Record* allocate() {
        if (_current == _end) nextChunk();
        Record* fragment = reinterpret_cast<Record*>(_current);
        _current += sizeof(Record);
        return fragment;
    }

    // Adds a chunk of the given number of bytes and makes it the current one; what was left of
    // the previous chunk is not used any more. A chunk of less than one fragment is held but
    // hands out nothing.
    void allocateChunk(std::size_t bytes);

    // Hands out the memory of every chunk again from the first one on, for a buffer that takes
    // the pool over, and grows by chunkFragments when the chunks are used up. The fragments
    // handed out before are dead from then on.
    void rewind(std::int32_t chunkFragments);

    std::int32_t getChunkFragments() const { return _chunkFragments; }
    void setChunkFragments(std::int32_t chunkFragments);
    std::size_t getChunkCount() const { return _chunks.size(); }
    // Fragments that the current chunk can still hand out.
    std::size_t getFreeFragments() const {
        return static_cast<std::size_t>(_end - _current) / _fragmentBytes;
    }
    std::size_t getFragmentBytes() const { return _fragmentBytes; }

    // The chunk count times the bytes of the first chunk's row; 0 without chunks.
    std::size_t getMemorySize() const;

    void dump(std::ostream& os) const;

private:
    void startChunk(std::size_t bytes);
    // Moves on to the next chunk that holds a fragment, making one when none is left.
    void nextChunk();
    void enterChunk(std::size_t index);
    std::size_t getGrowthBytes() const {
        return static_cast<std::size_t>(_chunkFragments > 0 ? _chunkFragments : 1) * _fragmentBytes;
    }

    // One write guard per chunk, oldest first.
    std::vector<IxTileManip::WriteGuardNoCheck> _chunks;
    std::int32_t _chunkFragments;
    std::size_t _fragmentBytes;  // the size of one record handed out
    // The next free byte of the current chunk, and the end of the fragments that fit in it.
    std::size_t _chunkIndex = 0;  // the chunk that _current and _end lie in
    unsigned char* _current = nullptr;
    unsigned char* _end = nullptr;
};

}  // namespace Zr
