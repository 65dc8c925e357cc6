#include "rsVertices.h"

namespace Zr {

void RsDepthVertex::dump(std::ostream& os) const {
    os << " _pixCoord: ";
    _pixCoord.dump(os);
    os << " _eyeZ: " << _eyeZ << " _w: " << _w;
}

void RsPlainVertex::dump(std::ostream& os) const {
    os << " _pixCoord: ";
    _pixCoord.dump(os);
    os << " _eyeCoord: ";
    _eyeCoord.dump(os);
    os << " _texCoord: ";
    _texCoord.dump(os);
    os << " _w: " << _w;
}

void RsNormalVertex::dump(std::ostream& os) const {
    os << " _pixCoord: ";
    _pixCoord.dump(os);
    os << " _eyeCoord: ";
    _eyeCoord.dump(os);
    os << " _normal: ";
    _normal.dump(os);
    os << " _texCoord: ";
    _texCoord.dump(os);
    os << " _w: " << _w;
}

void RsTangentVertex::dump(std::ostream& os) const {
    os << " _pixCoord: ";
    _pixCoord.dump(os);
    os << " _eyeCoord: ";
    _eyeCoord.dump(os);
    os << " _normal: ";
    _normal.dump(os);
    os << " _binormal: ";
    _binormal.dump(os);
    os << " _tangent: ";
    _tangent.dump(os);
    os << " _texCoord: ";
    _texCoord.dump(os);
    os << " _w: " << _w;
}

void Rs2DVertex::dump(std::ostream& os) const { os << " _x: " << _x << " _y: " << _y; }

}  // namespace Zr
