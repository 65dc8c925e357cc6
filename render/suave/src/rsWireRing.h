#pragma once
// A triangle drawn as wires becomes a ring: its three outer corners 0, 1, 2 and three inner
// corners 3, 4, 5 that begin as copies of the outer ones and are moved inward, so that each edge
// of the inner triangle lies the wire width inside the matching outer edge. The ring is then drawn
// as the six triangles of rsWireRingTriangles.
//
// Inner edge k, next[k] is moved towards the corner other[k] opposite it; the three moves run one
// after the other, each on the corners as the previous one left them. A triangle narrower than the
// wire collapses its inner corners onto the far corner and is drawn whole.
//
// The width is measured either in eye space (the vertices' eye coordinates, in double) or on the
// screen (x/w and y/w of the homogeneous pixel coordinates, in pixels, in float). On the screen
// a fraction f of the way across a projected triangle is not the fraction f of the homogeneous
// mix, so the mixing weight is corrected by the w of the two corners involved.
//
// The corners are vertices before clipping and before the perspective division; every attribute
// but _w moves along.
#include <algorithm>
#include <cmath>

#include "rsVertexAttributes.h"

namespace Zr {

inline constexpr int rsWireRingNext[6] = {1, 2, 0, 4, 5, 3};
inline constexpr int rsWireRingOther[6] = {2, 0, 1, 5, 3, 4};
// The six triangles between the outer and the inner edges.
inline constexpr int rsWireRingTriangles[6][3] = {{0, 1, 3}, {1, 4, 3}, {1, 2, 4},
                                                  {2, 5, 4}, {2, 0, 5}, {0, 3, 5}};

// Moves the inner corners 3, 4, 5 of ring by wireSize in eye space.
template <class V>
void rsMakeWireRingInEyeSpace(V (&ring)[6], float wireSize) {
    for (int k = 3; k < 6; ++k) {
        V& corner = ring[k];
        V& next = ring[rsWireRingNext[k]];
        const V& other = ring[rsWireRingOther[k]];
        const double ax = next._eyeCoord.x - corner._eyeCoord.x;
        const double ay = next._eyeCoord.y - corner._eyeCoord.y;
        const double az = next._eyeCoord.z - corner._eyeCoord.z;
        const double bx = other._eyeCoord.x - corner._eyeCoord.x;
        const double by = other._eyeCoord.y - corner._eyeCoord.y;
        const double bz = other._eyeCoord.z - corner._eyeCoord.z;
        double aa = ax * ax + ay * ay + az * az;
        if (aa == 0.0) aa = 1e-6;
        const double t = (ax * bx + ay * by + az * bz) / aa;
        // Distance of the opposite corner from the edge.
        const double ex = bx - ax * t, ey = by - ay * t, ez = bz - az * t;
        double d = std::sqrt(ex * ex + ey * ey + ez * ez);
        if (d == 0.0) d = 1e-5;
        const double s = std::min(1.0, static_cast<double>(wireSize) / d);
        rsMixVertex(corner, corner, 1.0 - s, other, s);
        rsMixVertex(next, next, 1.0 - s, other, s);
    }
}

// Moves the inner corners 3, 4, 5 of ring by wireSize pixels on the screen.
template <class V>
void rsMakeWireRingInScreenSpace(V (&ring)[6], float wireSize) {
    for (int k = 3; k < 6; ++k) {
        V& corner = ring[k];
        V& next = ring[rsWireRingNext[k]];
        const V& other = ring[rsWireRingOther[k]];
        const float wk = static_cast<float>(corner._pixCoord.w);
        const float wn = static_cast<float>(next._pixCoord.w);
        const float wo = static_cast<float>(other._pixCoord.w);
        const float kx = static_cast<float>(corner._pixCoord.x) / wk;
        const float ky = static_cast<float>(corner._pixCoord.y) / wk;
        const float ax = static_cast<float>(next._pixCoord.x) / wn - kx;
        const float ay = static_cast<float>(next._pixCoord.y) / wn - ky;
        const float bx = static_cast<float>(other._pixCoord.x) / wo - kx;
        const float by = static_cast<float>(other._pixCoord.y) / wo - ky;
        float aa = ax * ax + ay * ay;
        if (aa == 0.0f) aa = 1e-6f;
        const float t = (ax * bx + ay * by) / aa;
        const float ex = bx - ax * t, ey = by - ay * t;
        const float d = std::sqrt(ex * ex + ey * ey);
        if (d == 0.0f) continue;
        const float f = wireSize / d;
        // Screen fraction f towards `other` as a homogeneous mixing weight.
        const float rk = wo / wk;
        const float rn = wo / wn;
        const float weightK = f / (rk + (1.0f - rk) * f);
        const float weightN = f / (rn + (1.0f - rn) * f);
        if (weightK >= 1.0f) {
            corner = other;
        } else if (weightK >= 0.0f) {
            rsMixVertex(corner, corner, 1.0f - weightK, other, weightK);
        }
        if (weightN > 1.0f) {
            next = other;
        } else if (weightN > 0.0f) {
            rsMixVertex(next, next, 1.0f - weightN, other, weightN);
        }
    }
}

}  // namespace Zr
