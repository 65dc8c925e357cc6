// The material shader base: settings taken from the material, the counted lock protocol against a
// model and under racing threads, the unbalanced-unlock assertion, samplers for present and absent
// maps, weight folding against closed forms, mask composition from maps, and a host's own shader
// driven the way the drawing code drives the library's.
#include <gtest/gtest.h>

#include <atomic>
#include <random>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include "exBase.h"
#include "rsMaterialShader.h"
#include "rsShadingTestSupport.h"

namespace Zr {
namespace {

using shadingTest::ConstantParams;
using Params = RCShdPtr<const SdTextureParams>;
using Rgb = CoRgbColorTyped<float>;

RCShdPtr<const SdMaterial> makeMaterial(SdMaterial::TransferMode mode = SdMaterial::TransferMode::normal,
                                        bool wireframe = false, bool screenSpace = true,
                                        float wireSize = 1.0f) {
    RCShdPtr<SdMaterial> material = makeShared<SdMaterial>();
    material->_transferMode = mode;
    material->_wireframe = wireframe;
    material->_screenSpace = screenSpace;
    material->_wireSize = wireSize;
    return material;
}

Params makeMap(float weight, const CoRgbaColorTyped<float>& colour = {0.5f, 0.25f, 1.0f, 0.5f}) {
    return Params(makeShared<ConstantParams>(colour, weight));
}

// A shader that watches its own lock protocol. It counts the calls of the two hooks and records
// a violation whenever a hook runs when it should not: lockMemoryImpl while the memory is in or
// while some thread holds the shader, unlockMemoryImpl while the memory is out or held, or either
// hook while the other one runs. The test threads keep `holders` up to date around their use.
class ProbeShader : public RsMaterialShader {
public:
    explicit ProbeShader(const RCShdPtr<const SdMaterial>& material) : RsMaterialShader(material) {}

    CoRgbaColorTyped<float> shade(RsShadingContext&) override { return {}; }
    unsigned int getNeededContext() const override { return 0; }

    const char* getLockName() const { return _lock.getName(); }
    bool isLockFree() {
        if (!_lock.tryLock()) return false;
        _lock.unlock();
        return true;
    }

    std::atomic<int> lockImpls{0};
    std::atomic<int> unlockImpls{0};
    std::atomic<int> violations{0};
    std::atomic<int> holders{0};
    std::atomic<bool> resident{false};
    bool failNextLock = false;

protected:
    void lockMemoryImpl() override {
        enter();
        if (failNextLock) {
            failNextLock = false;
            leave();
            throw ExBase("probe", 1, "texture memory unavailable");
        }
        if (resident || holders != 0) ++violations;
        std::this_thread::yield();  // widen the window in which a racing caller could slip in
        resident = true;
        ++lockImpls;
        leave();
    }
    void unlockMemoryImpl() override {
        enter();
        if (!resident || holders != 0) ++violations;
        std::this_thread::yield();
        resident = false;
        ++unlockImpls;
        leave();
    }

private:
    void enter() {
        if (_inside.fetch_add(1) != 0) ++violations;
    }
    void leave() { _inside.fetch_sub(1); }

    std::atomic<int> _inside{0};
};

TEST(RsMaterialShader, TakesTransferModeAndWireSettingsFromTheMaterial) {
    for (int mode = 0; mode < SdMaterial::transferModeCount; ++mode) {
        const bool wire = mode % 2 == 0;
        const bool screen = mode % 3 != 0;
        const float size = 0.5f + static_cast<float>(mode);
        const auto material =
            makeMaterial(static_cast<SdMaterial::TransferMode>(mode), wire, screen, size);
        const RCShdPtr<ProbeShader> shader = makeShared<ProbeShader>(material);
        EXPECT_EQ(shader->getTransferMode(), static_cast<SdMaterial::TransferMode>(mode));
        EXPECT_EQ(shader->isWireframe(), wire);
        EXPECT_EQ(shader->isScreenSpace(), screen);
        EXPECT_EQ(shader->getWireSize(), size);
        EXPECT_EQ(shader->getMaterial(), material);
        EXPECT_EQ(shader->getLockCount(), 0);
    }

    // The settings are copied: later edits of the material do not reach a made shader.
    RCShdPtr<SdMaterial> material = makeShared<SdMaterial>();
    const RCShdPtr<ProbeShader> shader = makeShared<ProbeShader>(RCShdPtr<const SdMaterial>(material));
    EXPECT_FALSE(shader->isWireframe());
    EXPECT_TRUE(shader->isScreenSpace());
    EXPECT_EQ(shader->getWireSize(), 1.0f);
    material->_wireframe = true;
    material->_transferMode = SdMaterial::TransferMode::add;
    EXPECT_FALSE(shader->isWireframe());
    EXPECT_EQ(shader->getTransferMode(), SdMaterial::TransferMode::normal);

    EXPECT_THROW({ ProbeShader probe{RCShdPtr<const SdMaterial>()}; }, ExNullPtr);
}

TEST(RsMaterialShader, LockHooksRunOnTheFirstLockAndTheLastUnlockOnly) {
    // A random walk of locks and unlocks against a plain counting model.
    std::mt19937 rng(3);
    ProbeShader shader(makeMaterial());
    int modelCount = 0;
    int modelLockCycles = 0;
    int modelUnlockCycles = 0;
    for (int step = 0; step < 5000; ++step) {
        // Unlocks a little more often than locks, so that the walk keeps coming back to 0.
        const bool lock = modelCount == 0 || rng() % 5 < 2;
        if (lock) {
            shader.lockMemory();
            if (modelCount++ == 0) ++modelLockCycles;
        } else {
            shader.unlockMemory();
            if (--modelCount == 0) ++modelUnlockCycles;
        }
        ASSERT_EQ(shader.getLockCount(), modelCount);
        ASSERT_EQ(shader.lockImpls, modelLockCycles);
        ASSERT_EQ(shader.unlockImpls, modelUnlockCycles);
        ASSERT_EQ(shader.resident, modelCount > 0);
    }
    EXPECT_GT(modelLockCycles, 100);
    EXPECT_EQ(shader.violations, 0);
}

TEST(RsMaterialShader, UnbalancedUnlockFailsWithItsAssertionAndFreesTheLock) {
    ProbeShader shader(makeMaterial());
    EXPECT_STREQ(shader.getLockName(), "RsMaterialShader lock");

    shader.lockMemory();
    shader.lockMemory();
    shader.unlockMemory();
    EXPECT_EQ(shader.unlockImpls, 0) << "one lock is still outstanding";
    shader.unlockMemory();
    EXPECT_EQ(shader.unlockImpls, 1);

    for (int attempt = 0; attempt < 2; ++attempt) {
        try {
            shader.unlockMemory();
            ADD_FAILURE() << "an unlock without a lock must fail";
        } catch (const ExAssertionFailed& failure) {
            EXPECT_EQ(failure.getFile(), "render\\yarp\\src\\rsMaterialShader");
            EXPECT_EQ(failure.getLine(), 232);
            EXPECT_EQ(failure.getMessage(), "_lockCount > 0");
        }
        // The failure changed nothing and left the lock free for the next caller.
        EXPECT_TRUE(shader.isLockFree());
        EXPECT_EQ(shader.getLockCount(), 0);
        EXPECT_EQ(shader.unlockImpls, 1);
    }

    // Unlocking an unused shader fails the same way.
    ProbeShader fresh(makeMaterial());
    EXPECT_THROW(fresh.unlockMemory(), ExAssertionFailed);
    EXPECT_EQ(fresh.unlockImpls, 0);
}

TEST(RsMaterialShader, FailedLockHookLeavesTheShaderUnlocked) {
    ProbeShader shader(makeMaterial());
    shader.failNextLock = true;
    EXPECT_THROW(shader.lockMemory(), ExBase);
    EXPECT_EQ(shader.getLockCount(), 0);
    EXPECT_TRUE(shader.isLockFree());
    EXPECT_THROW(shader.unlockMemory(), ExAssertionFailed);

    // The next lock tries again.
    shader.lockMemory();
    EXPECT_EQ(shader.lockImpls, 1);
    EXPECT_TRUE(shader.resident);
    shader.unlockMemory();
    EXPECT_EQ(shader.unlockImpls, 1);
    EXPECT_EQ(shader.violations, 0);
}

TEST(RsMaterialShader, ConcurrentLockersSeeOneHookCallPerLockCycle) {
    constexpr int threadCount = 8;
    constexpr int rounds = 3000;
    ProbeShader shader(makeMaterial());
    std::atomic<int> notResidentWhileHeld{0};
    std::atomic<bool> go{false};

    std::vector<std::thread> threads;
    for (int t = 0; t < threadCount; ++t) {
        threads.emplace_back([&, t] {
            while (!go) std::this_thread::yield();
            std::mt19937 rng(100 + t);
            for (int round = 0; round < rounds; ++round) {
                shader.lockMemory();
                ++shader.holders;
                if (!shader.resident) ++notResidentWhileHeld;
                // Sometimes lock again while holding: an inner lock must not reach the hooks.
                if (rng() % 4 == 0) {
                    shader.lockMemory();
                    shader.unlockMemory();
                }
                if (rng() % 2 == 0) std::this_thread::yield();
                if (!shader.resident) ++notResidentWhileHeld;
                --shader.holders;
                shader.unlockMemory();
            }
        });
    }
    go = true;
    for (std::thread& thread : threads) thread.join();

    EXPECT_EQ(shader.violations, 0);
    EXPECT_EQ(notResidentWhileHeld, 0);
    EXPECT_EQ(shader.getLockCount(), 0);
    EXPECT_FALSE(shader.resident);
    EXPECT_GE(shader.lockImpls, 1);
    EXPECT_EQ(shader.lockImpls, shader.unlockImpls);
    EXPECT_LE(shader.lockImpls, threadCount * rounds);
}

// Exposes the protected helpers of the base.
class HelperAccess : public RsMaterialShader {
public:
    using RsMaterialShader::createSampler;
    using RsMaterialShader::neededContextOfBumpMap;
    using RsMaterialShader::neededContextOfMap;
    using RsMaterialShader::scaleByTexture;
    using RsMaterialShader::scaleByTextures;
};

TEST(RsMaterialShader, CreateSamplerHandsOutTheMapsSamplerOrAWhiteOne) {
    const CoRgbaColorTyped<float> white(1.0f, 1.0f, 1.0f, 1.0f);
    const GePoint2<double> at(0.3, 0.7);
    const GeLinearMatrix2<double> footprint(0.01, 0.0, 0.0, 0.01);

    // Without a map, and for a map that hands out no sampler, every lookup answers white.
    const RCShdPtr<ConstantParams> silent =
        makeShared<ConstantParams>(CoRgbaColorTyped<float>(0.2f, 0.2f, 0.2f, 0.2f), 1.0f, true);
    for (const Params& params : {Params(), Params(silent)}) {
        const OPtr<SdTextureSampler> sampler = HelperAccess::createSampler(params);
        ASSERT_TRUE(sampler);
        EXPECT_EQ(sampler->sample(at, footprint), white);
        EXPECT_EQ(sampler->sample(at, GeLinearMatrix2<float>(footprint)), white);
        EXPECT_EQ(sampler->sample(at, 0.1, 0.1), white);
        EXPECT_EQ(sampler->sample(3, 4), white);
        EXPECT_EQ(sampler->sample(3, 4, 0.25f, 0.75f), white);
        EXPECT_EQ(sampler->sample(3, 4, GeLinearMatrix2<float>()), white);
        sampler->releaseTiles();
        EXPECT_EQ(sampler->sample(at, footprint), white);
    }

    // With a map, the map's own sampler, a new one per call.
    const CoRgbaColorTyped<float> colour(0.1f, 0.2f, 0.3f, 0.4f);
    const RCShdPtr<ConstantParams> map = makeShared<ConstantParams>(colour, 0.5f);
    {
        const OPtr<SdTextureSampler> first = HelperAccess::createSampler(Params(map));
        const OPtr<SdTextureSampler> second = HelperAccess::createSampler(Params(map));
        EXPECT_EQ(map->getSamplersMade(), 2);
        EXPECT_NE(first.get(), second.get());
        EXPECT_EQ(first->sample(at, footprint), colour);
        first->releaseTiles();
        EXPECT_EQ(map->getReleases(), 1);
    }
    EXPECT_EQ(map->getDestructions(), 2) << "the caller owns the samplers";
}

TEST(RsMaterialShader, ScaleByTextureFoldsMapWeightsIntoColours) {
    const Rgb colours[] = {{0.0f, 0.0f, 0.0f}, {1.0f, 0.5f, 0.25f}, {-2.0f, 3.5f, 1e-3f}, {7.0f, 0.1f, 0.9f}};
    const float weights[] = {0.0f, 1.0f, 0.5f, 3.0f, -1.25f, 0.1f};
    const float alphas[] = {0.0f, 0.35f, 1.0f, 2.0f};

    for (const Rgb& c : colours) {
        // No map: the colour as it is, and the alpha given.
        EXPECT_EQ(HelperAccess::scaleByTexture(c, Params()), c);
        EXPECT_EQ(HelperAccess::scaleByTextures(c, Params(), Params()), c);
        for (float alpha : alphas)
            EXPECT_EQ(HelperAccess::scaleByTexture(c, alpha, Params()), CoRgbaColorTyped<float>(c, alpha));

        for (float w1 : weights) {
            const Params map1 = makeMap(w1);
            const Rgb one = HelperAccess::scaleByTexture(c, map1);
            EXPECT_NEAR(one.r, double(c.r) * w1, 1e-6 * (1 + std::abs(c.r * w1)));
            EXPECT_NEAR(one.g, double(c.g) * w1, 1e-6 * (1 + std::abs(c.g * w1)));
            EXPECT_NEAR(one.b, double(c.b) * w1, 1e-6 * (1 + std::abs(c.b * w1)));
            for (float alpha : alphas) {
                const CoRgbaColorTyped<float> withAlpha = HelperAccess::scaleByTexture(c, alpha, map1);
                EXPECT_EQ(withAlpha.getRgb(), one);
                EXPECT_EQ(withAlpha.a, alpha) << "alpha is set, not scaled";
            }
            // Either map alone, or both in turn.
            EXPECT_EQ(HelperAccess::scaleByTextures(c, map1, Params()), one);
            EXPECT_EQ(HelperAccess::scaleByTextures(c, Params(), map1), one);
            for (float w2 : weights) {
                const Rgb both = HelperAccess::scaleByTextures(c, map1, makeMap(w2));
                const double w = double(w1) * w2;
                EXPECT_NEAR(both.r, c.r * w, 1e-6 * (1 + std::abs(c.r * w)));
                EXPECT_NEAR(both.g, c.g * w, 1e-6 * (1 + std::abs(c.g * w)));
                EXPECT_NEAR(both.b, c.b * w, 1e-6 * (1 + std::abs(c.b * w)));
            }
        }
    }
}

// The five maps of a material, each present or absent.
struct Maps {
    Params diffuse, reflection, refraction, irradiance, bump;
};

// Shaders that compose their masks from their maps with the base's helpers, after the two lit
// models of the library: one that always lights (eye position and normal) and one that needs
// only what its maps need.
class LitMaskShader : public HelperAccess {
public:
    static unsigned int compose(const Maps& m) {
        return RsShadingContext::needsEyeCoord | RsShadingContext::needsNormal |
               neededContextOfMap(m.diffuse) |
               neededContextOfBumpMap(m.bump, RsShadingContext::needsTexCoord |
                                                  RsShadingContext::needsTangents);
    }
};
class UnlitMaskShader : public HelperAccess {
public:
    static unsigned int compose(const Maps& m) {
        const unsigned int eyeAndNormal = RsShadingContext::needsEyeCoord | RsShadingContext::needsNormal;
        return neededContextOfMap(m.diffuse) | neededContextOfMap(m.reflection, eyeAndNormal) |
               neededContextOfMap(m.refraction, eyeAndNormal) |
               neededContextOfMap(m.irradiance, RsShadingContext::needsNormal) |
               neededContextOfBumpMap(m.bump, RsShadingContext::needsNormal |
                                                  RsShadingContext::needsTexCoord |
                                                  RsShadingContext::needsTangents);
    }
};

TEST(RsMaterialShader, NeededContextComposesFromTheMapsThatExist) {
    const Params map = makeMap(0.8f);
    const Params flatBump = makeMap(0.0f);
    const Params steepBump = makeMap(-2.0f);
    struct Row {
        Maps maps;
        unsigned int lit, unlit;
    };
    const Row rows[] = {
        {{}, 0x03u, 0x00u},
        {{map, {}, {}, {}, {}}, 0x3fu, 0x3cu},
        {{{}, map, {}, {}, {}}, 0x03u, 0x03u},
        {{{}, {}, map, {}, {}}, 0x03u, 0x03u},
        {{{}, {}, {}, map, {}}, 0x03u, 0x02u},
        {{{}, {}, {}, {}, map}, 0x7fu, 0x7eu},
        {{{}, {}, {}, {}, steepBump}, 0x7fu, 0x7eu},
        // A bump map of zero weight needs nothing, not even the texture coordinates.
        {{{}, {}, {}, {}, flatBump}, 0x03u, 0x00u},
        {{{}, {}, {}, map, flatBump}, 0x03u, 0x02u},
        {{map, map, map, map, map}, 0x7fu, 0x7fu},
        {{map, {}, {}, map, {}}, 0x3fu, 0x3eu},
    };
    for (const Row& row : rows) {
        EXPECT_EQ(LitMaskShader::compose(row.maps), row.lit);
        EXPECT_EQ(UnlitMaskShader::compose(row.maps), row.unlit);
    }

    // Over all combinations: the texture bits come all together or not at all, and tangents
    // never come without the normal that they frame.
    for (int bits = 0; bits < 64; ++bits) {
        auto pick = [&](int bit) { return (bits >> bit) & 1 ? map : Params(); };
        // Bit 4 gives a bump map, bit 5 chooses its weight: non-zero or zero.
        const Params bump = (bits >> 4) & 1 ? ((bits >> 5) & 1 ? map : flatBump) : Params();
        const Maps maps{pick(0), pick(1), pick(2), pick(3), bump};
        for (unsigned int mask : {LitMaskShader::compose(maps), UnlitMaskShader::compose(maps)}) {
            const unsigned int tex = mask & RsShadingContext::needsTexCoord;
            EXPECT_TRUE(tex == 0 || tex == RsShadingContext::needsTexCoord) << bits;
            if (mask & RsShadingContext::needsTangents) {
                EXPECT_TRUE(mask & RsShadingContext::needsNormal) << bits;
            }
            EXPECT_EQ(mask & ~0x7fu, 0u);
        }
    }
}

// A host's own material: a tint times a texture, with the texture's alpha. It follows the
// conventions of the library's shaders: the sampler is made at the first lock and kept, its
// tiles are released at the last unlock, and the tint has the map's weight folded in.
class HostTintShader : public RsMaterialShader {
public:
    HostTintShader(const RCShdPtr<const SdMaterial>& material, const Params& map,
                   std::atomic<int>& destructions)
        : RsMaterialShader(material),
          _tint(scaleByTexture(material->_diffuse, material->_opacity, map)),
          _map(map),
          _neededContext(neededContextOfMap(map)),
          _destructions(destructions) {}
    ~HostTintShader() override { ++_destructions; }

    CoRgbaColorTyped<float> shade(RsShadingContext& context) override {
        return _tint * _sampler->sample(context._texCoord, context._texCoordDerivatives);
    }
    unsigned int getNeededContext() const override { return _neededContext; }

protected:
    void lockMemoryImpl() override {
        if (!_sampler) _sampler = createSampler(_map);
    }
    void unlockMemoryImpl() override { _sampler->releaseTiles(); }

private:
    CoRgbaColorTyped<float> _tint;
    Params _map;
    OPtr<SdTextureSampler> _sampler;
    unsigned int _neededContext;
    std::atomic<int>& _destructions;
};

TEST(RsMaterialShader, HostShaderWorksThroughTheBaseInterface) {
    const CoRgbaColorTyped<float> texel(0.5f, 0.25f, 1.0f, 0.5f);
    const RCShdPtr<ConstantParams> map = makeShared<ConstantParams>(texel, 0.5f);
    RCShdPtr<SdMaterial> material = makeShared<SdMaterial>();
    material->_diffuse = Rgb(0.8f, 0.4f, 0.2f);
    material->_opacity = 0.75f;
    material->_wireframe = true;
    material->_wireSize = 2.0f;
    material->_transferMode = SdMaterial::TransferMode::screen;
    std::atomic<int> destructions{0};

    for (const bool withMap : {true, false}) {
        RCShdPtr<RsMaterialShader> shader = makeShared<HostTintShader>(
            RCShdPtr<const SdMaterial>(material), withMap ? Params(map) : Params(), destructions);

        // What the drawing code asks before it draws.
        EXPECT_EQ(shader->getTransferMode(), SdMaterial::TransferMode::screen);
        EXPECT_EQ(shader->getNeededContext(), withMap ? RsShadingContext::needsTexCoord : 0u);
        EXPECT_TRUE(shader->isWireframe());
        EXPECT_TRUE(shader->isScreenSpace());
        EXPECT_EQ(shader->getWireSize(), 2.0f);

        // Three groups of faces drawn, each between a lock and an unlock.
        const int samplersBefore = map->getSamplersMade();
        const int releasesBefore = map->getReleases();
        RsShadingContext context;
        for (int group = 0; group < 3; ++group) {
            shader->lockMemory();
            for (int fragment = 0; fragment < 4; ++fragment) {
                context._texCoord = GePoint2<double>(0.1 * fragment, 0.2 * group);
                const CoRgbaColorTyped<float> c = shader->shade(context);
                // Tint times the map weight, times the texel; alpha is opacity times texel alpha.
                const double w = withMap ? 0.5 : 1.0;
                const CoRgbaColorTyped<float> t = withMap ? texel : CoRgbaColorTyped<float>(1, 1, 1, 1);
                EXPECT_NEAR(c.r, 0.8 * w * t.r, 1e-6);
                EXPECT_NEAR(c.g, 0.4 * w * t.g, 1e-6);
                EXPECT_NEAR(c.b, 0.2 * w * t.b, 1e-6);
                EXPECT_NEAR(c.a, 0.75 * t.a, 1e-6);
            }
            shader->unlockMemory();
        }
        EXPECT_EQ(map->getSamplersMade() - samplersBefore, withMap ? 1 : 0) << "made once, kept";
        EXPECT_EQ(map->getReleases() - releasesBefore, withMap ? 3 : 0) << "tiles go at each last unlock";
        EXPECT_THROW(shader->unlockMemory(), ExAssertionFailed);

        std::ostringstream os;
        shader->dump(os);
        for (const char* name : {" _material: ", " _transferMode: 8", " _lockCount: 0",
                                 " _lock: RsMaterialShader lock", " _wireframe: 1",
                                 " _screenSpace: 1", " _wireSize: 2"})
            EXPECT_NE(os.str().find(name), std::string::npos) << name << " in " << os.str();

        // The shader lives as long as a shared pointer holds it, and takes its sampler along.
        const int destroyedBefore = destructions;
        RCShdPtr<RsMaterialShader> second = shader;
        shader = nullptr;
        EXPECT_EQ(destructions, destroyedBefore);
        second = nullptr;
        EXPECT_EQ(destructions, destroyedBefore + 1);
    }
    EXPECT_EQ(map->getDestructions(), 1);
}

}  // namespace
}  // namespace Zr
