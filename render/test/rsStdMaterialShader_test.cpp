// The standard material shader against the closed form of its lighting model - Lambert plus a
// Blinn-Phong highlight per light, ambient per light, emission - at random frames and through the
// renderer on a flat quad; its maps' weights and samples against the same closed form; and the
// environment lookups of the standard and the simple shader at the closed-form sphere-map
// positions, seen by samplers that record where they were asked.
#include <gtest/gtest.h>

#include <cmath>
#include <random>
#include <string>

#include "rsSimpleMaterialShader.h"
#include "rsStdMaterialShader.h"
#include "rsTestSupport.h"

namespace Zr {
namespace {

using namespace RsTest;
using Rgb = CoRgbColorTyped<float>;
using V3f = GeVector3<float>;

struct D3 {
    double x, y, z;
    D3 operator+(const D3& o) const { return {x + o.x, y + o.y, z + o.z}; }
    D3 operator-(const D3& o) const { return {x - o.x, y - o.y, z - o.z}; }
    D3 operator*(double s) const { return {x * s, y * s, z * s}; }
    double dot(const D3& o) const { return x * o.x + y * o.y + z * o.z; }
    D3 unit() const { return *this * (1.0 / std::sqrt(dot(*this))); }
};
D3 toD3(const V3f& v) { return {v.x, v.y, v.z}; }

V3f randomUnit(std::mt19937& rng) {
    std::normal_distribution<float> g;
    for (;;) {
        const V3f v(g(rng), g(rng), g(rng));
        if (v.length() > 0.1f) return v.getNormalized();
    }
}
Rgb randomRgb(std::mt19937& rng) {
    std::uniform_real_distribution<float> u(0.0f, 1.0f);
    return {u(rng), u(rng), u(rng)};
}

// A directional light of fixed direction and colours, shining on the side its direction faces.
class StubLight : public RsLightShader {
public:
    StubLight(const V3f& direction, const Rgb& colour, const Rgb& ambient)
        : _direction(direction), _colour(colour), _ambientColour(ambient) {
        _emitAmbient = true;
    }
    void setupRender(const GeAffineMatrix3<float>&) override {}
    void initializeMaps(const RCShdPtr<RsScene>&) override {}
    bool illuminate(const RsShadingContext& context, Illumination& illumination) const override {
        illumination._direction = _direction;
        illumination._ambient = _ambientColour;
        illumination._color = _colour;
        illumination._cosine = _direction.dot(context._normal);
        return illumination._cosine > 0.0f;
    }
    Rgb shadow(const RsShadingContext&) override { return {1.0f, 1.0f, 1.0f}; }
    V3f _direction;
    Rgb _colour, _ambientColour;
    int _lockImpls = 0;

protected:
    void lockMemoryImpl() override { ++_lockImpls; }
    void unlockMemoryImpl() override {}
};

// The lighting model in double: emissive + ambient x sum of the lights' ambient + diffuse x sum
// of colour x cosine over the lights in front + specular x sum of colour x (H . N)^(2^(10 s)) over
// those where the half vector H lies on the normal's side.
struct Oracle {
    D3 n, v;
    double exponent;
    double rgb[3] = {0, 0, 0};
    double amb[3] = {0, 0, 0}, dif[3] = {0, 0, 0}, spe[3] = {0, 0, 0};
    int behind = 0, highlightSkipped = 0;

    void add(const StubLight& light) {
        const D3 l = toD3(light._direction);
        const double cosine = l.dot(n);
        const double c = (v + l).unit().dot(n);
        behind += cosine <= 0;
        highlightSkipped += cosine > 0 && c <= 0;
        for (int k = 0; k < 3; ++k) {
            const double colour = channelOf(Rgba(light._colour, 0), k);
            if (light._emitAmbient) amb[k] += channelOf(Rgba(light._ambientColour, 0), k);
            if (cosine > 0 && light._emitDiffuse) dif[k] += colour * cosine;
            if (cosine > 0 && light._emitSpecular && c > 0) spe[k] += colour * std::pow(c, exponent);
        }
    }
    Rgba colour(const SdMaterial& m, const Rgb& contextAmbient) const {
        double out[3];
        for (int k = 0; k < 3; ++k) {
            const auto ch = [k](const Rgb& c) { return double(channelOf(Rgba(c, 0), k)); };
            out[k] = ch(m._emissive) + (amb[k] + ch(contextAmbient)) * ch(m._ambient) + dif[k] * ch(m._diffuse) +
                     spe[k] * ch(m._specular);
        }
        return Rgba(float(out[0]), float(out[1]), float(out[2]), m._opacity);
    }
};

RCShdPtr<SdMaterial> randomMaterial(std::mt19937& rng) {
    static const float shininess[] = {0.0f, 0.1f, 0.2f, 0.35f, 0.5f, 0.73f};
    RCShdPtr<SdMaterial> m = makeShared<SdMaterial>();
    m->_emissive = randomRgb(rng) * 0.2f;
    m->_ambient = randomRgb(rng);
    m->_diffuse = randomRgb(rng);
    m->_specular = randomRgb(rng);
    m->_opacity = std::uniform_real_distribution<float>(0.1f, 1.0f)(rng);
    m->_shininess = shininess[rng() % 6];
    return m;
}

RCShdPtr<RsGeomInstance> instanceLinkedTo(std::vector<unsigned int> lights) {
    return makeShared<RsGeomInstance>(GeAffineMatrix3<float>(), makeBoxMesh({0, 0, 0}, {1, 1, 1}),
                                      RsGeomInstance::MaterialList{}, RsGeomInstance::MaterialList{},
                                      SdInstanceAttributes{}, lights);
}

void initialize(RsMaterialShader& shader, RCShdPtr<RsScene> scene, RCShdPtr<const RsGeomInstance> instance) {
    shader.initialize(scene, instance);
}

// Random normals, views (perspective and orthographic), lights in front and behind with random
// emission flags, shininess from 0 (exponent 1, where a negative H . N would subtract) to 0.73,
// and half the time a bump map that turns the normal onto the tangent.
TEST(RsStdMaterialShader, ShadesTheClosedFormAtRandomFrames) {
    std::mt19937 rng(11);
    int behind = 0, skipped = 0;
    for (int trial = 0; trial < 400; ++trial) {
        RCShdPtr<SdMaterial> m = randomMaterial(rng);
        const bool bumped = trial % 2 == 1;
        if (bumped) m->_bumpMap = makeShared<ConstantParams>(Rgba(1.0f, 0.5f, 0.5f, 1.0f));
        RsStdMaterialShader shader(m);

        RsScene::LightList lights;
        std::vector<StubLight*> stubs;
        for (int i = 0, count = int(rng() % 4); i < count; ++i) {
            auto light = makeShared<StubLight>(randomUnit(rng), randomRgb(rng), randomRgb(rng) * 0.5f);
            light->_emitAmbient = rng() % 3 != 0;
            light->_emitDiffuse = rng() % 4 != 0;
            light->_emitSpecular = rng() % 4 != 0;
            stubs.push_back(light.get());
            lights.push_back(light);
        }
        initialize(shader, makeScene({}, lights), instanceLinkedTo({}));

        RsShadingContext context;
        context._normal = randomUnit(rng);
        context._tangent = randomUnit(rng) * 0.7f;
        context._ambient = randomRgb(rng) * 0.3f;
        context._orthographic = trial % 5 == 0;
        context._viewDirection = randomUnit(rng);
        context._eyeCoord = GePoint3<float>(0, 0, 0) + randomUnit(rng) * -3.0f;
        const V3f view = context._orthographic ? -context._viewDirection : -context._eyeCoord.toVector();

        Oracle oracle{toD3(bumped ? context._tangent : context._normal).unit(), toD3(view).unit(),
                      std::pow(2.0, 10.0 * m->_shininess)};
        for (const StubLight* light : stubs) oracle.add(*light);
        behind += oracle.behind;
        skipped += oracle.highlightSkipped;

        shader.lockMemory();
        const Rgba got = shader.shade(context);
        shader.unlockMemory();
        expectNearRgba(got, oracle.colour(*m, context._ambient), 2e-5, "trial " + std::to_string(trial));
    }
    EXPECT_GT(behind, 100);
    EXPECT_GT(skipped, 20);
}

// A quad facing the camera under one directional light, through the renderer in perspective: at
// every pixel the colour of the closed form at the point the pixel centre sees. A second, brighter
// light is linked so that it excludes the quad and must add nothing; the linked light is locked
// around the drawing.
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

    auto shining = makeShared<StubLight>(V3f(0.3f, 0.2f, 0.9f).getNormalized(), Rgb(0.9f, 0.8f, 0.7f),
                                         Rgb(0.3f, 0.3f, 0.3f));
    auto excluding = makeShared<StubLight>(V3f(0.0f, 0.0f, 1.0f), Rgb(5, 5, 5), Rgb(5, 5, 5));
    shining->_lightId = 3;
    shining->_linkMode = SdLight::LinkMode::include;
    excluding->_lightId = 4;
    excluding->_linkMode = SdLight::LinkMode::exclude;
    const RCShdPtr<RsGeomInstance> instance = makeInstance(
        makeMesh({{-3, -3, z}, {3, -3, z}, {3, 3, z}, {-3, 3, z}}, {0, 1, 2, 0, 2, 3}), {}, {}, {shader});
    instance->_lights = {3, 4};
    const RCShdPtr<RsScene> scene = makeScene({instance}, {excluding, shining});
    initialize(*shader, scene, instance);

    Picture picture(rect);
    render(scene, projection, rect, picture);
    EXPECT_GT(shining->_lockImpls, 0);
    EXPECT_EQ(shining->_lockCount, 0);

    for (int py = rect.y0; py < rect.y1; ++py)
        for (int px = rect.x0; px < rect.x1; ++px) {
            const D3 eye = D3{(px + 0.5 - 32) / 32 / projection(0, 0), (py + 0.5 - 24) / 24 / projection(1, 1), -1} *
                           double(-z);
            Oracle oracle{{0, 0, 1}, (eye * -1.0).unit(), std::pow(2.0, 4.0)};
            oracle.add(*shining);
            expectNearRgba(picture.at(px, py), oracle.colour(*m, {}), 1e-4,
                           std::to_string(px) + ", " + std::to_string(py));
        }
}

// Every map at a random weight, with constant samples: the diffuse map's weight scales the
// emissive, ambient, diffuse, specular and irradiance colours and its sample multiplies all of
// them and alpha; reflection and refraction come on top with their own weights. Among the cases,
// the diffuse map (0.5, 0.5, 0.5, 0.5) of weight 1, which halves alpha and the lit colour but not
// the reflection.
TEST(RsStdMaterialShader, MapsScaleTheirTermsAndTheDiffuseMapAllButTheEnvironment) {
    std::mt19937 rng(5);
    std::uniform_real_distribution<float> weight(0.2f, 1.5f);
    for (int trial = 0; trial < 50; ++trial) {
        RCShdPtr<SdMaterial> m = randomMaterial(rng);
        m->_irradiance = randomRgb(rng);
        m->_reflection = randomRgb(rng);
        m->_refraction = randomRgb(rng);
        const bool half = trial == 0;
        const float wd = half ? 1.0f : weight(rng), wi = weight(rng), wl = weight(rng), wr = weight(rng);
        const Rgba ds = half ? Rgba(0.5f, 0.5f, 0.5f, 0.5f) : Rgba(randomRgb(rng), 0.6f), is(randomRgb(rng), 1),
                   ls(randomRgb(rng), 1), rs(randomRgb(rng), 1);
        m->_diffuseMap = makeShared<ConstantParams>(ds, wd);
        m->_irradianceMap = makeShared<ConstantParams>(is, wi);
        m->_reflectionMap = makeShared<ConstantParams>(ls, wl);
        const bool refracts = trial % 2 == 0;
        if (refracts) m->_refractionMap = makeShared<ConstantParams>(rs, wr);
        RsStdMaterialShader shader(m);

        auto light = makeShared<StubLight>(randomUnit(rng), randomRgb(rng), randomRgb(rng));
        initialize(shader, makeScene({}, {light}), instanceLinkedTo({}));
        RsShadingContext context;
        context._normal = randomUnit(rng);
        context._eyeCoord = GePoint3<float>(0.5f, -0.5f, -4.0f);

        Oracle oracle{toD3(context._normal), toD3(-context._eyeCoord.toVector()).unit(),
                      std::pow(2.0, 10.0 * m->_shininess)};
        oracle.add(*light);
        const Rgba lit = oracle.colour(*m, {});
        Rgba want;
        for (int k = 0; k < 3; ++k) {
            const auto ch = [k](const auto& c) { return double(channelOf(Rgba(c.r, c.g, c.b, 0), k)); };
            const double textured = (wd * ch(lit) + wd * wi * ch(m->_irradiance) * ch(is)) * ch(ds);
            channelOf(want, k) = float(textured + wl * ch(m->_reflection) * ch(ls) +
                                       (refracts ? wr * ch(m->_refraction) * ch(rs) : 0.0));
        }
        want.a = m->_opacity * ds.a;
        shader.lockMemory();
        expectNearRgba(shader.shade(context), want, 2e-5, "trial " + std::to_string(trial));
        shader.unlockMemory();
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

// Where a unit direction d meets a mirror ball seen from +z: the ball's normal there is the
// half vector of d and +z, whose x and y, halved and moved to the centre, are the position.
GePoint2<double> mirrorBall(const D3& d) {
    const D3 h = (d + D3{0, 0, 1}).unit();
    return {0.5 + 0.5 * h.x, 0.5 + 0.5 * h.y};
}

// The standard and the simple shader read the irradiance map at the place of the normal (after
// the bump map, which here turns it onto the tangent) on the sphere map, the diffuse map at the fragment's own coordinate (restored after the irradiance lookup), the
// reflection map at the mirrored view's place and the refraction map at (-T.x, T.y, 1 - T.z)
// normalised, for T the view mirrored about the normal scaled by the index; the last lookup's
// position stays in the context. Each lookup carries the fragment's derivatives.
TEST(RsStdMaterialShader, EnvironmentLookupsSampleAtTheirSphereMapPositions) {
    std::mt19937 rng(17);
    for (int trial = 0; trial < 200; ++trial) {
        const bool simple = trial % 2 == 1;
        const bool refracts = trial % 3 != 0;
        RCShdPtr<SdMaterial> m = makeShared<SdMaterial>();
        m->_refractionIndex = std::uniform_real_distribution<float>(0.6f, 1.6f)(rng);
        RCShdPtr<RecordingParams> maps[4] = {makeShared<RecordingParams>(), makeShared<RecordingParams>(),
                                             makeShared<RecordingParams>(), makeShared<RecordingParams>()};
        m->_irradianceMap = maps[0];
        m->_diffuseMap = maps[1];
        m->_reflectionMap = maps[2];
        if (refracts) m->_refractionMap = maps[3];
        const bool bumped = trial % 4 < 2;
        if (bumped) m->_bumpMap = makeShared<ConstantParams>(Rgba(1.0f, 0.5f, 0.5f, 1.0f));
        RCShdPtr<RsMaterialShader> shader = simple ? RCShdPtr<RsMaterialShader>(makeShared<RsSimpleMaterialShader>(m))
                                                   : RCShdPtr<RsMaterialShader>(makeShared<RsStdMaterialShader>(m));
        // Frames away from the lookups' poles, where a position is not well defined.
        RsShadingContext context;
        D3 n, v, r, u;
        for (bool poled = true; poled;) {
            context._normal = randomUnit(rng);
            context._tangent = randomUnit(rng);
            context._eyeCoord = GePoint3<float>(0, 0, 0) + randomUnit(rng) * -2.5f;
            n = toD3(bumped ? context._tangent : context._normal), v = toD3(-context._eyeCoord.toVector()).unit();
            r = n * (2 * v.dot(n)) - v;
            const D3 np = n * m->_refractionIndex, t = np * (2 * v.dot(np)) - v, w{-t.x, t.y, 1 - t.z};
            poled = n.z < -0.9 || r.z < -0.9 || w.dot(w) < 0.1;
            if (!poled) u = w.unit();
        }
        context._texCoord = {0.3, 0.7};
        context._texCoordDerivatives = GeLinearMatrix2<double>(0.01, 0.02, 0.03, 0.04);
        shader->lockMemory();
        shader->shade(context);
        shader->unlockMemory();

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

}  // namespace
}  // namespace Zr
