#include <gtest/gtest.h>

#include <vector>

#include "exBase.h"
#include "ixGuardProxy.h"

namespace Zr {
namespace {

TEST(IxGuardProxy, TakesAndDropsTheGuardsOfAllRegisteredTilesTogether) {
    IxTile a({IxPixelFormat::RGBA, IxPixelFormat::FLOAT32}, {0, 2, 0, 2}, {0, 0, 0, 0});
    IxTile b({IxPixelFormat::ALPHA, IxPixelFormat::UINT8}, {4, 6, 1, 3}, {0, 0, 0, 0});
    IxTile c({IxPixelFormat::RGB, IxPixelFormat::FLOAT16}, {0, 1, 0, 1}, {0, 0, 0, 0});
    auto locks = [&] {
        return std::vector<int>{a.getStorage()->getMemoryLockCount(), b.getStorage()->getMemoryLockCount(),
                                c.getStorage()->getMemoryLockCount()};
    };
    IxGuardProxy proxy;
    proxy.addTile(a);
    proxy.addTile(b);
    proxy.addTile(a);  // once only
    EXPECT_EQ(proxy.getTileCount(), 2);
    EXPECT_THROW(proxy.getGuard(0), ExAssertionFailed);  // not taken yet

    proxy.takeGuards();
    proxy.takeGuards();  // no second hold
    EXPECT_EQ(locks(), (std::vector<int>{1, 1, 0}));
    EXPECT_EQ(proxy.getGuard(1)._tileHandle, b.getStorage().get());
    EXPECT_THROW(proxy.getGuard(2), ExAssertionFailed);

    proxy.addTile(c);  // joins the guards already held
    EXPECT_EQ(locks(), (std::vector<int>{1, 1, 1}));
    proxy.releaseGuards();
    EXPECT_FALSE(proxy.holdsGuards());
    EXPECT_EQ(locks(), (std::vector<int>{0, 0, 0}));
}

}  // namespace
}  // namespace Zr
