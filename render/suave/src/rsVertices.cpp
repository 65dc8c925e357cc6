#include "rsVertices.h"

#include "rsVertexAttributes.h"

namespace Zr {

namespace {

// Prints the members that a 3D vertex kind has, in the order of its declaration.
template <class V>
void dumpVertex(const V& v, std::ostream& os) {
    os << " _pixCoord: ";
    v._pixCoord.dump(os);
    if constexpr (RsHasEyeCoord<V>) {
        os << " _eyeCoord: ";
        v._eyeCoord.dump(os);
    }
    if constexpr (RsHasEyeZ<V>) os << " _eyeZ: " << v._eyeZ;
    if constexpr (RsHasNormal<V>) {
        os << " _normal: ";
        v._normal.dump(os);
    }
    if constexpr (RsHasTangentFrame<V>) {
        os << " _binormal: ";
        v._binormal.dump(os);
        os << " _tangent: ";
        v._tangent.dump(os);
    }
    if constexpr (RsHasTexCoord<V>) {
        os << " _texCoord: ";
        v._texCoord.dump(os);
    }
    os << " _w: " << v._w;
}

}  // namespace

void RsDepthVertex::dump(std::ostream& os) const { dumpVertex(*this, os); }

void RsPlainVertex::dump(std::ostream& os) const { dumpVertex(*this, os); }

void RsNormalVertex::dump(std::ostream& os) const { dumpVertex(*this, os); }

void RsTangentVertex::dump(std::ostream& os) const { dumpVertex(*this, os); }

void Rs2DVertex::dump(std::ostream& os) const { os << " _x: " << _x << " _y: " << _y; }

}  // namespace Zr
