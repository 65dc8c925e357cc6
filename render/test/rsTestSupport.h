#pragma once
// Support of the renderer's tests: a test material, scene makers, a float picture to render into,
// tiles of the nine pixel formats read channel by channel, texture doubles, and the independent
// oracles that several tests share: the layered "over" composite, the exact fill rule of the
// rasterizer, and corner arithmetic in double.
#include <gtest/gtest.h>

#include <algorithm>
#include <bit>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <functional>
#include <optional>
#include <random>
#include <string>
#include <vector>

#include "exRenderCancelled.h"
#include "geCameraBuilder.h"
#include "ixPixelConvert.h"
#include "ixReadGuard.h"
#include "ixWriteGuard.h"
#include "pxRequestMgr.h"
#include "rsRasterizer.h"
#include "rsRenderer.h"
#include "rsShadowShader.h"
#include "rsTransferFunc.h"
#include "sdMeshBuilder.h"
#include "sdTextureParams.h"
#include "sdTextureSampler.h"

namespace Zr::RsTest {

using Rgba = CoRgbaColorTyped<float>;

// ---- Materials and scenes ------------------------------------------------------------------------

// A material answers `colour`, or probe(context) when a probe is given, so that a picture shows
// what the drawing paths handed to the shader; it counts its shade calls.
struct MaterialSettings {
    MaterialSettings(const Rgba& c = {1.0f, 1.0f, 1.0f, 1.0f}) : colour(c) {}
    Rgba colour;
    std::function<Rgba(const RsShadingContext&)> probe;
    SdMaterial::TransferMode mode = SdMaterial::TransferMode::normal;
    unsigned int needed = 0;
    bool wireframe = false;
    bool screenSpace = true;
    float wireSize = 1.0f;
};

class TestMaterial : public RsMaterialShader {
public:
    explicit TestMaterial(const MaterialSettings& s = {}) : RsMaterialShader(material(s)), _settings(s) {}
    Rgba shade(RsShadingContext& context) override {
        ++_calls;
        return _settings.probe ? _settings.probe(context) : _settings.colour;
    }
    unsigned int getNeededContext() const override { return _settings.needed; }
    int _calls = 0;

protected:
    void lockMemoryImpl() override {}
    void unlockMemoryImpl() override {}

private:
    static RCShdPtr<const SdMaterial> material(const MaterialSettings& s) {
        RCShdPtr<SdMaterial> m = makeShared<SdMaterial>();
        m->_transferMode = s.mode;
        m->_wireframe = s.wireframe;
        m->_screenSpace = s.screenSpace;
        m->_wireSize = s.wireSize;
        return m;
    }
    MaterialSettings _settings;
};

// The add mode with colour 1: a pixel's red counts the fragments drawn there.
inline MaterialSettings counting(unsigned int needed = 0) {
    MaterialSettings s;
    s.mode = SdMaterial::TransferMode::add;
    s.needed = needed;
    return s;
}

inline RCShdPtr<const SdMesh> makeMesh(const std::vector<GePoint3<float>>& vertices,
                                       const std::vector<std::uint32_t>& triangles,
                                       const std::vector<GePoint3<float>>& texCoords = {}) {
    SdMeshBuilder builder;
    builder.setVertices(vertices).setTriangles(triangles);
    if (!texCoords.empty()) builder.addTextureChannel(texCoords);
    return builder.build();
}

// A mesh whose vertices are the corners of [min, max] (corner c takes bit 0 for x, 1 for y, 2 for
// z), so that its box is exactly that.
inline RCShdPtr<const SdMesh> makeBoxMesh(const GePoint3<float>& min, const GePoint3<float>& max) {
    std::vector<GePoint3<float>> corners;
    for (int c = 0; c < 8; ++c)
        corners.emplace_back(c & 1 ? max.x : min.x, c & 2 ? max.y : min.y, c & 4 ? max.z : min.z);
    return makeMesh(corners, {0, 1, 3, 4, 7, 6});
}

inline SdInstanceAttributes makeAttributes(std::int32_t renderOrder, bool visible = true, bool castsShadows = true) {
    SdInstanceAttributes a;
    a._renderOrder = renderOrder;
    a._visible = visible;
    a._castsShadows = castsShadows;
    return a;
}

inline RCShdPtr<RsGeomInstance> makeInstance(const RCShdPtr<const SdMesh>& mesh,
                                             const GeAffineMatrix3<float>& matrix = {},
                                             const SdInstanceAttributes& attributes = {},
                                             const RsGeomInstance::MaterialList& materials = {}) {
    return makeShared<RsGeomInstance>(matrix, mesh, materials, RsGeomInstance::MaterialList{}, attributes,
                                      std::vector<unsigned int>{});
}

// An instance drawn with one test material.
inline RCShdPtr<RsGeomInstance> drawn(const RCShdPtr<const SdMesh>& mesh, const MaterialSettings& settings,
                                      const GeAffineMatrix3<float>& matrix = {}) {
    return makeInstance(mesh, matrix, {}, {makeShared<TestMaterial>(settings)});
}

inline RCShdPtr<RsScene> makeScene(std::vector<RCShdPtr<RsGeomInstance>> instances, RsScene::LightList lights = {}) {
    RsScene::CameraList cameras;
    return makeShared<RsScene>(instances, lights, cameras);
}

// Camera space to -1..1: a perspective of vertical opening fov (radians) and aspect 1.
inline GeProjectiveMatrix3<double> perspective(double fov, double n, double f) {
    const double c = 1.0 / std::tan(fov * 0.5);
    return {c, 0, 0, 0, 0, c, 0, 0, 0, 0, (f + n) / (n - f), 2 * f * n / (n - f), 0, 0, -1, 0};
}

// A sphere of radius r about the origin, of slices meridians and stacks parallels, its vertex
// normals exact (the unit positions). The two triangles of a cell share the plane of its four
// corners, so a face lies within r (1 - cos h) inside the sphere, h the angle from the cell's
// middle to its corners; the widest cells (at the equator) have cos h = cos(pi / stacks / 2) *
// cos(pi / slices).
inline RCShdPtr<const SdMesh> makeSphereMesh(float r, int slices, int stacks) {
    std::vector<GeVector3<float>> normals{{0, 0, 1}};
    for (int i = 1; i < stacks; ++i)
        for (int j = 0; j < slices; ++j) {
            const double theta = M_PI * i / stacks, phi = 2 * M_PI * j / slices;
            normals.emplace_back(float(std::sin(theta) * std::cos(phi)), float(std::sin(theta) * std::sin(phi)),
                                 float(std::cos(theta)));
        }
    normals.emplace_back(0.0f, 0.0f, -1.0f);
    std::vector<GePoint3<float>> points;
    for (const GeVector3<float>& n : normals) points.emplace_back(r * n.x, r * n.y, r * n.z);
    const auto at = [slices](int i, int j) { return std::uint32_t(1 + (i - 1) * slices + j % slices); };
    const std::uint32_t south = std::uint32_t(points.size() - 1);
    std::vector<std::uint32_t> triangles;
    for (int j = 0; j < slices; ++j) {
        triangles.insert(triangles.end(), {0, at(1, j), at(1, j + 1), south, at(stacks - 1, j + 1), at(stacks - 1, j)});
        for (int i = 1; i + 1 < stacks; ++i)
            triangles.insert(triangles.end(),
                             {at(i, j), at(i + 1, j), at(i + 1, j + 1), at(i, j), at(i + 1, j + 1), at(i, j + 1)});
    }
    return SdMeshBuilder().setVertices(points).setTriangles(triangles).setNormals(normals).build();
}

// Corner c of box (bit 0 picks the x end, bit 1 y, bit 2 z), in double.
inline GePoint3<double> cornerOf(const GeAlignedBox3<float>& box, int c) {
    return {c & 1 ? box.xMax : box.xMin, c & 2 ? box.yMax : box.yMin, c & 4 ? box.zMax : box.zMin};
}

// The box of the corners of box taken through the matrices (the last first) in double, as (min,
// max) per axis, grown into lo and hi; and the check that a box is that one.
inline void growBoxInDouble(std::vector<GeAffineMatrix3<float>> ms, const GeAlignedBox3<float>& box, double lo[3],
                            double hi[3]) {
    for (int c = 0; c < 8; ++c) {
        GePoint3<double> p = cornerOf(box, c);
        for (auto m = ms.rbegin(); m != ms.rend(); ++m) {
            double v[3];
            for (int r = 0; r < 3; ++r)
                v[r] = (*m)(r, 0) * p.x + (*m)(r, 1) * p.y + (*m)(r, 2) * p.z + double((*m)(r, 3));
            p = {v[0], v[1], v[2]};
        }
        const double v[3] = {p.x, p.y, p.z};
        for (int a = 0; a < 3; ++a) lo[a] = std::min(lo[a], v[a]), hi[a] = std::max(hi[a], v[a]);
    }
}
inline void expectBoxNear(const GeAlignedBox3<float>& box, const double lo[3], const double hi[3], double tolerance) {
    const float got[6] = {box.xMin, box.yMin, box.zMin, box.xMax, box.yMax, box.zMax};
    for (int a = 0; a < 3; ++a) {
        EXPECT_NEAR(got[a], lo[a], tolerance);
        EXPECT_NEAR(got[a + 3], hi[a], tolerance);
    }
}

// ---- Pictures and tiles --------------------------------------------------------------------------

struct Format {
    int comps;
    int depth;
    IxPixelFormat pixelFormat() const {
        return IxPixelFormat(static_cast<IxPixelFormat::Comps>(comps), static_cast<IxPixelFormat::Depth>(depth));
    }
};

inline const std::vector<Format>& allFormats() {
    static const std::vector<Format> formats{{1, 8},  {3, 8},  {4, 8},  {1, 16}, {3, 16},
                                             {4, 16}, {1, 32}, {3, 32}, {4, 32}};
    return formats;
}

// The RGBA channel that channel c of a pixel of comps channels holds.
inline int rgbaIndexOf(int comps, int c) { return comps == 1 ? 3 : c; }
inline float& channelOf(Rgba& colour, int i) {
    return i == 0 ? colour.r : i == 1 ? colour.g : i == 2 ? colour.b : colour.a;
}
inline float channelOf(const Rgba& colour, int i) { return channelOf(const_cast<Rgba&>(colour), i); }

// A write guard on a new tile of zeros; the guard keeps the pixels after the tile object is gone.
inline IxWriteGuard makeTile(const Format& format, const GeRectangle<int>& rectangle, const Rgba& initial = {}) {
    IxTile tile(format.pixelFormat(), rectangle, initial);
    return IxWriteGuard(tile);
}

// Raw bits of channel c of pixel (x, y), widened to 32 bits, and their setter.
inline std::uint32_t rawChannel(const IxWriteGuard& g, int x, int y, int c) {
    const int bytes = g._pixelFormat._depth / 8;
    std::uint32_t v = 0;
    std::memcpy(&v, g.getPixelAddress(x, y) + c * bytes, bytes);  // little-endian
    return v;
}
inline void setRawChannel(const IxWriteGuard& g, int x, int y, int c, std::uint32_t v) {
    const int bytes = g._pixelFormat._depth / 8;
    std::memcpy(g.getPixelAddress(x, y) + c * bytes, &v, bytes);
}

// A channel's raw bits read as a float by the conversions of its depth, and the bits that a
// replacing writer stores for v.
inline float bitsToFloat(int depth, std::uint32_t bits) {
    if (depth == 8) return IxPixelConvert::byteToFloat(static_cast<std::uint8_t>(bits));
    if (depth == 16) return IxPixelConvert::halfToFloat(static_cast<std::uint16_t>(bits));
    return std::bit_cast<float>(bits);
}
inline std::uint32_t floatToBits(int depth, float v) {
    if (depth == 8) return IxPixelConvert::floatToByte(v);
    if (depth == 16) return IxPixelConvert::floatToHalf(v);
    return std::bit_cast<std::uint32_t>(v);
}

// The bits after an adding writer added v to a channel holding bits: rounding per pass and, for
// bytes, saturation.
inline std::uint32_t addToBits(int depth, std::uint32_t bits, float v) {
    if (depth == 8) return std::min(255u, bits + IxPixelConvert::floatToByte(v));
    if (depth == 16) {
        const float rounded = IxPixelConvert::halfToFloat(IxPixelConvert::floatToHalf(v));
        return IxPixelConvert::floatToHalf(IxPixelConvert::halfToFloat(static_cast<std::uint16_t>(bits)) + rounded);
    }
    return std::bit_cast<std::uint32_t>(std::bit_cast<float>(bits) + v);
}

// The straight colour that a pixel's stored channels stand for: missing alpha 1, missing colour 0.
inline Rgba pixelColour(const IxWriteGuard& g, int x, int y) {
    const int comps = g._pixelFormat._comps;
    Rgba colour(0.0f, 0.0f, 0.0f, 1.0f);
    for (int c = 0; c < comps; ++c)
        channelOf(colour, rgbaIndexOf(comps, c)) = bitsToFloat(g._pixelFormat._depth, rawChannel(g, x, y, c));
    return colour;
}

// Values in [lo, hi) in every channel of the tile.
inline void fillRandomValues(const IxWriteGuard& g, std::mt19937& rng, float lo, float hi) {
    std::uniform_real_distribution<float> value(lo, hi);
    const GeRectangle<int>& r = g._rectangle;
    for (int y = r.y0; y < r.y1; ++y)
        for (int x = r.x0; x < r.x1; ++x)
            for (int c = 0; c < g._pixelFormat._comps; ++c)
                setRawChannel(g, x, y, c, floatToBits(g._pixelFormat._depth, value(rng)));
}

// All bytes of the tile's block, for checks that nothing changed.
inline std::vector<unsigned char> snapshot(const IxWriteGuard& g) {
    const unsigned char* first = g.getPixelAddress(g._rectangle.x0, g._rectangle.y0);
    return std::vector<unsigned char>(first, first + std::size_t(g._rowStride) * g._rectangle.getHeight());
}

// A float RGBA picture over rect, every pixel `initial`.
struct Picture {
    explicit Picture(const GeRectangle<int>& rect, const Rgba& initial = {0.0f, 0.0f, 0.0f, 0.0f})
        : guard(makeTile({4, 32}, rect, initial)) {}
    Rgba at(int x, int y) const { return pixelColour(guard, x, y); }
    bool operator==(const Picture& o) const { return snapshot(guard) == snapshot(o.guard); }
    IxWriteGuard guard;
};

inline void render(const RCShdPtr<RsScene>& scene, const GeProjectiveMatrix3<double>& projection,
                   const GeRectangle<int>& rectangle, Picture& picture) {
    RsRenderer().render(GeAffineMatrix3<float>(), projection, scene, rectangle, picture.guard);
}

// The reference composite: straight layers laid with "over", far to near, onto a straight start
// colour, in double; the result straight again.
inline Rgba overComposite(const Rgba& start, const std::vector<Rgba>& layers) {
    double r = start.r * start.a, g = start.g * start.a, b = start.b * start.a, a = start.a;
    for (const Rgba& s : layers) {
        r = s.r * s.a + r * (1 - s.a);
        g = s.g * s.a + g * (1 - s.a);
        b = s.b * s.a + b * (1 - s.a);
        a = s.a + a * (1 - s.a);
    }
    return Rgba(float(r / a), float(g / a), float(b / a), float(a));
}

inline void expectNearRgba(const Rgba& got, const Rgba& want, double tolerance, const std::string& where) {
    EXPECT_NEAR(got.r, want.r, tolerance) << where;
    EXPECT_NEAR(got.g, want.g, tolerance) << where;
    EXPECT_NEAR(got.b, want.b, tolerance) << where;
    EXPECT_NEAR(got.a, want.a, tolerance) << where;
}

// ---- Shadows -------------------------------------------------------------------------------------

// The mean of cell(index) (row * size + column) over the square of half width r around (u, v) by
// n x n samples, counting those inside the map: a product grid, so a cell's samples are the product
// of its column's and its row's counts. `outside` where no sample falls inside.
template <class Cell>
double supersampledMean(int size, double u, double v, double r, double outside, Cell&& cell) {
    std::vector<double> columns(size, 0.0), rows(size, 0.0);
    for (int k = 0, n = 20000; k < n; ++k) {
        const double t = (k + 0.5) / n * 2.0 * r - r;
        if (u + t >= 0.0 && u + t < size) columns[static_cast<int>(std::floor(u + t))] += 1.0;
        if (v + t >= 0.0 && v + t < size) rows[static_cast<int>(std::floor(v + t))] += 1.0;
    }
    double sum = 0.0, weight = 0.0;
    for (int c = 0; c < size * size; ++c) {
        const double w = columns[c % size] * rows[c / size];
        sum += w * cell(c), weight += w;
    }
    return weight == 0.0 ? outside : sum / weight;
}

// A square card of half side h around the origin in the plane z = 0, facing +z.
inline RCShdPtr<const SdMesh> card(float h) { return makeMesh({{-h, -h, 0}, {h, -h, 0}, {h, h, 0}, {-h, h, 0}}, {0, 1, 2, 0, 2, 3}); }

// The shadow shader of a material of the given diffuse colour and opacity a, which lets through
// (colour x a + 1 - a) x (1 - a) per channel.
inline RCShdPtr<RsMaterialShader> shadowShaderOf(const CoRgbColorTyped<float>& colour, float opacity) {
    RCShdPtr<SdMaterial> m = makeShared<SdMaterial>();
    m->_diffuse = colour;
    m->_opacity = opacity;
    return makeShared<RsShadowShader>(m);
}

// An instance with a shader for the camera and a shadow shader for the lights' deep passes.
inline RCShdPtr<RsGeomInstance> caster(const RCShdPtr<const SdMesh>& mesh, const GeAffineMatrix3<float>& matrix,
                                       const RCShdPtr<RsMaterialShader>& material,
                                       const RCShdPtr<RsMaterialShader>& shadowShader, bool visible = true) {
    return makeShared<RsGeomInstance>(matrix, mesh, RsGeomInstance::MaterialList{material},
                                      RsGeomInstance::MaterialList{shadowShader}, makeAttributes(0, visible),
                                      std::vector<unsigned int>{});
}

// A material whose colour is the product of what the lights let through at the fragment
// (RsLightShader::shadow), alpha 1.
inline RCShdPtr<RsMaterialShader> shadowProbe(std::vector<RCShdPtr<RsLightShader>> lights) {
    MaterialSettings s;
    s.needed = 0x01u;
    s.probe = [lights](const RsShadingContext& context) {
        Rgba c(1.0f, 1.0f, 1.0f, 1.0f);
        for (const auto& light : lights) {
            const CoRgbColorTyped<float> passed = light->shadow(context);
            c.r *= passed.r, c.g *= passed.g, c.b *= passed.b;
        }
        return c;
    };
    return makeShared<TestMaterial>(s);
}

// ---- Texture doubles -----------------------------------------------------------------------------

// Answers every lookup with one colour, and keeps the count and arguments of the shader lookups.
class ConstantSampler : public SdTextureSampler {
public:
    explicit ConstantSampler(const Rgba& colour) : _colour(colour) {}
    using SdTextureSampler::sample;
    Rgba sample(const GePoint2<double>&, double, double) const override { return _colour; }
    Rgba sample(int, int) const override { return _colour; }
    Rgba sample(const GePoint2<double>& texCoord, const GeLinearMatrix2<double>& derivatives) const override {
        ++_lookups;
        _lastTexCoord = texCoord;
        _lastDerivatives = derivatives;
        return _colour;
    }
    void lockTiles() const override {}
    void releaseTiles() const override {}
    mutable int _lookups = 0;
    mutable GePoint2<double> _lastTexCoord;
    mutable GeLinearMatrix2<double> _lastDerivatives;

private:
    Rgba _colour;
};

// A map of the given weight whose samplers are ConstantSamplers; with handOutNone it answers a
// null sampler, as a faulty host map might.
class ConstantParams : public SdTextureParams {
public:
    explicit ConstantParams(const Rgba& colour, float weight = 1.0f, bool handOutNone = false)
        : _colour(colour), _handOutNone(handOutNone) {
        _weight = weight;
    }
    OPtr<SdTextureSampler> createSampler() const override {
        return _handOutNone ? OPtr<SdTextureSampler>() : makeOwned<ConstantSampler>(_colour);
    }

private:
    Rgba _colour;
    bool _handOutNone;
};

// ---- The rasterizer's fill rule ------------------------------------------------------------------
//
// Test vertices lie on a grid of 1/256 pixel (Pt holds integers in that unit), exact in float and
// double. The reference works in the rasterizer's walking frame, where samples lie on the
// integers: w = (x - regionOrigin) * 2^bits - 1/2, held exactly as integers in units of 1/512.

using i64 = std::int64_t;
constexpr i64 kPixelUnit = 256;
constexpr i64 kWalkUnit = 512;

struct Pt {
    i64 x, y;
};

inline double toPixels(i64 v) { return static_cast<double>(v) / kPixelUnit; }
inline i64 floorDiv(i64 a, i64 b) { return a >= 0 ? a / b : -((-a + b - 1) / b); }
inline i64 ceilDiv(i64 a, i64 b) { return -floorDiv(-a, b); }
// The walking-frame coordinate, in kWalkUnit, of an absolute coordinate in 1/256 pixel.
inline i64 walk(i64 v, int origin, int bits) { return 2 * (v - kPixelUnit * origin) * (i64(1) << bits) - kPixelUnit; }

// A random position in [lo, hi) pixels on the 1/256 grid.
inline i64 randomCoord(std::mt19937& rng, double lo, double hi) {
    return std::uniform_int_distribution<i64>(static_cast<i64>(lo * kPixelUnit),
                                              static_cast<i64>(hi * kPixelUnit) - 1)(rng);
}

// A vertex of the given kind at p; 3D kinds get w = 1 and depth z.
template <class Vertex>
Vertex makeVertex(Pt p, double z = 0.0) {
    Vertex v{};
    if constexpr (std::is_same_v<Vertex, Rs2DVertex>) {
        v._x = static_cast<float>(toPixels(p.x));
        v._y = static_cast<float>(toPixels(p.y));
    } else {
        v._pixCoord = GeHomogeneousCoord3<double>(toPixels(p.x), toPixels(p.y), z, 1.0);
        v._w = 1.0;
    }
    return v;
}

// The fill rule in exact arithmetic, by edge functions: a sample is covered when it lies strictly
// inside all three edges, or on an edge that is a left edge or a top edge.
class ReferenceTriangle {
public:
    ReferenceTriangle(Pt a, Pt b, Pt c, int originX, int originY, int xBits, int yBits)
        : _v{{walk(a.x, originX, xBits), walk(a.y, originY, yBits)},
             {walk(b.x, originX, xBits), walk(b.y, originY, yBits)},
             {walk(c.x, originX, xBits), walk(c.y, originY, yBits)}} {
        const i64 area = edge(_v[0], _v[1], _v[2]);
        if (area < 0) std::swap(_v[1], _v[2]);
        _valid = area != 0;
    }
    bool isValid() const { return _valid; }

    // Sample (sx, sy): region-relative sample indices.
    bool covers(i64 sx, i64 sy) const {
        if (!_valid) return false;
        const Pt p{sx * kWalkUnit, sy * kWalkUnit};
        for (int i = 0; i < 3; ++i) {
            const Pt& a = _v[i];
            const Pt& b = _v[(i + 1) % 3];
            const i64 e = edge(a, b, p);
            // With the interior on the positive side, an edge going up has it on its right (a left
            // edge); a horizontal edge going right has it below (a top edge).
            if (e < 0 || (e == 0 && !(b.y < a.y || (b.y == a.y && b.x > a.x)))) return false;
        }
        return true;
    }

    // The sample rows and columns that can be covered: [rowBegin, rowEnd) x [colBegin, colEnd).
    i64 rowBegin() const { return ceilDiv(std::min({_v[0].y, _v[1].y, _v[2].y}), kWalkUnit); }
    i64 rowEnd() const { return ceilDiv(std::max({_v[0].y, _v[1].y, _v[2].y}), kWalkUnit); }
    i64 colBegin() const { return ceilDiv(std::min({_v[0].x, _v[1].x, _v[2].x}), kWalkUnit); }
    i64 colEnd() const { return ceilDiv(std::max({_v[0].x, _v[1].x, _v[2].x}), kWalkUnit) + 1; }

private:
    static i64 edge(const Pt& a, const Pt& b, const Pt& p) {
        return (b.x - a.x) * (p.y - a.y) - (b.y - a.y) * (p.x - a.x);
    }
    Pt _v[3];
    bool _valid;
};

// A buffer that records what the rasterizer delivers: a count per sample at the span's grain,
// every delivery if asked, and a per-pixel hook that sees the pixel data stepped along the span.
//
// Sub-pixel spans are read the way an A-buffer reads them: pixels from the one holding _minX1
// while below _maxX2, each sample tested against its sub-scanline's ends; a pixel that such a
// consumer would take as interior (inside [_maxX1, _minX2) on every sub-scanline) must be covered
// whole.
template <class Vertex, class PixelSpan>
class RecordingBuffer {
public:
    struct Context {
        int tag = 0;
    };
    using PixelData = RsPixelData<Vertex>;
    using Rasterizer = RsRasterizer<RecordingBuffer, Vertex, PixelSpan>;
    static constexpr int kXBits = PixelSpan::kSubPixelBits;
    static constexpr int kYBits = PixelSpan::kSubScanlineBits;
    struct Delivery {
        int row;
        PixelSpan span;
    };

    explicit RecordingBuffer(GeRectangle<int> region)
        : _samplesX(region.getWidth() << kXBits), _samplesY(region.getHeight() << kYBits),
          _counts(static_cast<std::size_t>(_samplesX) * _samplesY, 0) {}

    void drawSpan(const Context& context, int row, const PixelSpan& span, PixelData& data) {
        if (_expectedContext && &context != _expectedContext) ++_errors;
        if (_keepDeliveries) _deliveries.push_back({row, span});
        if (_pendingFirstRow) _rowOffset = *_pendingFirstRow - row;
        _pendingFirstRow.reset();
        row += _rowOffset;
        if constexpr (kXBits == 0) {
            for (int x = span._x1; x < span._x2; ++x, data.stepX()) {
                hit(x, row);
                if (_onPixel) _onPixel(x, row, data);
            }
        } else {
            constexpr int kCells = 1 << kXBits, kRows = 1 << kYBits;
            const bool allRows = span._x1[0] != -1 && span._x1[kRows - 1] != -1;
            for (int px = (span._minX1 >> kXBits) << kXBits; px < span._maxX2; px += kCells, data.stepX()) {
                int covered = 0;
                for (int r = 0; r < kRows; ++r)
                    for (int s = px; s < px + kCells; ++s)
                        if (span._x1[r] <= s && s < span._x2[r]) hit(s, (row << kYBits) + r), ++covered;
                if (allRows && px >= span._maxX1 && px + kCells <= (span._minX2 & ~(kCells - 1)) &&
                    covered != kCells * kRows)
                    ++_errors;
                if (_onPixel) _onPixel(px >> kXBits, row, data);
            }
        }
    }

    int count(int sx, int sy) const { return _counts[static_cast<std::size_t>(sy) * _samplesX + sx]; }
    void clear() {
        std::fill(_counts.begin(), _counts.end(), 0);
        _deliveries.clear();
        _errors = _hits = 0;
    }
    // For spans whose delivered rows are not their true rows (8 x 4 cells): the next span lies at
    // true pixel row trueRow, and the following ones keep the same offset.
    void expectFirstRow(int trueRow) { _pendingFirstRow = trueRow; }

    int _samplesX, _samplesY;
    std::vector<int> _counts;
    long _hits = 0;
    long _errors = 0;  // samples out of range, uncovered interior pixels, wrong contexts
    bool _keepDeliveries = false;
    std::vector<Delivery> _deliveries;
    const Context* _expectedContext = nullptr;
    std::function<void(int, int, const PixelData&)> _onPixel;

private:
    void hit(int sx, int sy) {
        if (sx < 0 || sy < 0 || sx >= _samplesX || sy >= _samplesY) {
            ++_errors;
            return;
        }
        ++_counts[static_cast<std::size_t>(sy) * _samplesX + sx];
        ++_hits;
    }
    std::optional<int> _pendingFirstRow;
    int _rowOffset = 0;
};

// A recording buffer with its rasterizer over a region, drawing triangles given on the test grid.
template <class Vertex, class PixelSpan>
class Harness {
public:
    using Buffer = RecordingBuffer<Vertex, PixelSpan>;
    static constexpr int kXBits = PixelSpan::kSubPixelBits;
    static constexpr int kYBits = PixelSpan::kSubScanlineBits;
    static constexpr bool kSubPixel = kXBits != 0;

    // Spans whose rows are not delivered at their place (8 x 4 cells) can only be put back by the
    // buffer when a triangle arrives in one block: they get a block of 4096 rows.
    Harness(GeRectangle<int> region, int blockWidth, int blockHeight)
        : _region(region), _buffer(region),
          _rasterizer(_buffer, &Buffer::drawSpan, region, blockWidth, kXBits != kYBits ? 4096 : blockHeight) {
        _buffer._expectedContext = &_context;
    }

    ReferenceTriangle reference(Pt a, Pt b, Pt c) const {
        return ReferenceTriangle(a, b, c, _region.x0, _region.y0, kXBits, kYBits);
    }
    void draw(Pt a, Pt b, Pt c) {
        if constexpr (kXBits != kYBits)
            _buffer.expectFirstRow(static_cast<int>(floorDiv(reference(a, b, c).rowBegin(), i64(1) << kYBits)));
        _rasterizer.rasterizeTriangle(_context, makeVertex<Vertex>(a), makeVertex<Vertex>(b), makeVertex<Vertex>(c));
    }

    GeRectangle<int> _region;
    Buffer _buffer;
    typename Buffer::Rasterizer _rasterizer;
    typename Buffer::Context _context{7};
};

// ---- The anti-aliased reference ----------------------------------------------------------------
//
// Each pixel has 16 samples: sample i at ((kPattern[i] + 0.5) / 16, (i + 0.5) / 16) from its
// corner, that is on the sub-pixel grid of the rasterizer's 16 x 16 cells at column kPattern[i] of
// row i. A grid of premultiplied sample colours over a rectangle is filtered into pixels by
// weighting every sample within the kernel's reach by the kernel at its position seen from the
// output pixel, in double, divided by the sum of all those weights.

inline constexpr int kPattern[16] = {13, 8, 1, 4, 9, 12, 5, 0, 15, 10, 3, 6, 11, 14, 7, 2};

struct SampleGrid {
    explicit SampleGrid(const GeRectangle<int>& r) : rect(r), samples(std::size_t(r.getArea()) * 16) {}
    Rgba& at(int x, int y, int i) {
        return samples[(std::size_t(y - rect.y0) * rect.getWidth() + std::size_t(x - rect.x0)) * 16 + i];
    }
    GeRectangle<int> rect;
    std::vector<Rgba> samples;
};

// Output pixel (x, y), premultiplied; the grid must hold every pixel within the kernel's reach.
inline Rgba filterAt(SampleGrid& grid, const RsFilterKernel& kernel, int x, int y) {
    const int s = kernel.getKernelSupport();
    double sum[4] = {0, 0, 0, 0}, total = 0;
    for (int dy = -s; dy <= s; ++dy)
        for (int dx = -s; dx <= s; ++dx)
            for (int i = 0; i < 16; ++i) {
                const double w = kernel.evaluateKernel(float(dx) + (kPattern[i] + 0.5f) / 16, float(dy) + (i + 0.5f) / 16);
                const Rgba& c = grid.at(x + dx, y + dy, i);
                total += w;
                sum[0] += w * c.r, sum[1] += w * c.g, sum[2] += w * c.b, sum[3] += w * c.a;
            }
    return Rgba(float(sum[0] / total), float(sum[1] / total), float(sum[2] / total), float(sum[3] / total));
}

inline Rgba premultiplied(const Rgba& c) { return Rgba(c.r * c.a, c.g * c.a, c.b * c.a, c.a); }
inline Rgba straight(const Rgba& c) {
    const float f = std::fabs(c.a) <= 1e-8f ? 0.0f : 1.0f / c.a;
    return Rgba(c.r * f, c.g * f, c.b * f, c.a);
}

// A triangle of the screen: corners on the 1/256 pixel grid with their pixel depths, and its colour.
struct ScreenTriangle {
    Pt a, b, c;
    double za, zb, zc;
    Rgba colour;
    SdMaterial::TransferMode mode;

    // The depth of the triangle's plane at pixel position (x, y).
    double depthAt(double x, double y) const {
        const double ax = toPixels(a.x), ay = toPixels(a.y);
        const double ux = toPixels(b.x) - ax, uy = toPixels(b.y) - ay, vx = toPixels(c.x) - ax, vy = toPixels(c.y) - ay;
        const double det = ux * vy - uy * vx, px = x - ax, py = y - ay;
        const double s = (px * vy - py * vx) / det, t = (ux * py - uy * px) / det;
        return za + s * (zb - za) + t * (zc - za);
    }
};

// The samples of grid.rect seen through triangles given in drawing order, over the straight start
// colour. byDepth: at each sample, the triangles that cover it are laid far to near by their depth
// there; otherwise the last drawn lies farthest. False when two triangles at a sample lie within
// 1e-9 of each other in depth, which no render is asked to tell apart.
inline bool renderSamples(const std::vector<ScreenTriangle>& triangles, bool byDepth, const Rgba& start,
                          SampleGrid& grid) {
    std::vector<ReferenceTriangle> coverage;
    for (const ScreenTriangle& t : triangles) coverage.emplace_back(t.a, t.b, t.c, 0, 0, 4, 4);
    for (int y = grid.rect.y0; y < grid.rect.y1; ++y)
        for (int x = grid.rect.x0; x < grid.rect.x1; ++x)
            for (int i = 0; i < 16; ++i) {
                std::vector<std::pair<double, std::size_t>> here;  // (depth or drawing order, triangle)
                for (std::size_t k = 0; k < triangles.size(); ++k)
                    if (coverage[k].covers(i64(x) * 16 + kPattern[i], i64(y) * 16 + i))
                        here.push_back({byDepth ? triangles[k].depthAt(x + (kPattern[i] + 0.5) / 16, y + (i + 0.5) / 16)
                                                : double(k),
                                        k});
                std::sort(here.rbegin(), here.rend());
                for (std::size_t k = 1; k < here.size(); ++k)
                    if (here[k - 1].first - here[k].first < 1e-9) return false;
                Rgba colour = premultiplied(start);
                for (const auto& [key, k] : here) {
                    Rgba result;
                    RsTransferFunc::getFunction(triangles[k].mode)(triangles[k].colour, colour, result);
                    colour = result;
                }
                grid.at(x, y, i) = colour;
            }
    return true;
}

// Counts interrupt checks, and throws a cancel at the check numbered throwAt (1-based) if set.
class CountingInterruptHandler : public PxInterruptHandler {
public:
    void onInterruptCheck() override {
        if (++_checks == _throwAt) throw ExRenderCancelled("test cancel");
    }
    long _checks = 0;
    long _throwAt = -1;
};

// Installs a handler on the request manager for the lifetime of the scope.
class InterruptHandlerScope {
public:
    explicit InterruptHandlerScope(const RCShdPtr<PxInterruptHandler>& h) {
        PxRequestMgr::getInstance()->setInterruptHandler(h);
    }
    ~InterruptHandlerScope() { PxRequestMgr::getInstance()->setInterruptHandler(nullptr); }
    InterruptHandlerScope(const InterruptHandlerScope&) = delete;
    InterruptHandlerScope& operator=(const InterruptHandlerScope&) = delete;
};

// ---- Closed forms of what a pixel sees --------------------------------------------------------

// The camera-space direction of the ray through the centre of pixel (x, y) of rectangle, for a
// projection whose x and y rows are diagonal (such as perspective): ndc = (pixel - centre) / half.
inline GeVector3<double> rayThroughPixel(const GeProjectiveMatrix3<double>& projection,
                                         const GeRectangle<int>& rectangle, int x, int y) {
    const double sx = (rectangle.x1 - rectangle.x0) * 0.5, sy = (rectangle.y1 - rectangle.y0) * 0.5;
    const double nx = (x + 0.5 - rectangle.x0 - sx) / sx, ny = (y + 0.5 - rectangle.y0 - sy) / sy;
    return {nx / projection(0, 0), ny / projection(1, 1), -1.0};
}

// Where the ray from eye along d first meets the sphere of centre c and radius r, in units of d
// ahead; -1 for a miss.
inline double raySphere(const GePoint3<double>& eye, const GeVector3<double>& d, const GePoint3<double>& c, double r) {
    const GeVector3<double> o = eye - c;
    const double a = d.dot(d), b = o.dot(d), disc = b * b - a * (o.dot(o) - r * r);
    if (disc < 0) return -1;
    const double t = (-b - std::sqrt(disc)) / a;
    return t > 0 ? t : -1;
}

// The picture position (x, y in pixels, centre of pixel (i, j) at i + 0.5, j + 0.5) of a
// camera-space point, for a projection of diagonal x and y rows and w = -z (such as perspective):
// the inverse of rayThroughPixel.
inline GePoint2<double> pixelOfPoint(const GeProjectiveMatrix3<double>& projection, const GeRectangle<int>& rectangle,
                                     const GePoint3<double>& p) {
    const double sx = (rectangle.x1 - rectangle.x0) * 0.5, sy = (rectangle.y1 - rectangle.y0) * 0.5;
    return {rectangle.x0 + sx * (1 + projection(0, 0) * p.x / -p.z),
            rectangle.y0 + sy * (1 + projection(1, 1) * p.y / -p.z)};
}

// count rectangles of pixels of a w x h view, each drawn at random, at the distinct depths -1,
// -1 - step, -1 - 2 step, ... in random order.
struct LayerRect {
    GeRectangle<int> pixels;
    float z;
};
inline std::vector<LayerRect> randomLayerRects(std::mt19937& rng, int count, float step, int w, int h) {
    std::vector<float> depths;
    for (int i = 0; i < count; ++i) depths.push_back(-1.0f - step * float(i));
    std::shuffle(depths.begin(), depths.end(), rng);
    std::vector<LayerRect> rects;
    for (float z : depths) {
        const int x0 = int(rng() % w), x1 = x0 + 1 + int(rng() % (w - x0));
        const int y0 = int(rng() % h), y1 = y0 + 1 + int(rng() % (h - y0));
        rects.push_back({{x0, x1, y0, y1}, z});
    }
    return rects;
}

// Deep samples (nearest first, premultiplied) laid front to back with "over".
inline Rgba flattenFrontToBack(const float* samples, std::size_t count, std::size_t stride) {
    double r = 0, g = 0, b = 0, a = 0;
    for (std::size_t i = 0; i < count; ++i) {
        const float* s = samples + i * stride;
        r += (1 - a) * s[0];
        g += (1 - a) * s[1];
        b += (1 - a) * s[2];
        a += (1 - a) * s[3];
    }
    return Rgba(float(r), float(g), float(b), float(a));
}

// ---- Flat 2D fills -------------------------------------------------------------------------------
//
// The picture that a 2D fill leaves, from its documented parts: the fill rule (whole pixels, or
// 8 x 4 samples), the coverage masks whose right end counts the sample it lands on, the rows at
// which 8 x 4 spans arrive, and the write formulas per format and mode. Triangles lie inside the
// tile, on the 1/256 grid.

// Bits of one channel after a fill of colour at the given coverage (1 for plain triangles) over a
// channel holding old: rgbaIndex says which channel of the colour it is (3 for alpha).
inline std::uint32_t filledChannel(int depth, bool blending, const Rgba& colour, float coverage, int rgbaIndex,
                                   std::uint32_t old) {
    const float alpha = colour.a * coverage;
    if (!blending) return floatToBits(depth, rgbaIndex == 3 ? alpha : channelOf(colour, rgbaIndex));
    const float source = rgbaIndex == 3 ? alpha : channelOf(colour, rgbaIndex) * alpha;
    const float keep = 1.0f - alpha;
    if (depth == 8) return std::uint32_t(std::clamp(int(source * 255.0f + float(old) * keep), 0, 255));
    if (depth == 16)
        return IxPixelConvert::floatToHalf(source + IxPixelConvert::halfToFloat(std::uint16_t(old)) * keep);
    return std::bit_cast<std::uint32_t>(source + std::bit_cast<float>(old) * keep);
}

// The tile's channels as raw bits, changed as fills would change them.
class FillReference {
public:
    explicit FillReference(const IxWriteGuard& g) : _g(g), _r(g._rectangle), _comps(g._pixelFormat._comps) {
        for (int y = _r.y0; y < _r.y1; ++y)
            for (int x = _r.x0; x < _r.x1; ++x)
                for (int c = 0; c < _comps; ++c) _bits.push_back(rawChannel(g, x, y, c));
    }

    void fillPlain(Pt a, Pt b, Pt c, const Rgba& colour, bool blending) {
        const ReferenceTriangle t(a, b, c, _r.x0, _r.y0, 0, 0);
        for (i64 y = t.rowBegin(); y < t.rowEnd(); ++y)
            for (i64 x = t.colBegin(); x < t.colEnd(); ++x)
                if (t.covers(x, y)) write(int(x), int(y), colour, 1.0f, blending);
    }

    // Anti-aliased: per sub-scanline the start x1 and end x2 of the exact fill rule (ceilings of
    // the edges' crossings, also where they meet); per pixel row the pixels from the smallest start
    // to the largest end, each with its mask; the row moved as the 8 x 4 spans are delivered, in
    // blocks of blockHeight pixel rows, and dropped when it leaves the tile.
    void fillAA(Pt a, Pt b, Pt c, const Rgba& colour, bool blending, int blockHeight) {
        const Pt w[3] = {toWalk(a), toWalk(b), toWalk(c)};
        const i64 top = ceilDiv(std::min({w[0].y, w[1].y, w[2].y}), kWalkUnit);
        const i64 end = ceilDiv(std::max({w[0].y, w[1].y, w[2].y}), kWalkUnit);
        const i64 sideA = (w[1].x - w[0].x) * (w[2].y - w[0].y) - (w[1].y - w[0].y) * (w[2].x - w[0].x);
        if (top == end || sideA == 0) return;
        const i64 firstRow = floorDiv(top, 4), lastRow = floorDiv(end - 1, 4);
        for (i64 row = firstRow; row <= lastRow; ++row) {
            i64 x1[4], x2[4], minX1 = INT64_MAX, maxX2 = INT64_MIN;
            for (int r = 0; r < 4; ++r) {
                const i64 sy = 4 * row + r;
                x1[r] = x2[r] = -1;
                if (sy < top || sy >= end) continue;
                x1[r] = INT64_MAX;
                x2[r] = INT64_MIN;
                for (int e = 0; e < 3; ++e) {
                    const Pt& p = w[e];
                    const Pt& q = w[(e + 1) % 3];
                    const i64 y = sy * kWalkUnit;
                    if (p.y == q.y || y < std::min(p.y, q.y) || y > std::max(p.y, q.y)) continue;
                    const i64 den = q.y - p.y, num = p.x * den + (q.x - p.x) * (y - p.y);
                    const i64 x = den > 0 ? ceilDiv(num, den * kWalkUnit) : ceilDiv(-num, -den * kWalkUnit);
                    x1[r] = std::min(x1[r], x), x2[r] = std::max(x2[r], x);
                }
                minX1 = std::min(minX1, x1[r]), maxX2 = std::max(maxX2, x2[r]);
            }
            const i64 blockLast = std::min(firstRow + ((row - firstRow) / blockHeight + 1) * blockHeight - 1, lastRow);
            const i64 delivered = row - blockLast + floorDiv(blockLast, 2);
            if (delivered < 0 || delivered >= _r.getHeight()) continue;
            for (i64 px = floorDiv(minX1, 8); 8 * px < maxX2; ++px) {
                int samples = 0;
                for (int r = 0; r < 4; ++r)
                    for (i64 s = 8 * px; s < 8 * px + 8; ++s) samples += x1[r] != -1 && x1[r] <= s && s <= x2[r];
                write(int(px), int(delivered), colour, float(samples) * 0.03125f, blending);
            }
        }
    }

    void expectEqual(const std::string& where) const {
        std::size_t i = 0;
        for (int y = _r.y0; y < _r.y1; ++y)
            for (int x = _r.x0; x < _r.x1; ++x)
                for (int c = 0; c < _comps; ++c, ++i)
                    ASSERT_EQ(rawChannel(_g, x, y, c), _bits[i])
                        << where << " pixel " << x << ", " << y << " channel " << c;
    }

private:
    Pt toWalk(Pt p) const { return {walk(p.x, _r.x0, 3), walk(p.y, _r.y0, 2)}; }
    // Pixel (x, y) relative to the tile.
    void write(int x, int y, const Rgba& colour, float coverage, bool blending) {
        std::uint32_t* p = &_bits[(std::size_t(y) * _r.getWidth() + x) * _comps];
        for (int c = 0; c < _comps; ++c)
            p[c] = filledChannel(_g._pixelFormat._depth, blending, colour, coverage, rgbaIndexOf(_comps, c), p[c]);
    }
    IxWriteGuard _g;
    GeRectangle<int> _r;
    int _comps;
    std::vector<std::uint32_t> _bits;
};

// ---- Random views ------------------------------------------------------------------------------

// A random rigid move: a translation of up to 5 along each axis after a rotation of up to 3
// radians about a random axis; unit draws in -1..1.
inline GeAffineMatrix3<float> randomMove(std::mt19937& rng, std::uniform_real_distribution<float>& unit) {
    return GeAffineMatrix3<float>::makeTranslation({5 * unit(rng), 5 * unit(rng), 5 * unit(rng)}) *
           GeAffineMatrix3<float>::makeRotation({unit(rng), unit(rng), unit(rng)}, 3 * unit(rng));
}

// A perspective frustum from 1 to farDistance whose sides lie up to 0.3 away from -1 and 1; unit
// draws in -1..1.
inline GeProjectiveMatrix3<float> randomFrustum(std::mt19937& rng, std::uniform_real_distribution<float>& unit,
                                                float farDistance) {
    return GeCameraBuilder<float>::makeFrustum(-1 + 0.3f * unit(rng), 1 + 0.3f * unit(rng), -1 + 0.3f * unit(rng),
                                               1 + 0.3f * unit(rng), 1, farDistance);
}

}  // namespace Zr::RsTest
