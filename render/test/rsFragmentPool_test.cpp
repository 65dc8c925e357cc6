// The fragment record's layout and the chunked pool: bump allocation, growth by whole chunks,
// memory accounting, and that every fragment handed out is usable memory of its own.
#include <gtest/gtest.h>

#include <cstddef>
#include <cstdint>
#include <set>
#include <vector>

#include "exOutOfMemory.h"
#include "rsFragment.h"
#include "rsFragmentPool.h"

namespace Zr {
namespace {

// The compositor hands the record itself to transfer functions as a colour, so the colour must
// lead; the rest follows in its stated order.
TEST(RsFragment, ColourLeadsThenDepthTransferNext) {
    EXPECT_EQ(offsetof(RsFragment, _color), 0u);
    EXPECT_LT(offsetof(RsFragment, _color), offsetof(RsFragment, _depth));
    EXPECT_LT(offsetof(RsFragment, _depth), offsetof(RsFragment, _transfer));
    EXPECT_LT(offsetof(RsFragment, _transfer), offsetof(RsFragment, _next));
    RsFragment f{};
    f._color = {0.25f, 0.5f, 0.75f, 1.0f};
    EXPECT_EQ(&reinterpret_cast<const CoRgbaColorTyped<float>&>(f), &f._color);
}

// Fills every fragment with a value of its own and reads all of them back: overlapping or
// misplaced fragments would overwrite each other.
void fillAndCheck(const std::vector<RsFragment*>& fragments) {
    for (std::size_t i = 0; i < fragments.size(); ++i) {
        RsFragment* f = fragments[i];
        f->_color = {float(i), float(i) + 0.5f, -float(i), 1.0f};
        f->_depth = double(i) * 3.0;
        f->_transfer = nullptr;
        f->_next = f;
    }
    for (std::size_t i = 0; i < fragments.size(); ++i) {
        const RsFragment* f = fragments[i];
        ASSERT_EQ(f->_color.r, float(i));
        ASSERT_EQ(f->_color.b, -float(i));
        ASSERT_EQ(f->_depth, double(i) * 3.0);
        ASSERT_EQ(f->_next, f);
    }
}

// For several chunk sizes: the first chunk given explicitly, then growth by whole chunks of the
// set size exactly when the current one is used up; the memory size counts whole chunks of the
// first chunk's bytes; fragments are distinct, aligned for their doubles and pointers, and
// consecutive within a chunk.
TEST(RsFragmentPool, GrowsByWholeChunksWhenTheCurrentOneIsUsedUp) {
    for (std::int32_t perChunk : {1, 2, 3, 7, 64, 1000}) {
        RsFragmentPool pool(perChunk);
        EXPECT_EQ(pool.getChunkCount(), 0u);
        EXPECT_EQ(pool.getMemorySize(), 0u);
        pool.allocateChunk(std::size_t(perChunk) * sizeof(RsFragment));
        EXPECT_EQ(pool.getChunkCount(), 1u);

        std::vector<RsFragment*> fragments;
        std::set<RsFragment*> distinct;
        const int total = perChunk * 3 + 1;
        for (int i = 0; i < total; ++i) {
            RsFragment* f = pool.allocate();
            fragments.push_back(f);
            distinct.insert(f);
            ASSERT_EQ(reinterpret_cast<std::uintptr_t>(f) % alignof(RsFragment), 0u);
            // Chunks needed so far: the explicit first one, then one more per perChunk.
            const std::size_t chunks = std::size_t(i / perChunk + 1);
            ASSERT_EQ(pool.getChunkCount(), chunks) << perChunk << " per chunk, fragment " << i;
            ASSERT_EQ(pool.getFreeFragments(), std::size_t(perChunk - 1 - i % perChunk));
            if (i % perChunk != 0) {
                ASSERT_EQ(f, fragments[std::size_t(i) - 1] + 1);
            }
        }
        EXPECT_EQ(distinct.size(), fragments.size());
        EXPECT_EQ(pool.getMemorySize(), pool.getChunkCount() * perChunk * sizeof(RsFragment));
        fillAndCheck(fragments);
    }
}

// A pool that has no chunk yet takes one of its set size at the first request.
TEST(RsFragmentPool, FirstRequestWithoutChunkTakesOne) {
    RsFragmentPool pool(5);
    RsFragment* f = pool.allocate();
    ASSERT_NE(f, nullptr);
    EXPECT_EQ(pool.getChunkCount(), 1u);
    EXPECT_EQ(pool.getFreeFragments(), 4u);
    EXPECT_EQ(pool.getMemorySize(), 5 * sizeof(RsFragment));
}

// The memory size is the chunk count times the first chunk's bytes, even when later chunks are
// of another size; a first chunk that is not a whole number of fragments hands out the whole ones
// only.
TEST(RsFragmentPool, MemorySizeCountsChunksOfTheFirstChunksBytes) {
    RsFragmentPool pool(4);
    const std::size_t firstBytes = 2 * sizeof(RsFragment) + 13;
    pool.allocateChunk(firstBytes);
    EXPECT_EQ(pool.getFreeFragments(), 2u);
    std::vector<RsFragment*> fragments{pool.allocate(), pool.allocate()};
    EXPECT_EQ(pool.getChunkCount(), 1u);
    fragments.push_back(pool.allocate());
    EXPECT_EQ(pool.getChunkCount(), 2u);
    EXPECT_EQ(pool.getFreeFragments(), 3u);
    EXPECT_EQ(pool.getMemorySize(), 2 * firstBytes);
    fillAndCheck(fragments);

    // A new chunk abandons the rest of the current one.
    pool.allocateChunk(sizeof(RsFragment));
    EXPECT_EQ(pool.getChunkCount(), 3u);
    EXPECT_EQ(pool.getFreeFragments(), 1u);
}

// A pool for a region without pixels: its first chunk is empty, and a request still succeeds by
// growing one fragment at a time.
TEST(RsFragmentPool, EmptyFirstChunkStillGrows) {
    RsFragmentPool pool(0);
    pool.allocateChunk(0);
    EXPECT_EQ(pool.getChunkCount(), 1u);
    EXPECT_EQ(pool.getMemorySize(), 0u);
    std::vector<RsFragment*> fragments{pool.allocate(), pool.allocate()};
    EXPECT_EQ(pool.getChunkCount(), 3u);
    EXPECT_NE(fragments[0], fragments[1]);
    fillAndCheck(fragments);
}

// A chunk whose byte count does not fit a tile's width is a memory failure, not a wrap-around.
TEST(RsFragmentPool, OversizedChunkIsAMemoryFailure) {
    RsFragmentPool pool(1);
    EXPECT_THROW(pool.allocateChunk(std::size_t(1) << 33), ExOutOfMemory);
    EXPECT_EQ(pool.getChunkCount(), 0u);
}

}  // namespace
}  // namespace Zr
