// The factory of fragment Z-buffers: its fixed limits and defaults, the pixel region, and the
// buffers it makes, whose resolve shows what the factory handed them.
#include <gtest/gtest.h>

#include <cmath>

#include "rsFZBufferFactory.h"
#include "rsImageCreatorTestSupport.h"

namespace Zr {
namespace {

using RsImageTest::makeTile;
using RsImageTest::pixelColour;
using Rgba = CoRgbaColorTyped<float>;

TEST(RsFZBufferFactory, LimitsAndDefaults) {
    RsFZBufferFactory factory;
    EXPECT_EQ(factory.getKernelSize(), 0);
    EXPECT_EQ(factory.getMaxArea(), 128 * 128);
    EXPECT_TRUE(factory.getZBuffer());
    EXPECT_TRUE(factory.getUnpremultiply());
    EXPECT_FALSE(factory.getAccumulate());
    EXPECT_EQ(factory.getFillColor(), Rgba(0.0f, 0.0f, 0.0f, 1.0f));
    EXPECT_TRUE(factory.getPixelRegion().isEmpty());

    const IxWriteGuard output = makeTile({3, 8}, {-5, 30, 12, 20});
    factory.setOutput(output, true, 0.25f);
    EXPECT_EQ(factory.getPixelRegion(), GeRectangle<int>(-5, 30, 12, 20));
    EXPECT_TRUE(factory.getAccumulate());
    EXPECT_EQ(factory.getWeight(), 0.25f);
}

// A buffer covers the region asked for, in the factory's depth mode.
TEST(RsFZBufferFactory, BuffersCoverTheirRegionInTheFactorysMode) {
    for (bool zBuffer : {false, true}) {
        RsFZBufferFactory factory;
        factory.setZBuffer(zBuffer);
        for (const GeRectangle<int>& region : {GeRectangle<int>{3, 9, -4, 0}, GeRectangle<int>{0, 128, 0, 128},
                                               GeRectangle<int>{7, 7, 2, 5}}) {
            const RCShdPtr<RsFZBuffer> buffer = factory.createBuffer(region);
            EXPECT_EQ(buffer->getPixelRegion(), region);
            EXPECT_EQ(buffer->hasZBuffer(), zBuffer);
        }
    }
}

// What the factory was given reaches the resolve of each buffer: output, background, fill colour,
// accumulation, weight and unpremultiplication. An empty buffer resolves to its start colours:
// background where it covers, fill elsewhere, premultiplied, weighted, perhaps unpremultiplied,
// and replaced or added. Guards go by copy: a later change of the factory's output leaves a buffer
// made before it alone.
TEST(RsFZBufferFactory, BuffersResolveWithTheFactorysSettings) {
    const Rgba fill(0.2f, 0.4f, 0.6f, 0.5f);
    const Rgba bgColour(1.0f, 0.5f, 0.25f, 0.5f);
    const IxWriteGuard bgTile = makeTile({4, 32}, {10, 14, 0, 100});
    for (int y = 0; y < 100; ++y)
        for (int x = 10; x < 14; ++x) {
            float* p = reinterpret_cast<float*>(bgTile.getPixelAddress(x, y));
            p[0] = bgColour.r, p[1] = bgColour.g, p[2] = bgColour.b, p[3] = bgColour.a;
        }
    const Rgba initial(0.125f, 0.125f, 0.125f, 0.125f);
    for (bool accumulate : {false, true})
        for (float weight : {1.0f, 0.5f})
            for (bool unpremultiply : {false, true}) {
                const IxWriteGuard output = makeTile({4, 32}, {0, 20, 0, 6});
                for (int y = 0; y < 6; ++y)
                    for (int x = 0; x < 20; ++x) {
                        float* p = reinterpret_cast<float*>(output.getPixelAddress(x, y));
                        p[0] = p[1] = p[2] = p[3] = initial.r;
                    }
                RsFZBufferFactory factory;
                factory.setOutput(output, accumulate, weight);
                factory.setFillColor(fill);
                factory.setBackground(IxReadGuard(bgTile));
                factory.setUnpremultiply(unpremultiply);
                const RCShdPtr<RsFZBuffer> buffer = factory.createBuffer({8, 16, 2, 5});
                factory.setOutput(makeTile({4, 32}, {0, 20, 0, 6}), false, 1.0f);
                buffer->finalize();

                for (int y = 0; y < 6; ++y)
                    for (int x = 0; x < 20; ++x) {
                        Rgba want = initial;
                        if (x >= 8 && x < 16 && y >= 2 && y < 5) {
                            const Rgba start = x >= 10 && x < 14 ? bgColour : fill;
                            Rgba pixel(start.r * start.a * weight, start.g * start.a * weight,
                                       start.b * start.a * weight, start.a * weight);
                            if (unpremultiply) pixel = Rgba(start.r, start.g, start.b, pixel.a);
                            want = accumulate ? initial + pixel : pixel;
                        }
                        const Rgba got = pixelColour(output, x, y);
                        EXPECT_NEAR(got.r, want.r, 1e-6f) << x << "," << y;
                        EXPECT_NEAR(got.g, want.g, 1e-6f) << x << "," << y;
                        EXPECT_NEAR(got.b, want.b, 1e-6f) << x << "," << y;
                        EXPECT_NEAR(got.a, want.a, 1e-6f) << x << "," << y;
                    }
            }
}

}  // namespace
}  // namespace Zr
