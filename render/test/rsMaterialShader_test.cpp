// The material shader base: the counted lock protocol against a model and under racing threads,
// the unbalanced-unlock and failed-lock cases, and mask composition from maps. Samplers and the
// folding of map weights are checked through the standard shaders that use them.
#include <gtest/gtest.h>

#include <atomic>
#include <random>
#include <thread>
#include <vector>

#include "exBase.h"
#include "rsMaterialShader.h"
#include "rsTestSupport.h"

namespace Zr {
namespace {

using namespace RsTest;
using Params = RCShdPtr<const SdTextureParams>;

Params makeMap(float weight, const Rgba& colour = {0.5f, 0.25f, 1.0f, 0.5f}) {
    return Params(makeShared<ConstantParams>(colour, weight));
}

// A shader that watches its own lock protocol: it counts the calls of the two hooks and records a
// violation whenever a hook runs when it should not - lockMemoryImpl while the memory is in or
// some thread holds the shader, unlockMemoryImpl while it is out or held, or either hook while the
// other runs. The test threads keep `holders` up to date around their use.
class ProbeShader : public RsMaterialShader {
public:
    explicit ProbeShader(const RCShdPtr<const SdMaterial>& m = makeShared<SdMaterial>()) : RsMaterialShader(m) {}
    Rgba shade(RsShadingContext&) override { return {}; }
    unsigned int getNeededContext() const override { return 0; }
    bool isLockFree() {
        if (!_lock.tryLock()) return false;
        _lock.unlock();
        return true;
    }

    std::atomic<int> lockImpls{0}, unlockImpls{0}, violations{0}, holders{0}, inside{0};
    std::atomic<bool> resident{false};
    bool failNextLock = false;

protected:
    void lockMemoryImpl() override { hook(true); }
    void unlockMemoryImpl() override { hook(false); }

private:
    void hook(bool locking) {
        violations += inside.fetch_add(1) != 0 || holders != 0 || resident == locking;
        if (locking && failNextLock) {
            failNextLock = false;
            --inside;
            throw ExBase("probe", 1, "texture memory unavailable");
        }
        std::this_thread::yield();  // widens the window in which a racing caller could slip in
        resident = locking;
        ++(locking ? lockImpls : unlockImpls);
        --inside;
    }
};

// A random walk of locks and unlocks against a counting model: the hooks run on the first lock
// and the last unlock only.
TEST(RsMaterialShader, LockHooksRunOnTheFirstLockAndTheLastUnlockOnly) {
    std::mt19937 rng(3);
    ProbeShader shader;
    int count = 0, lockCycles = 0, unlockCycles = 0;
    for (int step = 0; step < 5000; ++step) {
        // Unlocks a little more often than locks, so that the walk keeps coming back to 0.
        if (count == 0 || rng() % 5 < 2) {
            shader.lockMemory();
            lockCycles += count++ == 0;
        } else {
            shader.unlockMemory();
            unlockCycles += --count == 0;
        }
        ASSERT_EQ(shader.getLockCount(), count);
        ASSERT_EQ(shader.lockImpls, lockCycles);
        ASSERT_EQ(shader.unlockImpls, unlockCycles);
        ASSERT_EQ(shader.resident, count > 0);
    }
    EXPECT_GT(lockCycles, 100);
    EXPECT_EQ(shader.violations, 0);
}

// An unlock without a lock fails its assertion and changes nothing, leaving the lock free; so does
// one after a lock hook that failed, and the next lock tries the hook again. A shader needs a
// material.
TEST(RsMaterialShader, UnbalancedUnlockAndFailedLockChangeNothing) {
    EXPECT_THROW(ProbeShader{RCShdPtr<const SdMaterial>()}, ExNullPtr);
    ProbeShader shader;
    shader.lockMemory();
    shader.lockMemory();
    shader.unlockMemory();
    EXPECT_EQ(shader.unlockImpls, 0) << "one lock is still outstanding";
    shader.unlockMemory();
    for (int attempt = 0; attempt < 2; ++attempt) {
        EXPECT_THROW(shader.unlockMemory(), ExAssertionFailed);
        EXPECT_TRUE(shader.isLockFree());
        EXPECT_EQ(shader.getLockCount(), 0);
        EXPECT_EQ(shader.unlockImpls, 1);
    }
    shader.failNextLock = true;
    EXPECT_THROW(shader.lockMemory(), ExBase);
    EXPECT_EQ(shader.getLockCount(), 0);
    EXPECT_TRUE(shader.isLockFree());
    EXPECT_THROW(shader.unlockMemory(), ExAssertionFailed);
    shader.lockMemory();
    EXPECT_EQ(shader.lockImpls, 2);
    EXPECT_TRUE(shader.resident);
    shader.unlockMemory();
    EXPECT_EQ(shader.unlockImpls, 2);
    EXPECT_EQ(shader.violations, 0);
}

TEST(RsMaterialShader, ConcurrentLockersSeeOneHookCallPerLockCycle) {
    constexpr int threadCount = 8, rounds = 3000;
    ProbeShader shader;
    std::atomic<int> notResidentWhileHeld{0};
    std::atomic<bool> go{false};
    std::vector<std::thread> threads;
    for (int t = 0; t < threadCount; ++t)
        threads.emplace_back([&, t] {
            while (!go) std::this_thread::yield();
            std::mt19937 rng(100 + t);
            for (int round = 0; round < rounds; ++round) {
                shader.lockMemory();
                ++shader.holders;
                notResidentWhileHeld += !shader.resident;
                // Sometimes lock again while holding: an inner lock must not reach the hooks.
                if (rng() % 4 == 0) shader.lockMemory(), shader.unlockMemory();
                if (rng() % 2 == 0) std::this_thread::yield();
                notResidentWhileHeld += !shader.resident;
                --shader.holders;
                shader.unlockMemory();
            }
        });
    go = true;
    for (std::thread& thread : threads) thread.join();
    EXPECT_EQ(shader.violations, 0);
    EXPECT_EQ(notResidentWhileHeld, 0);
    EXPECT_EQ(shader.getLockCount(), 0);
    EXPECT_FALSE(shader.resident);
    EXPECT_GE(shader.lockImpls, 1);
    EXPECT_EQ(shader.lockImpls, shader.unlockImpls);
}

// Exposes the protected helpers of the base.
class HelperAccess : public RsMaterialShader {
public:
    using RsMaterialShader::neededContextOfBumpMap;
    using RsMaterialShader::neededContextOfMap;
};

// A map adds the bits asked for (by default the texture coordinates) and a missing map nothing; a
// bump map adds them only when its weight is not zero.
TEST(RsMaterialShader, NeededContextComesFromTheMapsThatExist) {
    const Params map = makeMap(0.8f), flatBump = makeMap(0.0f), steepBump = makeMap(-2.0f);
    EXPECT_EQ(HelperAccess::neededContextOfMap(map), RsShadingContext::needsTexCoord);
    for (unsigned int bits : {0x01u, 0x42u, 0x7fu}) {
        EXPECT_EQ(HelperAccess::neededContextOfMap(map, bits), bits);
        EXPECT_EQ(HelperAccess::neededContextOfMap(Params(), bits), 0u);
        EXPECT_EQ(HelperAccess::neededContextOfBumpMap(steepBump, bits), bits);
        EXPECT_EQ(HelperAccess::neededContextOfBumpMap(map, bits), bits);
        EXPECT_EQ(HelperAccess::neededContextOfBumpMap(flatBump, bits), 0u);
        EXPECT_EQ(HelperAccess::neededContextOfBumpMap(Params(), bits), 0u);
    }
}

}  // namespace
}  // namespace Zr
