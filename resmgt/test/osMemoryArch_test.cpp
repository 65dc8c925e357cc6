#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <set>

#include "osMemoryArch.h"

namespace Zr {
namespace {

TEST(OsMemoryArch, BlocksAreAlignedToAPowerOfTwoDistinctAndUsable) {
    OsMemoryArch* arch = OsMemoryArch::getInstance();
    ASSERT_NE(arch, nullptr);
    const auto alignment = static_cast<std::uintptr_t>(arch->getAlignment());
    EXPECT_GE(alignment, 16u);  // at least a whole float RGBA colour
    EXPECT_EQ(alignment & (alignment - 1), 0u);
    std::set<void*> blocks;
    for (std::size_t bytes : {0u, 1u, 3u, 64u, 65u, 1000u, 1u << 20}) {
        void* block = OsMemoryArch::allocate(bytes);
        ASSERT_NE(block, nullptr);
        EXPECT_EQ(reinterpret_cast<std::uintptr_t>(block) % alignment, 0u) << bytes;
        std::memset(block, 0x5a, bytes);  // the sanitizer checks the whole block is ours
        EXPECT_TRUE(blocks.insert(block).second);
    }
    for (void* block : blocks) OsMemoryArch::release(block);
    OsMemoryArch::release(nullptr);
}

}  // namespace
}  // namespace Zr
