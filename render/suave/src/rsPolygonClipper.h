#pragma once
// Sutherland-Hodgman clipping of one triangle in homogeneous pixel space, before the perspective
// division, against the planes of a region's box: x and y from the region's rectangle, z from
// -1 to 1.
//
// A vertex's value for a plane on axis a with limit L is _pixCoord[a] - L * w for a minimum and
// L * w - _pixCoord[a] for a maximum; the vertex is inside where the value is at least 0. Working
// before the division makes the z minimum a limit in front of the eye, so that no vertex whose w
// is zero or negative survives to be divided. There is no epsilon: a vertex exactly on a plane is
// kept and makes no new vertex beside it.
//
// The planes are taken in the fixed order z minimum, z maximum, x minimum, x maximum, y minimum,
// y maximum, each only when its bit is set in the active mask (x minimum 1, x maximum 2,
// y minimum 4, y maximum 8, z minimum 16, z maximum 32). The result is a convex polygon, given as
// a list of vertex indices into the clipper's vertex store; the triangle's own three vertices are
// indices 0 to 2 and new vertices are appended behind them.
#include <vector>

#include "geHomogeneousCoord3.h"
#include "geRectangle.h"
#include "rsVertexAttributes.h"

namespace Zr {

template <class Vertex>
class RsPolygonClipper {
public:
    static constexpr unsigned int xMinBit = 0x01u;
    static constexpr unsigned int xMaxBit = 0x02u;
    static constexpr unsigned int yMinBit = 0x04u;
    static constexpr unsigned int yMaxBit = 0x08u;
    static constexpr unsigned int zMinBit = 0x10u;
    static constexpr unsigned int zMaxBit = 0x20u;
    static constexpr unsigned int allPlanes = 0x3fu;

    explicit RsPolygonClipper(const GeRectangle<int>& region)
        : _clipRegion{static_cast<double>(region.x0), static_cast<double>(region.x1),
                      static_cast<double>(region.y0), static_cast<double>(region.y1), -1.0, 1.0} {
        _vertices.reserve(kInitialRoom);
        _polygon.reserve(kInitialRoom);
        _scratch.reserve(kInitialRoom);
    }

    void setClipFlags(unsigned int flags) { _clipFlags = flags & allPlanes; }
    unsigned int getClipFlags() const { return _clipFlags; }

    // Starts a polygon of the three vertices a, b, c, in this order.
    void setTriangle(const Vertex& a, const Vertex& b, const Vertex& c) {
        _vertices.clear();
        _vertices.push_back(a);
        _vertices.push_back(b);
        _vertices.push_back(c);
        _polygon.assign({0, 1, 2});
    }

    // Clips the polygon against the active planes; returns the number of its vertices left.
    int clip() {
        // A polygon inside every active plane comes out as it went in, and most are.
        if (!isInside()) {
            static constexpr unsigned int order[6] = {zMinBit, zMaxBit, xMinBit, xMaxBit, yMinBit, yMaxBit};
            for (int plane = 0; plane < 6; ++plane) {
                if ((_clipFlags & order[plane]) == 0) continue;
                clipAgainst(order[plane]);
                if (_polygon.empty()) break;
            }
        }
        // A vertex without a positive w (the eye itself, which lies on every plane, a crossing that
        // rounding put there, or one that is not a number) has no place on the screen: the polygon
        // is seen edge-on through the eye, or lies beyond the float range, and draws nothing.
        for (int index : _polygon) {
            if (!(_vertices[static_cast<std::size_t>(index)]._pixCoord.w > 0.0)) {
                _polygon.clear();
                break;
            }
        }
        return getVertexCount();
    }

    // True when the three positions of a triangle all lie strictly outside one active plane. Such
    // a triangle clips to nothing, whatever the other planes do, so a caller can skip it before
    // building its vertices: most faces of a mesh lie wholly outside most regions.
    bool isOutside(const GeHomogeneousCoord3<double>& a, const GeHomogeneousCoord3<double>& b,
                   const GeHomogeneousCoord3<double>& c) const {
        for (unsigned int bit = 1; bit <= allPlanes; bit <<= 1) {
            if ((_clipFlags & bit) != 0 && valueOf(a, bit) < 0.0 && valueOf(b, bit) < 0.0 && valueOf(c, bit) < 0.0)
                return true;
        }
        return false;
    }

    // True when every vertex of the polygon lies inside every active plane (a value of at least 0).
    bool isInside() const {
        for (unsigned int bit = 1; bit <= allPlanes; bit <<= 1) {
            if ((_clipFlags & bit) == 0) continue;
            for (int index : _polygon)
                if (!(valueOf(_vertices[static_cast<std::size_t>(index)], bit) >= 0.0)) return false;
        }
        return true;
    }

    int getVertexCount() const { return static_cast<int>(_polygon.size()); }
    // Vertex i of the polygon, in order around it.
    Vertex& getVertex(int i) { return _vertices[static_cast<std::size_t>(_polygon[static_cast<std::size_t>(i)])]; }

private:
    static constexpr std::size_t kInitialRoom = 20;

    // Value of v for the plane with the given bit: at least 0 inside.
    double valueOf(const Vertex& v, unsigned int bit) const { return valueOf(v._pixCoord, bit); }
    double valueOf(const GeHomogeneousCoord3<double>& p, unsigned int bit) const {
        switch (bit) {
            case xMinBit: return p.x - _clipRegion[0] * p.w;
            case xMaxBit: return _clipRegion[1] * p.w - p.x;
            case yMinBit: return p.y - _clipRegion[2] * p.w;
            case yMaxBit: return _clipRegion[3] * p.w - p.y;
            case zMinBit: return p.z - _clipRegion[4] * p.w;
            default: return _clipRegion[5] * p.w - p.z;
        }
    }

    // Puts p exactly on the plane with the given bit. A crossing mixed from far-out positions
    // rounds by more than the region is wide and could stay outside the plane it was made for.
    void placeOnPlane(GeHomogeneousCoord3<double>& p, unsigned int bit) const {
        double& coordinate = bit <= xMaxBit ? p.x : bit <= yMaxBit ? p.y : p.z;
        const int limit = bit == xMinBit ? 0 : bit == xMaxBit ? 1 : bit == yMinBit ? 2 : bit == yMaxBit ? 3 : bit == zMinBit ? 4 : 5;
        coordinate = _clipRegion[limit] * p.w;
    }

    void clipAgainst(unsigned int bit) {
        const std::size_t count = _polygon.size();
        _scratch.clear();
        if (count < 1) {
            _polygon.swap(_scratch);
            return;
        }
        int prevIndex = _polygon[count - 1];
        double prev = valueOf(_vertices[static_cast<std::size_t>(prevIndex)], bit);
        for (std::size_t i = 0; i < count; ++i) {
            const int curIndex = _polygon[i];
            const double cur = valueOf(_vertices[static_cast<std::size_t>(curIndex)], bit);
            if (prev * cur < 0.0) {
                // The edge crosses the plane: the new vertex lies where the value is zero. Its
                // weights are not numbers when a value is infinite (a position beyond the float
                // range); its w is then no number either, and clip() drops the polygon.
                const double a = cur / (cur - prev);
                const double b = -prev / (cur - prev);
                Vertex crossing{};
                rsMixVertex(crossing, _vertices[static_cast<std::size_t>(prevIndex)], a,
                            _vertices[static_cast<std::size_t>(curIndex)], b);
                placeOnPlane(crossing._pixCoord, bit);
                _vertices.push_back(crossing);
                _scratch.push_back(static_cast<int>(_vertices.size() - 1));
            }
            if (cur >= 0.0) _scratch.push_back(curIndex);
            prevIndex = curIndex;
            prev = cur;
        }
        _polygon.swap(_scratch);
    }

    // x minimum, x maximum, y minimum, y maximum of the region, then the depth range.
    double _clipRegion[6];
    unsigned int _clipFlags = allPlanes;
    // The triangle's vertices followed by those that clipping made.
    std::vector<Vertex> _vertices;
    // The polygon as indices into _vertices, and the list the next plane writes into.
    std::vector<int> _polygon;
    std::vector<int> _scratch;
};

}  // namespace Zr
