#pragma once
// The vertex kinds that carry a triangle's attributes to the rasterizer. There is one kind per set
// of attributes that a drawing path needs, so that a cheap material pays for no more than it uses.
//
// The 3D kinds hold 64-bit floats. Before the perspective division _pixCoord is homogeneous and
// _w is unset; after it _pixCoord is (x/w, y/w, z/w, 1), _w is 1/w and every other attribute has
// been multiplied by _w, so that the attributes interpolate linearly over the screen.
//
// Each kind tells the rasterizer where it lies on the screen through Coord, pixelX() and pixelY().
#include <ostream>

#include "geHomogeneousCoord3.h"
#include "gePoint3.h"

namespace Zr {

// Depth maps: the eye-space depth alone.
struct RsDepthVertex {
    using Coord = double;

    GeHomogeneousCoord3<double> _pixCoord;
    double _eyeZ{};
    double _w{};

    Coord pixelX() const { return _pixCoord.x; }
    Coord pixelY() const { return _pixCoord.y; }
    void dump(std::ostream& os) const;
};

// Materials that need no normal.
struct RsPlainVertex {
    using Coord = double;

    GeHomogeneousCoord3<double> _pixCoord;
    GePoint3<double> _eyeCoord;
    GePoint3<double> _texCoord;
    double _w{};

    Coord pixelX() const { return _pixCoord.x; }
    Coord pixelY() const { return _pixCoord.y; }
    void dump(std::ostream& os) const;
};

// Materials that need a normal.
struct RsNormalVertex {
    using Coord = double;

    GeHomogeneousCoord3<double> _pixCoord;
    GePoint3<double> _eyeCoord;
    GePoint3<double> _normal;
    GePoint3<double> _texCoord;
    double _w{};

    Coord pixelX() const { return _pixCoord.x; }
    Coord pixelY() const { return _pixCoord.y; }
    void dump(std::ostream& os) const;
};

// Materials that need a tangent frame.
struct RsTangentVertex {
    using Coord = double;

    GeHomogeneousCoord3<double> _pixCoord;
    GePoint3<double> _eyeCoord;
    GePoint3<double> _normal;
    GePoint3<double> _binormal;
    GePoint3<double> _tangent;
    GePoint3<double> _texCoord;
    double _w{};

    Coord pixelX() const { return _pixCoord.x; }
    Coord pixelY() const { return _pixCoord.y; }
    void dump(std::ostream& os) const;
};

// Flat 2D triangles: a position in the target tile's pixels and nothing else.
struct Rs2DVertex {
    using Coord = float;

    float _x{};
    float _y{};

    Coord pixelX() const { return _x; }
    Coord pixelY() const { return _y; }
    void dump(std::ostream& os) const;
};

static_assert(sizeof(RsDepthVertex) == 6 * sizeof(double));
static_assert(sizeof(RsPlainVertex) == 11 * sizeof(double));
static_assert(sizeof(RsNormalVertex) == 14 * sizeof(double));
static_assert(sizeof(RsTangentVertex) == 20 * sizeof(double));
static_assert(sizeof(Rs2DVertex) == 2 * sizeof(float));

}  // namespace Zr
