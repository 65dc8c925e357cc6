// Shadows end to end through RsRenderer, every light kind with every map type rendering its maps
// on the call: a square occluder above a ground plane against its analytic shadow, the omni
// light's cube inside a ring of cards from random camera turns, the tint of a semi-transparent
// caster in deep maps, and degenerate scenes (cards only, the light inside an occluder) with no
// value that is not a finite number.
#include <gtest/gtest.h>

#include <cmath>
#include <functional>
#include <random>
#include <string>
#include <vector>

#include "rsDirectLightShader.h"
#include "rsOmniLightShader.h"
#include "rsSpotLightShader.h"
#include "rsTestSupport.h"

namespace Zr {
namespace {

using namespace RsTest;
using Rgb = CoRgbColorTyped<float>;
using M = GeAffineMatrix3<float>;
using Kind = SdStdLight::Kind;
using Type = SdStdLight::ShadowMapType;
const Type kTypes[] = {Type::ShadowMapZ, Type::ShadowMapMidpoint, Type::ShadowMapDeep};

RCShdPtr<RsLightShader> makeLight(Kind kind, Type type, const M& lightToWorld, int size, float bias,
                                  bool active = true) {
    RCShdPtr<SdStdLight> l = makeShared<SdStdLight>();
    l->_kind = kind;
    l->_shadowsActive = active;
    l->_shadowsEnabled = 1;
    l->_shadowMapType = type;
    l->_shadowMapSize = size;
    l->_shadowBias = bias;
    l->_outerConeAngle = l->_innerConeAngle = 1.8f;
    l->_width = 6.0f;
    if (kind == Kind::spot) return makeShared<RsSpotLightShader>(1, lightToWorld, l);
    if (kind == Kind::direct) return makeShared<RsDirectLightShader>(1, lightToWorld, l);
    return makeShared<RsOmniLightShader>(1, lightToWorld, l);
}

const RCShdPtr<RsMaterialShader> kOpaque = shadowShaderOf({0, 0, 0}, 1.0f);

// A receiving card shows what the light lets through; a blocking one is seen only by the light.
RCShdPtr<RsGeomInstance> receiver(float h, const M& m, const RCShdPtr<RsLightShader>& light) {
    return caster(card(h), m, shadowProbe({light}), kOpaque);
}
RCShdPtr<RsGeomInstance> blocker(float h, const M& m, const RCShdPtr<RsMaterialShader>& shadowShader = kOpaque) {
    return caster(card(h), m, makeShared<TestMaterial>(), shadowShader, false);
}

// The picture of size x size pixels of the scene with its one light, and each pixel's colour.
struct Shot {
    Shot(std::vector<RCShdPtr<RsGeomInstance>> instances, const RCShdPtr<RsLightShader>& light, const M& worldToCamera,
         const GeProjectiveMatrix3<double>& projection, int size)
        : picture({0, size, 0, size}) {
        RsRenderer().render(worldToCamera, projection, makeScene(std::move(instances), {light}), {0, size, 0, size},
                            picture.guard);
    }
    Picture picture;
};

// Camera space to -1..1 for a parallel view of x and y in -4..4 down -z.
const GeProjectiveMatrix3<double> kTopView{0.25, 0, 0, 0, 0, 0.25, 0, 0, 0, 0, -0.02, -1, 0, 0, 0, 1};

// A square occluder of half side 1 around (0.6, -0.3, -6) over a ground at z = -10, lit by a spot
// off the axis or by a tilted direct light, seen from above: a ground pixel is shadowed exactly
// when the way from it to the light crosses the square, save a band of two map cells (the cell and
// the filter) around the square's border. Deep maps let a red half-clear occluder through tinted.
TEST(RsShadowPasses, AnOccluderShadowsItsAnalyticProjection) {
    const int size = 64, mapSize = 256;
    const GePoint3<double> centre(0.6, -0.3, -6.0);
    for (const Kind kind : {Kind::spot, Kind::direct}) {
        const M lightToWorld = kind == Kind::spot ? M::makeTranslation({-0.5f, 0.4f, 0.0f})
                                                  : M::makeRotation({1.0f, 1.0f, 0.0f}, 0.3f);
        const GeVector3<double> towards = GeVector3<double>(lightToWorld.getColumn(2)).getNormalized();
        const GeVector3<float> origin = lightToWorld.getTranslation();
        const GePoint3<double> at(origin.x, origin.y, origin.z);
        const double cell = kind == Kind::spot ? 2 * std::tan(0.9) * (at.z - centre.z) / mapSize : 12.0 / mapSize;
        for (const Type type : kTypes) {
            for (const bool tinted : {false, true}) {
                if (tinted && type != Type::ShadowMapDeep) continue;
                const RCShdPtr<RsLightShader> light = makeLight(kind, type, lightToWorld, mapSize, 0.05f);
                const Rgb through = tinted ? Rgb(0.5f, 0.25f, 0.25f) : Rgb(0.0f);
                const RCShdPtr<RsGeomInstance> occluder = blocker(
                    1, M::makeTranslation(GeVector3<float>(centre.toVector())), tinted ? shadowShaderOf({1, 0, 0}, 0.5f) : kOpaque);
                occluder->_renderOrder = 3;  // which offsets the camera's depths, never a light's
                const Shot shot({receiver(6, M::makeTranslation({0, 0, -10}), light), occluder}, light, {}, kTopView, size);
                int shadowed = 0;
                for (int y = 0; y < size; ++y) {
                    for (int x = 0; x < size; ++x) {
                        const GePoint3<double> p((x + 0.5) / 8 - 4, (y + 0.5) / 8 - 4, -10);
                        const GeVector3<double> up = kind == Kind::spot ? (at - p).getNormalized() : towards;
                        const GePoint3<double> q = p + up * ((centre.z - p.z) / up.z);
                        const double margin = 1 - std::max(std::fabs(q.x - centre.x), std::fabs(q.y - centre.y));
                        if (std::fabs(margin) < 2 * cell) continue;
                        const Rgb want = margin > 0 ? through : Rgb(1.0f);
                        const Rgba got = shot.picture.at(x, y);
                        const std::string where = std::to_string(x) + "," + std::to_string(y) + " type " +
                                                  std::to_string(int(type)) + " kind " + std::to_string(int(kind));
                        ASSERT_NEAR(got.r, want.r, 1e-5) << where;
                        ASSERT_NEAR(got.g, want.g, 1e-5) << where;
                        ASSERT_NEAR(got.b, want.b, 1e-5) << where;
                        shadowed += margin > 0;
                    }
                }
                EXPECT_GT(shadowed, 100);
            }
        }
    }
}

// Six cards of half side h at distance 1 on the axes around an omni light at the origin, and six
// receiving walls at distance 3, seen from the light's own place along each axis and through random
// camera turns, so that each pixel's ray is the light's: it is shadowed when its largest coordinate's card holds it,
// save a band of two cells at the card's border. With h = 0.6 light passes along the cube's edges,
// where its faces meet; with h = 1.05 the cards close around the light and shadow everything.
void expectRing(float h, Type type, int turns) {
    std::mt19937 rng(5);
    std::uniform_real_distribution<float> unit(-1.0f, 1.0f);
    const int size = 48, mapSize = 128;
    const RCShdPtr<RsLightShader> light = makeLight(Kind::omni, type, {}, mapSize, 0.2f);
    std::vector<RCShdPtr<RsGeomInstance>> instances;
    const M faces[6] = {{}, M::makeRotation({0, 1, 0}, 3.14159265f), M::makeRotation({0, 1, 0}, 1.5707963f),
                        M::makeRotation({0, 1, 0}, -1.5707963f), M::makeRotation({1, 0, 0}, 1.5707963f),
                        M::makeRotation({1, 0, 0}, -1.5707963f)};
    for (const M& face : faces) {
        instances.push_back(blocker(h, face * M::makeTranslation({0, 0, -1})));
        instances.push_back(receiver(3.1f, face * M::makeTranslation({0, 0, -3}), light));  // overlapping at the edges
    }
    const double t = std::tan(0.8);
    for (int turn = 0; turn < 6 + turns; ++turn) {
        const M cameraToWorld = turn < 6 ? faces[turn] : M::makeRotation({unit(rng), unit(rng), unit(rng)}, 3 * unit(rng));
        const Shot shot(instances, light, cameraToWorld.computeInverse(), perspective(1.6, 0.1, 20), size);
        for (int y = 0; y < size; ++y) {
            for (int x = 0; x < size; ++x) {
                const GeVector3<float> d = cameraToWorld.transformVector(
                    {float(((x + 0.5) / size * 2 - 1) * t), float(((y + 0.5) / size * 2 - 1) * t), -1.0f});
                const double a[3] = {std::fabs(d.x), std::fabs(d.y), std::fabs(d.z)};
                const double big = std::max({a[0], a[1], a[2]});
                double margin = 1e9;
                for (double c : a)
                    if (c != big) margin = std::min(margin, h - c / big);
                if (std::fabs(margin) < 2 * 2.2 / mapSize) continue;
                const float want = margin > 0 ? 0.0f : 1.0f;
                ASSERT_NEAR(shot.picture.at(x, y).r, want, 1e-5)
                    << x << ',' << y << " turn " << turn << " type " << int(type) << ' ' << d.x << ' ' << d.y << ' ' << d.z;
            }
        }
    }
}

TEST(RsShadowPasses, AnOmniLightShadowsEveryDirectionWithoutSeams) {
    for (const Type type : kTypes) expectRing(0.6f, type, 2);
}

// Scenes of flat cards alone (their box is flat on the axis of their normal), the light inside a
// closed box, and a map type outside the three: every pixel a finite number, and the shadows the
// physical ones.
TEST(RsShadowPasses, DegenerateScenesGivePhysicalShadowsWithNoNumberOutOfRange) {
    for (const Type type : kTypes) expectRing(1.05f, type, 0);
    // A scene without geometry still places an omni light's cameras with finite projections.
    RsCubeShadowMap cube;
    cube.setMapsCenter({1, 2, 3}, makeScene({}));
    for (float entry : cube.getProjectionMatrix(RsCubeShadowMap::FacePositiveY)._m) ASSERT_TRUE(std::isfinite(entry));
    const M lights[3] = {M::makeTranslation({0.3f, 0.2f, 0.0f}), M::makeRotation({1, 0, 0}, 0.2f),
                         M::makeTranslation({0.3f, 0.2f, -4.0f})};
    for (const Kind kind : {Kind::spot, Kind::direct, Kind::omni}) {
        // Type 3 is none of the three, type 4 a depth map while the host holds shadows off: no shadow.
        for (const Type type : {Type::ShadowMapZ, Type::ShadowMapMidpoint, Type::ShadowMapDeep, Type(3), Type(4)}) {
            const bool active = int(type) != 4;
            const RCShdPtr<RsLightShader> light =
                makeLight(kind, active ? type : Type::ShadowMapZ, lights[int(kind)], 128, 0.05f, active);
            const RCShdPtr<RsGeomInstance> ground = receiver(6, M::makeTranslation({0, 0, -10}), light);
            // A card above the ground casts its shadow onto the middle; then, with the maps made
            // anew, nothing casts, and the ground alone casts onto itself: lit all over.
            for (const int pass : {0, 1, 2}) {
                const bool withCard = pass == 0;
                ground->_castsShadows = pass != 1;
                std::vector<RCShdPtr<RsGeomInstance>> cards{ground};
                if (withCard) cards.push_back(blocker(1, M::makeTranslation({0.3f, 0.2f, -7.0f})));
                const Shot shot(cards, light, {}, kTopView, 32);
                for (int y = 0; y < 32; ++y)
                    for (int x = 0; x < 32; ++x) {
                        const Rgba c = shot.picture.at(x, y);
                        ASSERT_TRUE(std::isfinite(c.r) && std::isfinite(c.g) && std::isfinite(c.b)) << x << ',' << y;
                        const bool middle = std::abs(x - 18) < 3 && std::abs(y - 17) < 3;
                        const float want = withCard && middle && int(type) < 3 ? 0.0f : 1.0f;
                        if (withCard && !middle && std::abs(x - 18) <= 12 && std::abs(y - 17) <= 12) continue;
                        ASSERT_NEAR(c.r, want, 1e-5) << x << ',' << y << " kind " << int(kind) << " type " << int(type);
                    }
            }
        }
    }
}

}  // namespace
}  // namespace Zr
