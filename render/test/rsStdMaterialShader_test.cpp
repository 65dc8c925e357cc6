// The material shaders against closed forms: the standard lighting model (Lambert plus a
// Blinn-Phong highlight per light, ambient per light, emission) at random frames and through the
// renderer on a lit quad; the maps' weights and samples of the standard, simple and no-shade
// shaders; the environment lookups at their sphere-map positions, seen by samplers that record
// where they were asked; the shadow shader's transmittance; the shadow matte's shared shadow sum.
#include <gtest/gtest.h>

#include <cmath>
#include <random>
#include <string>

#include "rsNoShadeMaterialShader.h"
#include "rsShadowMatteShader.h"
#include "rsShadowShader.h"
#include "rsSimpleMaterialShader.h"
#include "rsStdMaterialShader.h"
#include "rsTestSupport.h"

namespace Zr {
namespace {

using namespace RsTest;
using Rgb = CoRgbColorTyped<float>;
using V3f = GeVector3<float>;

struct D3 {
    double x = 0, y = 0, z = 0;
    D3 operator+(const D3& o) const { return {x + o.x, y + o.y, z + o.z}; }
    D3 operator*(double s) const { return {x * s, y * s, z * s}; }
    double dot(const D3& o) const { return x * o.x + y * o.y + z * o.z; }
    D3 unit() const { return *this * (1.0 / std::sqrt(dot(*this))); }
};
D3 toD3(const V3f& v) { return {v.x, v.y, v.z}; }
template <class C>
double ch(const C& c, int k) { return k == 0 ? c.r : k == 1 ? c.g : c.b; }

V3f randomUnit(std::mt19937& rng) {
    std::normal_distribution<float> g;
    for (;;)
        if (const V3f v(g(rng), g(rng), g(rng)); v.length() > 0.1f) return v.getNormalized();
}
Rgb randomRgb(std::mt19937& rng) {
    std::uniform_real_distribution<float> u(0.0f, 1.0f);
    return {u(rng), u(rng), u(rng)};
}

// A directional light of fixed direction and colours, lighting the side that its direction faces,
// with a fixed shadow.
class StubLight : public RsLightShader {
public:
    StubLight(const V3f& direction, const Rgb& colour, const Rgb& ambient, const Rgb& shadow = {1, 1, 1})
        : _direction(direction), _colour(colour), _ambientColour(ambient), _shadow(shadow) {
        _emitAmbient = true;
    }
    void setupRender(const GeAffineMatrix3<float>&) override {}
    void initializeMaps(const RCShdPtr<RsScene>&) override {}
    bool illuminate(const RsShadingContext& context, Illumination& illumination) const override {
        illumination = {_direction, _ambientColour, _colour, _direction.dot(context._normal)};
        return illumination._cosine > 0.0f;
    }
    Rgb shadow(const RsShadingContext&) override { return _shadow; }
    V3f _direction;
    Rgb _colour, _ambientColour, _shadow;
    int _lockImpls = 0;

protected:
    void lockMemoryImpl() override { ++_lockImpls; }
    void unlockMemoryImpl() override {}
};

// The lighting model in double, channel by channel: emissive + ambient x (the context's and the
// lights' ambient) + diffuse x the sum of colour x cosine over the lights in front + specular x the
// sum of colour x (H . N)^(2^(10 s)) over those whose half vector H lies on the normal's side.
Rgba litColour(const SdMaterial& m, const D3& n, const D3& v, const std::vector<const StubLight*>& lights,
               const Rgb& contextAmbient = {}) {
    double out[3];
    for (int k = 0; k < 3; ++k) {
        double amb = ch(contextAmbient, k), dif = 0, spe = 0;
        for (const StubLight* l : lights) {
            const D3 d = toD3(l->_direction);
            const double cosine = d.dot(n), c = (v + d).unit().dot(n);
            if (l->_emitAmbient) amb += ch(l->_ambientColour, k);
            if (cosine > 0 && l->_emitDiffuse) dif += ch(l->_colour, k) * cosine;
            if (cosine > 0 && l->_emitSpecular && c > 0)
                spe += ch(l->_colour, k) * std::pow(c, std::exp2(10.0 * m._shininess));
        }
        out[k] = ch(m._emissive, k) + amb * ch(m._ambient, k) + dif * ch(m._diffuse, k) + spe * ch(m._specular, k);
    }
    return Rgba(float(out[0]), float(out[1]), float(out[2]), m._opacity);
}

RCShdPtr<SdMaterial> randomMaterial(std::mt19937& rng) {
    static const float shininess[] = {0.0f, 0.1f, 0.2f, 0.35f, 0.5f, 0.73f};
    RCShdPtr<SdMaterial> m = makeShared<SdMaterial>();
    m->_emissive = randomRgb(rng) * 0.2f;
    m->_ambient = randomRgb(rng);
    m->_diffuse = randomRgb(rng);
    m->_specular = randomRgb(rng);
    m->_irradiance = randomRgb(rng);
    m->_reflection = randomRgb(rng);
    m->_refraction = randomRgb(rng);
    m->_opacity = std::uniform_real_distribution<float>(0.0f, 1.0f)(rng);
    m->_shininess = shininess[rng() % 6];
    m->_refractionIndex = std::uniform_real_distribution<float>(0.6f, 1.6f)(rng);
    return m;
}

// Initialises shader for an instance whose light table is linked, in a scene of lights.
void initialize(RsMaterialShader& shader, RsScene::LightList lights, std::vector<unsigned int> linked = {}) {
    RCShdPtr<RsScene> scene = makeScene({}, lights);
    RCShdPtr<const RsGeomInstance> instance = makeShared<RsGeomInstance>(
        GeAffineMatrix3<float>(), makeBoxMesh({0, 0, 0}, {1, 1, 1}), RsGeomInstance::MaterialList{},
        RsGeomInstance::MaterialList{}, SdInstanceAttributes{}, linked);
    shader.initialize(scene, instance);
}

Rgba shadeLocked(RsMaterialShader& shader, RsShadingContext& context) {
    shader.lockMemory();
    const Rgba colour = shader.shade(context);
    shader.unlockMemory();
    return colour;
}

// A bump map whose sample (1, 0.5, 0.5) at weight 1 turns the normal onto the tangent.
RCShdPtr<const SdTextureParams> bumpOntoTangent() { return makeShared<ConstantParams>(Rgba(1.0f, 0.5f, 0.5f, 1.0f)); }

// Random normals, views (perspective and orthographic), lights in front and behind with random
// emission flags, shininess from 0 (exponent 1, where a negative H . N would subtract) up, and
// every other time a bump map that turns the normal onto the tangent.
TEST(RsStdMaterialShader, ShadesTheClosedFormAtRandomFrames) {
    std::mt19937 rng(11);
    int behind = 0, skipped = 0;
    for (int trial = 0; trial < 400; ++trial) {
        RCShdPtr<SdMaterial> m = randomMaterial(rng);
        if (trial % 2) m->_bumpMap = bumpOntoTangent();
        RsStdMaterialShader shader(m);
        RsScene::LightList lights;
        std::vector<const StubLight*> stubs;
        for (int i = 0, count = int(rng() % 4); i < count; ++i) {
            auto light = makeShared<StubLight>(randomUnit(rng), randomRgb(rng), randomRgb(rng) * 0.5f);
            light->_emitAmbient = rng() % 3 != 0;
            light->_emitDiffuse = rng() % 4 != 0;
            light->_emitSpecular = rng() % 4 != 0;
            stubs.push_back(light.get());
            lights.push_back(light);
        }
        initialize(shader, lights);
        RsShadingContext context;
        context._normal = randomUnit(rng);
        context._tangent = randomUnit(rng) * 0.7f;
        context._ambient = randomRgb(rng) * 0.3f;
        context._orthographic = trial % 5 == 0;
        context._viewDirection = randomUnit(rng);
        context._eyeCoord = GePoint3<float>(0, 0, 0) + randomUnit(rng) * -3.0f;
        const D3 n = toD3(trial % 2 ? context._tangent : context._normal).unit();
        const D3 v = toD3(context._orthographic ? -context._viewDirection : -context._eyeCoord.toVector()).unit();
        for (const StubLight* l : stubs) {
            behind += toD3(l->_direction).dot(n) <= 0;
            skipped += toD3(l->_direction).dot(n) > 0 && (v + toD3(l->_direction)).dot(n) <= 0;
        }
        expectNearRgba(shadeLocked(shader, context), litColour(*m, n, v, stubs, context._ambient), 2e-5,
                       "trial " + std::to_string(trial));
    }
    EXPECT_GT(behind, 100);
    EXPECT_GT(skipped, 20);
}

// A quad facing the camera under one directional light, through the renderer in perspective: at
// every pixel the closed form at the point that the pixel centre sees. A second, brighter light is
// linked so that it excludes the quad and must add nothing; the linked one is locked for drawing.
TEST(RsStdMaterialShader, FlatQuadThroughTheRendererMatchesTheClosedFormAtEveryPixel) {
    const GeRectangle<int> rect{0, 64, 0, 48};
    const GeProjectiveMatrix3<double> projection = perspective(1.0471975511965976, 0.5, 100.0);
    const float z = -2.0f;
    RCShdPtr<SdMaterial> m = makeShared<SdMaterial>();
    m->_emissive = {0.05f, 0.02f, 0.0f};
    m->_ambient = {0.1f, 0.2f, 0.3f};
    m->_diffuse = {0.5f, 0.4f, 0.3f};
    m->_specular = {0.3f, 0.3f, 0.2f};
    m->_shininess = 0.4f;
    auto shader = makeShared<RsStdMaterialShader>(m);
    auto shining = makeShared<StubLight>(V3f(0.3f, 0.2f, 0.9f).getNormalized(), Rgb(0.9f, 0.8f, 0.7f), Rgb(0.3f));
    auto excluding = makeShared<StubLight>(V3f(0.0f, 0.0f, 1.0f), Rgb(5.0f), Rgb(5.0f));
    shining->_lightId = 3;
    shining->_linkMode = SdLight::LinkMode::include;
    excluding->_lightId = 4;
    const RCShdPtr<RsGeomInstance> instance = makeInstance(
        makeMesh({{-3, -3, z}, {3, -3, z}, {3, 3, z}, {-3, 3, z}}, {0, 1, 2, 0, 2, 3}), {}, {}, {shader});
    instance->_lights = {3, 4};
    RCShdPtr<RsScene> scene = makeScene({instance}, {excluding, shining});
    RCShdPtr<const RsGeomInstance> constInstance = instance;
    shader->initialize(scene, constInstance);

    Picture picture(rect);
    render(scene, projection, rect, picture);
    EXPECT_GT(shining->_lockImpls, 0);
    EXPECT_EQ(shining->_lockCount, 0);
    for (int py = rect.y0; py < rect.y1; ++py)
        for (int px = rect.x0; px < rect.x1; ++px) {
            const D3 toEye{-(px + 0.5 - 32) / 32 / projection(0, 0), -(py + 0.5 - 24) / 24 / projection(1, 1), 1};
            expectNearRgba(picture.at(px, py), litColour(*m, {0, 0, 1}, toEye.unit(), {shining.get()}), 1e-4,
                           std::to_string(px) + ", " + std::to_string(py));
        }
}

// Every map at a random weight, with constant samples. The diffuse map's weight scales the
// standard shader's emissive, ambient, diffuse, specular and irradiance colours, or the flat colour
// of the simple and no-shade shaders; its sample multiplies all of that and alpha. Reflection and
// refraction come on top with their own weights (not for the no-shade shader). The first case is
// the diffuse map (0.5, 0.5, 0.5, 0.5) of weight 1, which halves alpha and colour, not reflection.
TEST(RsMaterialShaders, MapsScaleTheirTermsAndTheDiffuseMapTexturesAllButTheEnvironment) {
    std::mt19937 rng(5);
    std::uniform_real_distribution<float> weight(0.2f, 1.5f);
    for (int trial = 0; trial < 90; ++trial) {
        const int kind = trial % 3;  // standard, simple, no shade
        RCShdPtr<SdMaterial> m = randomMaterial(rng);
        const bool half = trial == 0, refracts = trial % 2 == 0;
        const float wd = half ? 1.0f : weight(rng), wi = weight(rng), wl = weight(rng), wr = weight(rng);
        const Rgba ds = half ? Rgba(0.5f, 0.5f, 0.5f, 0.5f) : Rgba(randomRgb(rng), 0.6f), is(randomRgb(rng), 1),
                   ls(randomRgb(rng), 1), rs(randomRgb(rng), 1);
        m->_diffuseMap = makeShared<ConstantParams>(ds, wd);
        m->_irradianceMap = makeShared<ConstantParams>(is, wi);
        m->_reflectionMap = makeShared<ConstantParams>(ls, wl);
        if (refracts) m->_refractionMap = makeShared<ConstantParams>(rs, wr);
        RCShdPtr<RsMaterialShader> shader;
        if (kind == 0) shader = makeShared<RsStdMaterialShader>(m);
        if (kind == 1) shader = makeShared<RsSimpleMaterialShader>(m);
        if (kind == 2) shader = makeShared<RsNoShadeMaterialShader>(m);
        auto light = makeShared<StubLight>(randomUnit(rng), randomRgb(rng), randomRgb(rng));
        initialize(*shader, {light});
        RsShadingContext context;
        context._normal = randomUnit(rng);
        context._eyeCoord = GePoint3<float>(0.5f, -0.5f, -4.0f);

        const Rgba base = kind == 0 ? litColour(*m, toD3(context._normal), D3{-0.5, 0.5, 4}.unit(), {light.get()})
                                    : Rgba(m->_diffuse, m->_opacity);
        Rgba want(0, 0, 0, m->_opacity * ds.a);
        for (int k = 0; k < 3; ++k) {
            const double lit = wd * ch(base, k) + (kind < 2 ? wd * wi * ch(m->_irradiance, k) * ch(is, k) : 0.0);
            const double refraction = refracts ? wr * ch(m->_refraction, k) * ch(rs, k) : 0.0;
            const double environment = kind < 2 ? wl * ch(m->_reflection, k) * ch(ls, k) + refraction : 0.0;
            channelOf(want, k) = float(lit * ch(ds, k) + environment);
        }
        expectNearRgba(shadeLocked(*shader, context), want, 2e-5,
                       "kind " + std::to_string(kind) + ", trial " + std::to_string(trial));
    }
}

// A map whose sampler records where it was asked.
class RecordingParams : public ConstantParams {
public:
    RecordingParams() : ConstantParams(Rgba(0.25f, 0.5f, 0.75f, 1.0f)) {}
    OPtr<SdTextureSampler> createSampler() const override {
        OPtr<SdTextureSampler> sampler = ConstantParams::createSampler();
        _made = static_cast<const ConstantSampler*>(sampler.get());
        return sampler;
    }
    mutable const ConstantSampler* _made = nullptr;
};

// Where a unit direction d meets a mirror ball seen from +z: the ball's normal there is the half
// vector of d and +z, whose x and y, halved and moved to the centre, are the position.
GePoint2<double> mirrorBall(const D3& d) {
    const D3 h = (d + D3{0, 0, 1}).unit();
    return {0.5 + 0.5 * h.x, 0.5 + 0.5 * h.y};
}

// The standard and the simple shader read the irradiance map at the place of the normal (after
// the bump map, which here turns it onto the tangent) on the sphere map, the diffuse map at the
// fragment's own coordinate (restored after the irradiance lookup), the reflection map at the
// mirrored view's place, and the refraction map at (-T.x, T.y, 1 - T.z) normalised, for T the view
// mirrored about the normal scaled by the index; the last lookup's position stays in the context.
// Each lookup carries the fragment's derivatives.
TEST(RsMaterialShaders, EnvironmentLookupsSampleAtTheirSphereMapPositions) {
    std::mt19937 rng(17);
    for (int trial = 0; trial < 200; ++trial) {
        const bool simple = trial % 2 == 1, bumped = trial % 4 < 2, refracts = trial % 3 != 0;
        RCShdPtr<SdMaterial> m = randomMaterial(rng);
        RCShdPtr<RecordingParams> maps[4] = {makeShared<RecordingParams>(), makeShared<RecordingParams>(),
                                             makeShared<RecordingParams>(), makeShared<RecordingParams>()};
        m->_irradianceMap = maps[0];
        m->_diffuseMap = maps[1];
        m->_reflectionMap = maps[2];
        if (refracts) m->_refractionMap = maps[3];
        if (bumped) m->_bumpMap = bumpOntoTangent();
        RCShdPtr<RsMaterialShader> shader = simple ? RCShdPtr<RsMaterialShader>(makeShared<RsSimpleMaterialShader>(m))
                                                   : RCShdPtr<RsMaterialShader>(makeShared<RsStdMaterialShader>(m));
        // Frames away from the lookups' poles, where a position is not well defined.
        RsShadingContext context;
        D3 n, r, u;
        for (bool poled = true; poled;) {
            context._normal = randomUnit(rng);
            context._tangent = randomUnit(rng);
            context._eyeCoord = GePoint3<float>(0, 0, 0) + randomUnit(rng) * -2.5f;
            n = toD3(bumped ? context._tangent : context._normal);
            const D3 v = toD3(-context._eyeCoord.toVector()).unit(), np = n * m->_refractionIndex;
            r = n * (2 * v.dot(n)) + v * -1.0;
            const D3 t = np * (2 * v.dot(np)) + v * -1.0, w{-t.x, t.y, 1 - t.z};
            poled = n.z < -0.9 || r.z < -0.9 || w.dot(w) < 0.1;
            if (!poled) u = w.unit();
        }
        context._texCoord = {0.3, 0.7};
        context._texCoordDerivatives = GeLinearMatrix2<double>(0.01, 0.02, 0.03, 0.04);
        shadeLocked(*shader, context);

        const GePoint2<double> want[4] = {mirrorBall(n), {0.3, 0.7}, mirrorBall(r), {0.5 + 0.5 * u.x, 0.5 + 0.5 * u.y}};
        const std::string where = (simple ? "simple, trial " : "standard, trial ") + std::to_string(trial);
        for (int k = 0; k < (refracts ? 4 : 3); ++k) {
            const ConstantSampler& s = *maps[k]->_made;
            ASSERT_EQ(s._lookups, 1) << where << " map " << k;
            EXPECT_NEAR(s._lastTexCoord.x, want[k].x, 2e-6) << where << " map " << k;
            EXPECT_NEAR(s._lastTexCoord.y, want[k].y, 2e-6) << where << " map " << k;
            EXPECT_EQ(s._lastDerivatives, context._texCoordDerivatives) << where << " map " << k;
        }
        EXPECT_EQ(context._texCoord, maps[refracts ? 3 : 2]->_made->_lastTexCoord) << where;
    }
}

// Seen from a light, a surface of coverage a = opacity x map alpha lets u = 1 - a through untinted
// and tints the rest by its colour and map, and what passes is scaled by u once more: clear gives
// white without alpha, opaque gives black with alpha 1, whatever the colour.
TEST(RsShadowShader, GivesTheTransmittanceOfTheSurface) {
    std::mt19937 rng(29);
    for (int trial = 0; trial < 60; ++trial) {
        RCShdPtr<SdMaterial> m = randomMaterial(rng);
        const float opacities[] = {0.0f, 1.0f, m->_opacity};
        m->_opacity = opacities[trial % 3];
        const bool mapped = trial % 2 == 1;
        const Rgba sample(randomRgb(rng), 0.8f);
        if (mapped) m->_diffuseMap = makeShared<ConstantParams>(sample, 0.7f);
        RsShadowShader shader(m);
        RsShadingContext context;
        const Rgba got = shadeLocked(shader, context);
        const double a = m->_opacity * (mapped ? sample.a : 1.0), u = 1 - a;
        Rgba want(0, 0, 0, float(a));
        for (int k = 0; k < 3; ++k)
            channelOf(want, k) = float(u * (u + a * ch(m->_diffuse, k) * (mapped ? 0.7 * ch(sample, k) : 1.0)));
        if (!mapped && (a == 0 || a == 1)) {
            EXPECT_EQ(got, a == 0 ? Rgba(1, 1, 1, 0) : Rgba(0, 0, 0, 1));
        }
        expectNearRgba(got, want, 1e-6, "trial " + std::to_string(trial));
    }
}

// The matte per channel: the smaller of the summed shadow of the linked lights times the strength
// shared out among them, and 1; 1 less that when inverted; alpha 1. Light 9 is not linked to the
// instance and counts neither in the sum nor in the sharing.
TEST(RsShadowMatteShader, ShowsTheSharedShadowSumOfItsLinkedLights) {
    struct Case {
        std::vector<Rgb> shadows;  // of lights 1, 2, ...; all linked
        float strength;
        Rgb want;
    };
    const Case cases[] = {
        {{}, 1.0f, {0, 0, 0}},
        {{{0.25f, 0.5f, 1.0f}}, 0.8f, {0.2f, 0.4f, 0.8f}},
        {{{0.3f, 0.6f, 1.0f}}, 2.0f, {0.6f, 1.0f, 1.0f}},
        {{{1, 1, 1}, {1, 1, 1}}, 1.0f, {1, 1, 1}},
        {{{1.0f, 0.0f, 0.5f}, {1.0f, 1.0f, 0.1f}}, 1.0f, {1.0f, 0.5f, 0.3f}},
        {{{0.2f, 0.4f, 0.6f}, {0.2f, 0.0f, 0.6f}}, 1.5f, {0.3f, 0.3f, 0.9f}},
    };
    for (const Case& c : cases)
        for (bool inverted : {false, true}) {
            RCShdPtr<SdMaterial> m = makeShared<SdMaterial>();
            m->_shadowStrength = c.strength;
            m->_inverted = inverted;
            const auto light = [](unsigned int id, const Rgb& shadow) {
                auto l = makeShared<StubLight>(V3f(0, 0, 1), Rgb(1.0f), Rgb(1.0f), shadow);
                l->_lightId = id;
                l->_linkMode = SdLight::LinkMode::include;
                return l;
            };
            RsScene::LightList lights{light(9, Rgb(1.0f))};
            std::vector<unsigned int> linked;
            for (unsigned int id = 1; id <= c.shadows.size(); ++id)
                lights.push_back(light(id, c.shadows[id - 1])), linked.push_back(id);
            RsShadowMatteShader shader(m);
            initialize(shader, lights, linked);
            RsShadingContext context;
            expectNearRgba(shadeLocked(shader, context), Rgba(inverted ? Rgb(1.0f) - c.want : c.want, 1.0f), 1e-6,
                           std::to_string(c.shadows.size()) + " lights, strength " + std::to_string(c.strength) +
                               (inverted ? ", inverted" : ""));
        }
}

}  // namespace
}  // namespace Zr
