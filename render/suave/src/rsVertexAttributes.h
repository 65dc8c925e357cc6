#pragma once
// Operations on all attributes of a 3D vertex at once, written once for every vertex kind: which
// attributes a kind has is asked at compile time, so a kind pays only for its own fields.
//
// - rsMixVertex: the weighted sum of two vertices, in double. It serves the polygon clipper (a
//   new vertex on a clipping plane) and the wire ring (inner vertices moved towards the opposite
//   corner). _w is left alone: before the perspective division it holds nothing.
// - rsDivideVertex: the perspective division. _pixCoord becomes (x/w, y/w, z/w, w/w), every
//   other attribute is multiplied by 1/w, which is stored in _w, so that all of them interpolate
//   linearly over the screen; the depth offset is added to the divided pixel z.
#include "geHomogeneousCoord3.h"
#include "gePoint3.h"

namespace Zr {

template <class V>
concept RsHasEyeCoord = requires(V v) { v._eyeCoord; };
template <class V>
concept RsHasEyeZ = requires(V v) { v._eyeZ; };
template <class V>
concept RsHasNormal = requires(V v) { v._normal; };
template <class V>
concept RsHasTangentFrame = requires(V v) {
    v._binormal;
    v._tangent;
};
template <class V>
concept RsHasTexCoord = requires(V v) { v._texCoord; };

inline GePoint3<double> rsMixPoint(const GePoint3<double>& a, double wa, const GePoint3<double>& b,
                                   double wb) {
    return {a.x * wa + b.x * wb, a.y * wa + b.y * wb, a.z * wa + b.z * wb};
}

inline GePoint3<double> rsScalePoint(const GePoint3<double>& p, double s) {
    return {p.x * s, p.y * s, p.z * s};
}

// out = wa * a + wb * b for every attribute but _w. out may be a or b.
template <class V>
void rsMixVertex(V& out, const V& a, double wa, const V& b, double wb) {
    const GeHomogeneousCoord3<double>& pa = a._pixCoord;
    const GeHomogeneousCoord3<double>& pb = b._pixCoord;
    out._pixCoord = GeHomogeneousCoord3<double>(pa.x * wa + pb.x * wb, pa.y * wa + pb.y * wb,
                                                pa.z * wa + pb.z * wb, pa.w * wa + pb.w * wb);
    if constexpr (RsHasEyeCoord<V>) out._eyeCoord = rsMixPoint(a._eyeCoord, wa, b._eyeCoord, wb);
    if constexpr (RsHasEyeZ<V>) out._eyeZ = a._eyeZ * wa + b._eyeZ * wb;
    if constexpr (RsHasNormal<V>) out._normal = rsMixPoint(a._normal, wa, b._normal, wb);
    if constexpr (RsHasTangentFrame<V>) {
        out._binormal = rsMixPoint(a._binormal, wa, b._binormal, wb);
        out._tangent = rsMixPoint(a._tangent, wa, b._tangent, wb);
    }
    if constexpr (RsHasTexCoord<V>) out._texCoord = rsMixPoint(a._texCoord, wa, b._texCoord, wb);
}

// The perspective division of a vertex whose _pixCoord w is positive, then the depth offset.
template <class V>
void rsDivideVertex(V& v, float depthOffset) {
    const double invW = 1.0 / v._pixCoord.w;
    v._pixCoord = GeHomogeneousCoord3<double>(v._pixCoord.x * invW, v._pixCoord.y * invW,
                                              v._pixCoord.z * invW, v._pixCoord.w * invW);
    if constexpr (RsHasEyeCoord<V>) v._eyeCoord = rsScalePoint(v._eyeCoord, invW);
    if constexpr (RsHasEyeZ<V>) v._eyeZ *= invW;
    if constexpr (RsHasNormal<V>) v._normal = rsScalePoint(v._normal, invW);
    if constexpr (RsHasTangentFrame<V>) {
        v._binormal = rsScalePoint(v._binormal, invW);
        v._tangent = rsScalePoint(v._tangent, invW);
    }
    if constexpr (RsHasTexCoord<V>) v._texCoord = rsScalePoint(v._texCoord, invW);
    v._w = invW;
    v._pixCoord.z += depthOffset;
}

}  // namespace Zr
