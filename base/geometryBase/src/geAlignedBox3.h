#pragma once
// An axis-aligned box: the product of three closed intervals, stored as xMin, xMax, yMin, yMax,
// zMin, zMax. The default box is empty: its minima lie above its maxima, so that growing it by
// any point replaces it with that point.
#include <cmath>
#include <limits>
#include <ostream>

#include "geAffineMatrix3.h"
#include "geInterval.h"
#include "gePoint3.h"
#include "geVector3.h"

namespace Zr {

template <class T>
struct GeAlignedBox3 {
    T xMin = std::numeric_limits<T>::max();
    T xMax = std::numeric_limits<T>::lowest();
    T yMin = std::numeric_limits<T>::max();
    T yMax = std::numeric_limits<T>::lowest();
    T zMin = std::numeric_limits<T>::max();
    T zMax = std::numeric_limits<T>::lowest();

    // The empty box.
    constexpr GeAlignedBox3() = default;
    // The box spanned by two corners; min must not exceed max in any axis.
    constexpr GeAlignedBox3(const GePoint3<T>& min, const GePoint3<T>& max)
        : xMin(min.x), xMax(max.x), yMin(min.y), yMax(max.y), zMin(min.z), zMax(max.z) {}
    template <class U>
    constexpr explicit GeAlignedBox3(const GeAlignedBox3<U>& o)
        : xMin(static_cast<T>(o.xMin)), xMax(static_cast<T>(o.xMax)), yMin(static_cast<T>(o.yMin)),
          yMax(static_cast<T>(o.yMax)), zMin(static_cast<T>(o.zMin)), zMax(static_cast<T>(o.zMax)) {}

    constexpr bool isEmpty() const { return xMin > xMax || yMin > yMax || zMin > zMax; }
    constexpr void makeEmpty() { *this = GeAlignedBox3(); }

    constexpr GePoint3<T> getMin() const { return {xMin, yMin, zMin}; }
    constexpr GePoint3<T> getMax() const { return {xMax, yMax, zMax}; }
    constexpr GeInterval<T> getX() const { return {xMin, xMax}; }
    constexpr GeInterval<T> getY() const { return {yMin, yMax}; }
    constexpr GeInterval<T> getZ() const { return {zMin, zMax}; }
    constexpr GePoint3<T> getCenter() const {
        return {(xMin + xMax) / T(2), (yMin + yMax) / T(2), (zMin + zMax) / T(2)};
    }
    // Corner i of the eight: bit 0 of i picks xMax over xMin, bit 1 yMax, bit 2 zMax.
    constexpr GePoint3<T> getCorner(int i) const {
        return {(i & 1) ? xMax : xMin, (i & 2) ? yMax : yMin, (i & 4) ? zMax : zMin};
    }

    // Extends the box to contain p.
    constexpr void grow(const GePoint3<T>& p) {
        if (p.x < xMin) xMin = p.x;
        if (p.x > xMax) xMax = p.x;
        if (p.y < yMin) yMin = p.y;
        if (p.y > yMax) yMax = p.y;
        if (p.z < zMin) zMin = p.z;
        if (p.z > zMax) zMax = p.z;
    }
    // Extends the box to contain another; an empty box adds nothing.
    constexpr void grow(const GeAlignedBox3& b) {
        if (b.isEmpty()) return;
        grow(b.getMin());
        grow(b.getMax());
    }

    constexpr bool contains(const GePoint3<T>& p) const {
        return xMin <= p.x && p.x <= xMax && yMin <= p.y && p.y <= yMax && zMin <= p.z && p.z <= zMax;
    }
    // The boxes share at least one point (closed boxes, so touching counts).
    constexpr bool intersects(const GeAlignedBox3& b) const {
        return xMin <= b.xMax && b.xMin <= xMax && yMin <= b.yMax && b.yMin <= yMax && zMin <= b.zMax &&
               b.zMin <= zMax;
    }

    // From p to the nearest point of the box (0 when p is inside) and from p to the farthest
    // corner. The box must not be empty.
    void computeMinMaxDistanceVectors(const GePoint3<T>& p, GeVector3<T>& nearest, GeVector3<T>& farthest) const;

    // The box around this box after the transform: the tightest aligned box that holds the
    // transformed corners. An empty box stays empty.
    GeAlignedBox3 computeTransformed(const GeAffineMatrix3<T>& m) const;

    constexpr bool operator==(const GeAlignedBox3& o) const {
        return xMin == o.xMin && xMax == o.xMax && yMin == o.yMin && yMax == o.yMax && zMin == o.zMin &&
               zMax == o.zMax;
    }
    constexpr bool operator!=(const GeAlignedBox3& o) const { return !(*this == o); }

    void dump(std::ostream& os) const {
        os << " xMin: " << xMin << " xMax: " << xMax << " yMin: " << yMin << " yMax: " << yMax << " zMin: " << zMin
           << " zMax: " << zMax;
    }

private:
    // The offset from c to the nearest point of [lo, hi] and to the end of it farther from c.
    static constexpr void axisOffsets(T c, T lo, T hi, T& toNearest, T& toFarthest) {
        toNearest = c < lo ? lo - c : (c > hi ? hi - c : T(0));
        toFarthest = (c - lo > hi - c) ? lo - c : hi - c;
    }
};

template <class T>
void GeAlignedBox3<T>::computeMinMaxDistanceVectors(const GePoint3<T>& p, GeVector3<T>& nearest,
                                                    GeVector3<T>& farthest) const {
    axisOffsets(p.x, xMin, xMax, nearest.x, farthest.x);
    axisOffsets(p.y, yMin, yMax, nearest.y, farthest.y);
    axisOffsets(p.z, zMin, zMax, nearest.z, farthest.z);
}

template <class T>
GeAlignedBox3<T> GeAlignedBox3<T>::computeTransformed(const GeAffineMatrix3<T>& m) const {
    if (isEmpty()) return GeAlignedBox3();
    // Each output axis is the translation plus, per input axis, the product of the matrix
    // element with whichever end of the input interval makes it smallest or largest.
    const T lo[3] = {xMin, yMin, zMin};
    const T hi[3] = {xMax, yMax, zMax};
    T outLo[3];
    T outHi[3];
    for (int row = 0; row < 3; ++row) {
        outLo[row] = outHi[row] = m(row, 3);
        for (int col = 0; col < 3; ++col) {
            const T a = m(row, col) * lo[col];
            const T b = m(row, col) * hi[col];
            outLo[row] += a < b ? a : b;
            outHi[row] += a < b ? b : a;
        }
    }
    return GeAlignedBox3({outLo[0], outLo[1], outLo[2]}, {outHi[0], outHi[1], outHi[2]});
}

template <class T>
std::ostream& operator<<(std::ostream& os, const GeAlignedBox3<T>& b) { b.dump(os); return os; }

}  // namespace Zr
