// The chunked fragment pool: bump allocation, growth by whole chunks, the memory account, and
// fragments that are usable memory of their own.
#include <gtest/gtest.h>

#include <cstdint>
#include <set>
#include <vector>

#include "exOutOfMemory.h"
#include "rsFragmentPool.h"

namespace Zr {
namespace {

// Fills every fragment with values of its own and reads them back: overlapping or misplaced
// fragments would overwrite each other.
void fillAndCheck(const std::vector<RsFragment*>& fragments) {
    for (std::size_t i = 0; i < fragments.size(); ++i) {
        *fragments[i] = RsFragment{{float(i), 0.5f, -float(i), 1.0f}, double(i) * 3.0, nullptr, fragments[i]};
    }
    for (std::size_t i = 0; i < fragments.size(); ++i) {
        ASSERT_EQ(fragments[i]->_color.r, float(i));
        ASSERT_EQ(fragments[i]->_color.b, -float(i));
        ASSERT_EQ(fragments[i]->_depth, double(i) * 3.0);
        ASSERT_EQ(fragments[i]->_next, fragments[i]);
    }
}

// After an explicit first chunk, growth by whole chunks of the set size exactly when the current
// one is used up; fragments distinct, aligned, consecutive within a chunk; the memory size counts
// whole chunks of the first chunk's bytes. A pool without a chunk takes one at its first request.
TEST(RsFragmentPool, GrowsByWholeChunksWhenTheCurrentOneIsUsedUp) {
    for (std::int32_t perChunk : {1, 2, 3, 7, 64, 1000}) {
        for (bool explicitFirst : {true, false}) {
            RsFragmentPool pool(perChunk);
            EXPECT_EQ(pool.getMemorySize(), 0u);
            if (explicitFirst) pool.allocateChunk(std::size_t(perChunk) * sizeof(RsFragment));
            std::vector<RsFragment*> fragments;
            for (int i = 0; i < perChunk * 3 + 1; ++i) {
                RsFragment* f = pool.allocate();
                ASSERT_EQ(reinterpret_cast<std::uintptr_t>(f) % alignof(RsFragment), 0u);
                ASSERT_EQ(pool.getChunkCount(), std::size_t(i / perChunk + 1))
                    << perChunk << " per chunk, fragment " << i;
                ASSERT_EQ(pool.getFreeFragments(), std::size_t(perChunk - 1 - i % perChunk));
                if (i % perChunk != 0) {
                    ASSERT_EQ(f, fragments.back() + 1);
                }
                fragments.push_back(f);
            }
            EXPECT_EQ(std::set<RsFragment*>(fragments.begin(), fragments.end()).size(), fragments.size());
            EXPECT_EQ(pool.getMemorySize(), pool.getChunkCount() * perChunk * sizeof(RsFragment));
            fillAndCheck(fragments);
        }
    }
}

// A first chunk that is not a whole number of fragments hands out the whole ones; the memory size
// counts every chunk at the first chunk's bytes; a new chunk abandons the rest of the current
// one; an empty first chunk still grows; a chunk too large for a tile is a memory failure.
TEST(RsFragmentPool, OddChunksAndTheirAccount) {
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
    pool.allocateChunk(sizeof(RsFragment));
    EXPECT_EQ(pool.getChunkCount(), 3u);
    EXPECT_EQ(pool.getFreeFragments(), 1u);

    RsFragmentPool empty(0);
    empty.allocateChunk(0);
    EXPECT_EQ(empty.getMemorySize(), 0u);
    fragments = {empty.allocate(), empty.allocate()};
    EXPECT_EQ(empty.getChunkCount(), 3u);
    fillAndCheck(fragments);

    RsFragmentPool huge(1);
    EXPECT_THROW(huge.allocateChunk(std::size_t(1) << 33), ExOutOfMemory);
    EXPECT_EQ(huge.getChunkCount(), 0u);
}

}  // namespace
}  // namespace Zr
