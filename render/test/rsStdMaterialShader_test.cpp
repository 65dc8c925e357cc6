// The standard, simple, no-shade and shadow shaders against one closed form at random frames, from
// no more of the shading context than they ask for, and the standard one through the renderer on a
// lit quad; the shadow matte against a table.
#include <gtest/gtest.h>

#include <cmath>
#include <random>
#include <string>
#include <tuple>

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
using Map = RCShdPtr<const SdTextureParams>;
using D3 = GeVector3<double>;

D3 mirror(const D3& v, const D3& n) { return n * (2 * v.dot(n)) - v; }
double ch(const Rgb& c, int k) { return k == 0 ? c.r : k == 1 ? c.g : c.b; }
float uniform(std::mt19937& rng, float lo = 0, float hi = 1) { return std::uniform_real_distribution(lo, hi)(rng); }
Rgb randomRgb(std::mt19937& rng) { return {uniform(rng), uniform(rng), uniform(rng)}; }
V3f randomUnit(std::mt19937& rng) {
    for (std::normal_distribution<float> g;;)
        if (const V3f v(g(rng), g(rng), g(rng)); v.length() > 0.1f) return v.getNormalized();
}

// A directional light lighting the side that its direction faces, with a fixed shadow; counts locks.
struct StubLight : public RsLightShader {
    StubLight(const V3f& direction, const Rgb& colour, const Rgb& ambient, const Rgb& shadow = {1, 1, 1})
        : _direction(direction), _colour(colour), _ambientColour(ambient), _shadow(shadow) { _emitAmbient = true; }
    void setupRender(const GeAffineMatrix3<float>&) override {}
    void initializeMaps(const RCShdPtr<RsScene>&) override {}
    bool illuminate(const RsShadingContext& context, Illumination& illumination) const override {
        illumination = {_direction, _ambientColour, _colour, _direction.dot(context._normal)};
        return illumination._cosine > 0.0f;
    }
    Rgb shadow(const RsShadingContext&) override { return _shadow; }
    void lockMemoryImpl() override { ++_lockImpls; }
    void unlockMemoryImpl() override {}
    V3f _direction;
    Rgb _colour, _ambientColour, _shadow;
    int _lockImpls = 0;
};

// A map of a constant colour whose sampler records where it was asked.
struct RecordingParams : public ConstantParams {
    RecordingParams(const Rgba& colour, float weight) : ConstantParams(colour, weight), _colour(colour) {}
    OPtr<SdTextureSampler> createSampler() const override {
        OPtr<SdTextureSampler> sampler = ConstantParams::createSampler();
        _made = static_cast<const ConstantSampler*>(sampler.get());
        return sampler;
    }
    Rgba _colour;
    mutable const ConstantSampler* _made = nullptr;
};

// Channel k (3: alpha) of what a map of RecordingParams gives; 1 without a map.
double sampleOf(const Map& p, int k) { return p ? channelOf(static_cast<const RecordingParams&>(*p)._colour, k) : 1.0; }

enum Kind { standard, simple, noShade, shadow };

// Channel k (3: alpha) of shader kind for material m at unit normal n and view v. The standard
// shader's own colour: emissive + ambient x ambient light + diffuse x the sum of colour x cosine over
// lit lights + specular x the sum of colour x (H . N)^(2^(10 s)) where H . N > 0; the others': the
// diffuse. Each map brings colour x weight x sample; the diffuse map's scale own + irradiance and
// alpha, then reflection and refraction (not for no-shade) add. A shadow passes u = 1 - alpha, x u.
double closedForm(Kind kind, const SdMaterial& m, const D3& n, const D3& v,
                  const RsScene::LightList& lights, const Rgb& contextAmbient, int k) {
    const auto env = [&](const Map& p, const Rgb& c) {
        return p && kind < noShade ? ch(c, k) * p->getWeight() * sampleOf(p, k) : 0.0;
    };
    const double a = m._opacity * sampleOf(m._diffuseMap, 3), wd = m._diffuseMap ? m._diffuseMap->getWeight() : 1.0;
    double own = ch(m._diffuse, k), amb = ch(contextAmbient, k), dif = 0, spe = 0;
    for (const RCShdPtr<RsLightShader>& light : lights) {
        const StubLight* l = static_cast<const StubLight*>(light.get());
        const D3 to = D3(l->_direction);
        const double cosine = to.dot(n), c = (v + to).getNormalized().dot(n), e = std::exp2(10.0 * m._shininess);
        if (l->_emitAmbient) amb += ch(l->_ambientColour, k);
        if (cosine > 0 && l->_emitDiffuse) dif += ch(l->_colour, k) * cosine;
        if (cosine > 0 && l->_emitSpecular && c > 0) spe += ch(l->_colour, k) * std::pow(c, e);
    }
    if (kind == standard) own = ch(m._emissive, k) + amb * ch(m._ambient, k) + dif * own + spe * ch(m._specular, k);
    if (k == 3 || kind == shadow) return k == 3 ? a : (1 - a) * (1 - a + a * wd * own * sampleOf(m._diffuseMap, k));
    return wd * (own + env(m._irradianceMap, m._irradiance)) * sampleOf(m._diffuseMap, k) +
           env(m._reflectionMap, m._reflection) + env(m._refractionMap, m._refraction);
}

// Where direction d meets a mirror ball seen from +z: there its normal is the half vector of d and +z.
GePoint2<double> mirrorBall(const D3& d) {
    const D3 h = (d + D3(0, 0, 1)).getNormalized();
    return {0.5 + 0.5 * h.x, 0.5 + 0.5 * h.y};
}

// Initialises shader for an instance whose light table is linked, in a scene of lights, and shades.
Rgba shade(RsMaterialShader& shader, RsShadingContext& context, RsScene::LightList lights,
           std::vector<unsigned int> linked = {}) {
    RCShdPtr<RsScene> scene = makeScene({}, lights);
    RCShdPtr<const RsGeomInstance> instance = makeShared<RsGeomInstance>(
        GeAffineMatrix3<float>(), makeBoxMesh({0, 0, 0}, {1, 1, 1}), RsGeomInstance::MaterialList{},
        RsGeomInstance::MaterialList{}, SdInstanceAttributes{}, linked);
    shader.initialize(scene, instance);
    shader.lockMemory();
    const Rgba colour = shader.shade(context);
    shader.unlockMemory();
    return colour;
}

// Random materials, maps, frames (perspective or orthographic), lights in front and behind with random
// emission flags, shininess from 0 (exponent 1: H . N < 0 would subtract), a bump map onto the tangent
// (weight 1) or of weight 0. Each map is read once with the fragment's derivatives: irradiance at the
// (bumped) normal's sphere-map place, diffuse at the fragment's coordinate (restored), reflection at
// the mirrored view's place, refraction at (-T.x, T.y, 1 - T.z) normalised, T the view mirrored about
// index x normal; the last place stays.
TEST(RsMaterialShaders, ShadeTheClosedFormAndReadTheirMapsWhereTheyPointAtRandomFrames) {
    std::mt19937 rng(11);
    for (int trial = 0; trial < 1200; ++trial) {
        const Kind kind = Kind(trial % 4);
        const int bump = trial / 4 % 3;  // none, onto the tangent, of weight 0
        SCOPED_TRACE("kind " + std::to_string(kind) + ", trial " + std::to_string(trial));
        RCShdPtr<SdMaterial> m = makeShared<SdMaterial>();
        for (Rgb* c : {&m->_emissive, &m->_ambient, &m->_diffuse, &m->_specular, &m->_irradiance, &m->_reflection,
                       &m->_refraction})
            *c = randomRgb(rng);
        std::tie(m->_opacity, m->_shininess, m->_refractionIndex) =
            std::tuple{trial % 9 < 2 ? float(trial % 9) : uniform(rng), 0.15f * (rng() % 6), uniform(rng, 0.6f, 1.6f)};
        RCShdPtr<RecordingParams> maps[4];  // irradiance, diffuse, reflection, refraction
        Map* slots[4] = {&m->_irradianceMap, &m->_diffuseMap, &m->_reflectionMap, &m->_refractionMap};
        for (int i = 0; i < 4; ++i)
            if (rng() % 3)
                *slots[i] = maps[i] = makeShared<RecordingParams>(Rgba(randomRgb(rng), uniform(rng, 0.2f)),
                                                                  uniform(rng, 0.2f, 1.5f));
        if (bump) m->_bumpMap = makeShared<ConstantParams>(Rgba(1.0f, 0.5f, 0.5f, 1.0f), bump == 1 ? 1.0f : 0.0f);
        const RCShdPtr<RsMaterialShader> shaders[] = {makeShared<RsStdMaterialShader>(m),
            makeShared<RsSimpleMaterialShader>(m), makeShared<RsNoShadeMaterialShader>(m), makeShared<RsShadowShader>(m)};
        RsScene::LightList lights;
        for (int i = 0, count = kind == standard ? int(rng() % 4) : 0; i < count; ++i) {
            auto light = makeShared<StubLight>(randomUnit(rng), randomRgb(rng), randomRgb(rng) * 0.5f);
            std::tie(light->_emitAmbient, light->_emitDiffuse, light->_emitSpecular) =
                std::tuple{rng() % 3 != 0, rng() % 4 != 0, rng() % 4 != 0};
            lights.push_back(light);
        }
        RsShadingContext context;
        const GeLinearMatrix2<double> derivatives(0.01, 0.02, 0.03, 0.04);
        std::tie(context._ambient, context._orthographic, context._texCoord, context._texCoordDerivatives) =
            std::tuple{randomRgb(rng) * 0.3f, trial % 5 == 0, GePoint2<double>(0.3, 0.7), derivatives};
        D3 n, v, u;
        for (bool poled = true; poled;) {  // away from the lookups' poles, where a place is ill-defined
            context._normal = randomUnit(rng);
            context._tangent = randomUnit(rng) * 0.7f;
            context._viewDirection = randomUnit(rng);
            context._eyeCoord = GePoint3<float>(0, 0, 0) + randomUnit(rng) * -2.5f;
            n = D3(bump == 1 ? context._tangent : context._normal).getNormalized();
            v = D3(context._orthographic ? -context._viewDirection : -context._eyeCoord.toVector()).getNormalized();
            const D3 t = mirror(v, n * m->_refractionIndex), w{-t.x, t.y, 1 - t.z};
            poled = n.z < -0.9 || mirror(v, n).z < -0.9 || w.dot(w) < 0.1;
            if (!poled) u = w.getNormalized();
        }
        const unsigned int needs = shaders[kind]->getNeededContext();  // what it leaves out is poisoned
        const V3f poison = V3f(1, 1, 1) * std::nanf("");
        if (!(needs & RsShadingContext::needsEyeCoord)) context._eyeCoord = GePoint3<float>(0, 0, 0) + poison;
        if (!(needs & RsShadingContext::needsNormal)) context._normal = poison;
        if (!(needs & RsShadingContext::needsTangents)) context._tangent = context._binormal = poison;

        const Rgba got = shade(*shaders[kind], context, lights);
        for (int k = 0; k < 4; ++k)
            EXPECT_NEAR(channelOf(got, k), closedForm(kind, *m, n, v, lights, context._ambient, k), 2e-5);
        for (const auto& l : lights) EXPECT_TRUE(static_cast<StubLight&>(*l)._lockImpls == 1 && l->_lockCount == 0);
        const GePoint2<double> want[4] = {mirrorBall(n), {0.3, 0.7}, mirrorBall(mirror(v, n)),
                                          {0.5 + u.x / 2, 0.5 + u.y / 2}};
        for (int i = kind < noShade ? 0 : 1; i < (kind < noShade ? 4 : 2); ++i)
            if (const ConstantSampler* s = maps[i] ? maps[i]->_made : nullptr; maps[i]) {
                ASSERT_TRUE(s && s->_lookups == 1 && s->_lastDerivatives == context._texCoordDerivatives) << i;
                EXPECT_LT(std::hypot(s->_lastTexCoord.x - want[i].x, s->_lastTexCoord.y - want[i].y), 3e-6) << i;
            }
        if (kind < noShade && (maps[2] || maps[3])) {
            EXPECT_EQ(context._texCoord, maps[maps[3] ? 3 : 2]->_made->_lastTexCoord);
        }
    }
}

// A quad facing the camera under one directional light, through the renderer in perspective: at
// every pixel the closed form at the point that the pixel centre sees.
TEST(RsStdMaterialShader, FlatQuadThroughTheRendererMatchesTheClosedFormAtEveryPixel) {
    const GeRectangle<int> rect{0, 64, 0, 48};
    const GeProjectiveMatrix3<double> projection = perspective(1.0471975511965976, 0.5, 100.0);
    RCShdPtr<SdMaterial> m = makeShared<SdMaterial>();
    m->_emissive = {0.05f, 0.02f, 0.0f}, m->_ambient = {0.1f, 0.2f, 0.3f}, m->_diffuse = {0.5f, 0.4f, 0.3f};
    m->_specular = {0.3f, 0.3f, 0.2f}, m->_shininess = 0.4f;
    const RsScene::LightList lights{
        makeShared<StubLight>(V3f(0.3f, 0.2f, 0.9f).getNormalized(), Rgb(0.9f, 0.8f, 0.7f), Rgb(0.3f, 0.3f, 0.3f))};
    const auto shader = makeShared<RsStdMaterialShader>(m);
    const RCShdPtr<RsGeomInstance> quad = makeInstance(
        makeMesh({{-3, -3, -2}, {3, -3, -2}, {3, 3, -2}, {-3, 3, -2}}, {0, 1, 2, 0, 2, 3}), {}, {}, {shader});
    RCShdPtr<RsScene> scene = makeScene({quad}, lights);
    RCShdPtr<const RsGeomInstance> instance = quad;
    shader->initialize(scene, instance);
    Picture picture(rect);
    render(scene, projection, rect, picture);
    for (int py = rect.y0; py < rect.y1; ++py)
        for (int px = rect.x0; px < rect.x1; ++px) {
            const D3 v = D3(-(px + 0.5 - 32) / 32 / projection(0, 0), -(py + 0.5 - 24) / 24 / projection(1, 1), 1)
                             .getNormalized();
            const Rgba got = picture.at(px, py);
            for (int k = 0; k < 4; ++k)
                EXPECT_NEAR(channelOf(got, k), closedForm(standard, *m, {0, 0, 1}, v, lights, {}, k), 1e-4)
                    << px << ", " << py << " channel " << k;
        }
}

// The matte per channel: the smaller of the summed shadow of the linked lights times the strength
// shared out among them, and 1; 1 less that when inverted; alpha 1. Light 9 is not linked to the
// instance and counts neither in the sum nor in the sharing.
TEST(RsShadowMatteShader, ShowsTheSharedShadowSumOfItsLinkedLights) {
    struct Case { std::vector<Rgb> shadows; float strength; Rgb want; };  // shadows of lights 1, 2, ...
    const Case cases[] = {
        {{}, 1.0f, {0, 0, 0}}, {{{0.3f, 0.6f, 1.0f}}, 2.0f, {0.6f, 1.0f, 1.0f}},
        {{{1.0f, 0.0f, 0.5f}, {1.0f, 1.0f, 0.1f}}, 1.0f, {1.0f, 0.5f, 0.3f}},
        {{{0.2f, 0.4f, 0.6f}, {0.2f, 0.0f, 0.6f}}, 1.5f, {0.3f, 0.3f, 0.9f}}};
    for (const Case& c : cases)
        for (bool inverted : {false, true}) {
            RCShdPtr<SdMaterial> m = makeShared<SdMaterial>();
            std::tie(m->_shadowStrength, m->_inverted) = std::tuple{c.strength, inverted};
            RsScene::LightList lights;
            for (unsigned int id = 0; id <= c.shadows.size(); ++id) {  // light 0 stands for light 9
                auto l = makeShared<StubLight>(V3f(0, 0, 1), Rgb(1.0f), Rgb(1.0f), id ? c.shadows[id - 1] : Rgb(1.0f));
                std::tie(l->_lightId, l->_linkMode) = std::tuple{id ? id : 9, SdLight::LinkMode::include};
                lights.push_back(l);
            }
            RsShadowMatteShader shader(m);
            RsShadingContext context;
            expectNearRgba(shade(shader, context, lights, {1, 2}), Rgba(inverted ? Rgb(1.0f) - c.want : c.want, 1.0f), 1e-6,
                           "case " + std::to_string(&c - cases) + (inverted ? ", inverted" : ""));
        }
}

}  // namespace
}  // namespace Zr
