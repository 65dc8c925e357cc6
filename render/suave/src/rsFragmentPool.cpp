#include "rsFragmentPool.h"

#include <climits>
#include <string>

#include "assertions.h"
#include "exOutOfMemory.h"
#include "ixTile.h"

namespace Zr {

namespace {
constexpr const char* kSourceFile = "render\\suave\\src\\rsFragmentPool";
}  // namespace

RsFragmentPool::RsFragmentPool(std::int32_t chunkFragments, std::size_t fragmentBytes)
    : _chunkFragments(chunkFragments), _fragmentBytes(fragmentBytes) {
    ZR_ASSERT_AT(chunkFragments >= 0, kSourceFile, __LINE__);
    ZR_ASSERT_AT(fragmentBytes > 0, kSourceFile, __LINE__);
}

RsFragmentPool::~RsFragmentPool() = default;

void RsFragmentPool::setChunkFragments(std::int32_t chunkFragments) {
    ZR_ASSERT_AT(chunkFragments >= 0, kSourceFile, __LINE__);
    _chunkFragments = chunkFragments;
}

void RsFragmentPool::allocateChunk(std::size_t bytes) { startChunk(bytes); }

void RsFragmentPool::startChunk(std::size_t bytes) {
    // A tile's width is an int: a larger chunk cannot be had.
    if (bytes > static_cast<std::size_t>(INT_MAX)) {
        throw ExOutOfMemory(kSourceFile, __LINE__,
                            "fragment chunk of " + std::to_string(bytes) + " bytes");
    }
    // The tile is released as soon as its guard is stored: the guard alone keeps the memory.
    const IxTile tile(IxPixelFormat::getRawMemoryFormat(),
                      GeRectangle<int>(0, static_cast<int>(bytes), 0, 1), CoRgbaColorTyped<float>());
    _chunks.emplace_back(tile);
    enterChunk(_chunks.size() - 1);
}

void RsFragmentPool::enterChunk(std::size_t index) {
    _chunkIndex = index;
    const IxTileManip::WriteGuardNoCheck& chunk = _chunks[index];
    // An empty tile has no base pointer: the chunk then hands out nothing.
    unsigned char* begin = chunk._basePointer;
    const std::size_t bytes = begin == nullptr ? 0 : static_cast<std::size_t>(chunk._rectangle.getWidth());
    _current = begin;
    // Only whole fragments are handed out; a tail shorter than one stays unused.
    _end = begin + bytes / _fragmentBytes * _fragmentBytes;
}

void RsFragmentPool::nextChunk() {
    while (_current == _end) {
        if (_chunkIndex + 1 < _chunks.size()) enterChunk(_chunkIndex + 1);
        else startChunk(getGrowthBytes());
    }
}

void RsFragmentPool::rewind(std::int32_t chunkFragments) {
    setChunkFragments(chunkFragments);
    if (_chunks.empty()) return;
    enterChunk(0);
}

std::size_t RsFragmentPool::getMemorySize() const {
    if (_chunks.empty()) return 0;
    return _chunks.size() * static_cast<std::size_t>(_chunks.front()._rowStride);
}

void RsFragmentPool::dump(std::ostream& os) const {
    os << " _chunks: " << _chunks.size() << " _chunkFragments: " << _chunkFragments
       << " _current: " << static_cast<const void*>(_current)
       << " _end: " << static_cast<const void*>(_end);
}

}  // namespace Zr
