#pragma once
// The attributes of a triangle at the current pixel, as planes over the screen. A buffer's span
// method reads _q of the fields its vertex kind has and calls stepX() once per pixel; the
// rasterizer places the data at the first pixel of each span it delivers.
//
// The fields are always these, in this order and by these names; each is an RsInterpolant when the
// vertex kind carries the attribute and an RsNoInterpolant (no storage, no operations) when it
// does not, so that an attribute a kind lacks costs neither memory, nor set-up, nor stepping.
//
// _w, _eyeZ, _eyeCoord, _texCoord, _normal, _binormal and _tangent hold the attribute multiplied
// by _w (the vertices carry them so after the perspective division), which makes their linear
// interpolation over the screen perspective correct. _z, the pixel depth, is itself linear in the
// screen and is read as it stands.
#include <ostream>
#include <type_traits>

#include "gePoint2.h"
#include "gePoint3.h"
#include "rsGradientBlock.h"
#include "rsInterpolant.h"
#include "rsShadingContext.h"
#include "rsVertices.h"

namespace Zr {

// The attributes a vertex kind carries into the pixel data, as a set of bits.
enum RsAttribute : unsigned {
    RS_ATTR_W = 0x01,
    RS_ATTR_Z = 0x02,
    RS_ATTR_EYE_Z = 0x04,
    RS_ATTR_EYE_COORD = 0x08,
    RS_ATTR_TEX_COORD = 0x10,
    RS_ATTR_NORMAL = 0x20,
    RS_ATTR_BINORMAL = 0x40,
    RS_ATTR_TANGENT = 0x80,
};

template <class Vertex>
inline constexpr unsigned rsVertexAttributes = 0;
template <>
inline constexpr unsigned rsVertexAttributes<RsDepthVertex> = RS_ATTR_W | RS_ATTR_EYE_Z;
template <>
inline constexpr unsigned rsVertexAttributes<RsPlainVertex> =
    RS_ATTR_W | RS_ATTR_Z | RS_ATTR_EYE_COORD | RS_ATTR_TEX_COORD;
template <>
inline constexpr unsigned rsVertexAttributes<RsNormalVertex> =
    rsVertexAttributes<RsPlainVertex> | RS_ATTR_NORMAL;
template <>
inline constexpr unsigned rsVertexAttributes<RsTangentVertex> =
    rsVertexAttributes<RsNormalVertex> | RS_ATTR_BINORMAL | RS_ATTR_TANGENT;
template <>
inline constexpr unsigned rsVertexAttributes<Rs2DVertex> = 0;

template <class Vertex>
struct RsPixelData : RsGradientBlock {
    static constexpr unsigned kAttributes = rsVertexAttributes<Vertex>;
    static constexpr bool kHasW = (kAttributes & RS_ATTR_W) != 0;
    static constexpr bool kHasZ = (kAttributes & RS_ATTR_Z) != 0;
    static constexpr bool kHasEyeZ = (kAttributes & RS_ATTR_EYE_Z) != 0;
    static constexpr bool kHasEyeCoord = (kAttributes & RS_ATTR_EYE_COORD) != 0;
    static constexpr bool kHasTexCoord = (kAttributes & RS_ATTR_TEX_COORD) != 0;
    static constexpr bool kHasNormal = (kAttributes & RS_ATTR_NORMAL) != 0;
    static constexpr bool kHasBinormal = (kAttributes & RS_ATTR_BINORMAL) != 0;
    static constexpr bool kHasTangent = (kAttributes & RS_ATTR_TANGENT) != 0;

    template <bool Has, class T, int Slot>
    using Field = std::conditional_t<Has, RsInterpolant<T>, RsNoInterpolant<Slot>>;

    [[no_unique_address]] Field<kHasW, double, 0> _w;
    [[no_unique_address]] Field<kHasZ, double, 1> _z;
    [[no_unique_address]] Field<kHasEyeZ, double, 2> _eyeZ;
    [[no_unique_address]] Field<kHasEyeCoord, GePoint3<float>, 3> _eyeCoord;
    [[no_unique_address]] Field<kHasTexCoord, GePoint2<double>, 4> _texCoord;
    [[no_unique_address]] Field<kHasNormal, GePoint3<float>, 5> _normal;
    [[no_unique_address]] Field<kHasBinormal, GePoint3<float>, 6> _binormal;
    [[no_unique_address]] Field<kHasTangent, GePoint3<float>, 7> _tangent;

    RsPixelData() = default;

    // The planes of the triangle v0, v1, v2 (after the perspective division). origin is v0 relative
    // to the region origin, in pixels; _q is left at 0 until the data is placed.
    // needed is the material's needed-context mask: the planes of the eye position and of the
    // texture coordinates are set up only when it asks for them, and are zero otherwise, as
    // nothing reads them then.
    RsPixelData(const GePoint2<double>& origin, const Vertex& v0, const Vertex& v1, const Vertex& v2,
                unsigned int needed = ~0u)
        : RsGradientBlock(static_cast<double>(v0.pixelX()), static_cast<double>(v0.pixelY()),
                          static_cast<double>(v1.pixelX()), static_cast<double>(v1.pixelY()),
                          static_cast<double>(v2.pixelX()), static_cast<double>(v2.pixelY())) {
        const double ox = origin.x;
        const double oy = origin.y;
        const float oxf = static_cast<float>(ox);
        const float oyf = static_cast<float>(oy);
        if constexpr (kHasW) _w.setup(*this, v0._w, v1._w, v2._w, ox, oy);
        if constexpr (kHasZ) {
            _z.setup(*this, v0._pixCoord.z, v1._pixCoord.z, v2._pixCoord.z, ox, oy);
            _z.setupSlope();
        }
        if constexpr (kHasEyeZ) _eyeZ.setup(*this, v0._eyeZ, v1._eyeZ, v2._eyeZ, ox, oy);
        if constexpr (kHasEyeCoord) {
            if ((needed & RsShadingContext::needsEyeCoord) != 0)
                _eyeCoord.setup(*this, toFloat(v0._eyeCoord), toFloat(v1._eyeCoord), toFloat(v2._eyeCoord),
                                oxf, oyf);
            else
                _eyeCoord = {};
        }
        if constexpr (kHasTexCoord) {
            if ((needed & RsShadingContext::needsTexCoord) != 0)
                _texCoord.setup(*this, toPlane(v0._texCoord), toPlane(v1._texCoord), toPlane(v2._texCoord),
                                ox, oy);
            else
                _texCoord = {};
        }
        if constexpr (kHasNormal)
            _normal.setup(*this, toFloat(v0._normal), toFloat(v1._normal), toFloat(v2._normal), oxf, oyf);
        if constexpr (kHasBinormal)
            _binormal.setup(*this, toFloat(v0._binormal), toFloat(v1._binormal), toFloat(v2._binormal),
                            oxf, oyf);
        if constexpr (kHasTangent)
            _tangent.setup(*this, toFloat(v0._tangent), toFloat(v1._tangent), toFloat(v2._tangent),
                           oxf, oyf);
    }

    // Places every field at pixel (x, y), region-relative, that is at the pixel's centre.
    void place(int x, int y) {
        const float cx = static_cast<float>(x) + 0.5f;
        const float cy = static_cast<float>(y) + 0.5f;
        if constexpr (kHasW) _w.place(cx, cy);
        if constexpr (kHasZ) _z.place(cx, cy);
        if constexpr (kHasEyeZ) _eyeZ.place(cx, cy);
        if constexpr (kHasEyeCoord) _eyeCoord.place(cx, cy);
        if constexpr (kHasTexCoord) _texCoord.place(cx, cy);
        if constexpr (kHasNormal) _normal.place(cx, cy);
        if constexpr (kHasBinormal) _binormal.place(cx, cy);
        if constexpr (kHasTangent) _tangent.place(cx, cy);
    }

    // Moves every field one pixel to the right.
    void stepX() {
        if constexpr (kHasW) _w.step();
        if constexpr (kHasZ) _z.step();
        if constexpr (kHasEyeZ) _eyeZ.step();
        if constexpr (kHasEyeCoord) _eyeCoord.step();
        if constexpr (kHasTexCoord) _texCoord.step();
        if constexpr (kHasNormal) _normal.step();
        if constexpr (kHasBinormal) _binormal.step();
        if constexpr (kHasTangent) _tangent.step();
    }

    void dump(std::ostream& os) const {
        RsGradientBlock::dump(os);
        if constexpr (kHasW) dumpField(os, " _w = [ ", _w);
        if constexpr (kHasZ) dumpField(os, " _z = [ ", _z);
        if constexpr (kHasEyeZ) dumpField(os, " _eyeZ = [ ", _eyeZ);
        if constexpr (kHasEyeCoord) dumpField(os, " _eyeCoord = [ ", _eyeCoord);
        if constexpr (kHasTexCoord) dumpField(os, " _texCoord = [ ", _texCoord);
        if constexpr (kHasNormal) dumpField(os, " _normal = [ ", _normal);
        if constexpr (kHasBinormal) dumpField(os, " _binormal = [ ", _binormal);
        if constexpr (kHasTangent) dumpField(os, " _tangent = [ ", _tangent);
    }

private:
    static GePoint3<float> toFloat(const GePoint3<double>& p) { return GePoint3<float>(p); }
    // Texture coordinates keep their first two components only.
    static GePoint2<double> toPlane(const GePoint3<double>& p) { return {p.x, p.y}; }
    template <class F>
    static void dumpField(std::ostream& os, const char* label, const F& field) {
        os << label;
        field.dump(os);
        os << " ],";
    }
};

// What a kind lacks takes no room: the pixel data is the gradient block plus the planes present.
static_assert(sizeof(RsPixelData<Rs2DVertex>) == sizeof(RsGradientBlock));
static_assert(sizeof(RsPixelData<RsDepthVertex>) ==
              sizeof(RsGradientBlock) + 2 * sizeof(RsInterpolant<double>));

}  // namespace Zr
