#pragma once
// From the pixel data at a covered pixel to the shading context of its fragment. The buffers call
// this once per fragment that they shade, just before the material's shade.
//
// The pixel data holds every attribute multiplied by 1/w (linear over the screen); dividing by the
// interpolated 1/w gives the attribute itself, perspective correct. The screen derivatives of an
// attribute q = Q / W, with Q and W both planes, follow from the quotient rule:
//   dq/dx = (dQ/dx - q * dW/dx) / W,
// exactly, with no finite differences. Positions and texture coordinates get their derivatives
// (the texture filter needs the footprint); normals and the tangent frame only their direction,
// so they are normalised without the division.
#include <cmath>

#include "geLinearMatrix2.h"
#include "gePoint2.h"
#include "gePoint3.h"
#include "geVector3.h"
#include "rsPixelData.h"
#include "rsShadingContext.h"

namespace Zr {

// v / |v| in float; a vector of length 0 stays the zero vector.
inline GeVector3<float> rsDirectionOf(const GePoint3<float>& v) {
    const float length = std::sqrt(v.x * v.x + v.y * v.y + v.z * v.z);
    if (length == 0.0f) return {0.0f, 0.0f, 0.0f};
    return {v.x / length, v.y / length, v.z / length};
}

// The eye position and the texture coordinates, each with its derivatives, are filled only when
// the needed-context mask asks for them: a material that does not never reads them.
template <class Vertex>
void rsFillShadingContext(RsShadingContext& context, const RsPixelData<Vertex>& data, unsigned int needed = ~0u) {
    using Data = RsPixelData<Vertex>;
    // The division by the interpolated 1/w serves only the eye position and the texture
    // coordinates.
    if ((needed & (RsShadingContext::needsEyeCoord | RsShadingContext::needsTexCoord)) != 0) {
        const double inv = 1.0 / data._w._q;
        const double dWdx = data._w._dq_dx;
        const double dWdy = data._w._dq_dy;

        if constexpr (Data::kHasEyeCoord) {
            if ((needed & RsShadingContext::needsEyeCoord) != 0) {
                const GePoint3<float>& q = data._eyeCoord._q;
                const GePoint3<float>& qx = data._eyeCoord._dq_dx;
                const GePoint3<float>& qy = data._eyeCoord._dq_dy;
                const double px = q.x * inv, py = q.y * inv, pz = q.z * inv;
                context._eyeCoord = GePoint3<float>(static_cast<float>(px), static_cast<float>(py),
                                                    static_cast<float>(pz));
                context._dEyeCoord_dx = GeVector3<float>(static_cast<float>((qx.x - px * dWdx) * inv),
                                                         static_cast<float>((qx.y - py * dWdx) * inv),
                                                         static_cast<float>((qx.z - pz * dWdx) * inv));
                context._dEyeCoord_dy = GeVector3<float>(static_cast<float>((qy.x - px * dWdy) * inv),
                                                         static_cast<float>((qy.y - py * dWdy) * inv),
                                                         static_cast<float>((qy.z - pz * dWdy) * inv));
            }
        }
        if constexpr (Data::kHasTexCoord) {
            if ((needed & RsShadingContext::needsTexCoord) != 0) {
                const GePoint2<double>& q = data._texCoord._q;
                const GePoint2<double>& qx = data._texCoord._dq_dx;
                const GePoint2<double>& qy = data._texCoord._dq_dy;
                const double s = q.x * inv;
                const double t = q.y * inv;
                context._texCoord = GePoint2<double>(s, t);
                // The context keeps ds/dx at (0, 0), ds/dy at (1, 0), dt/dx at (0, 1) and dt/dy at (1, 1).
                const double dsdx = (qx.x - s * dWdx) * inv;
                const double dsdy = (qy.x - s * dWdy) * inv;
                const double dtdx = (qx.y - t * dWdx) * inv;
                const double dtdy = (qy.y - t * dWdy) * inv;
                context._texCoordDerivatives = GeLinearMatrix2<double>(dsdx, dtdx, dsdy, dtdy);
            }
        }
    }
    if constexpr (Data::kHasNormal) context._normal = rsDirectionOf(data._normal._q);
    if constexpr (Data::kHasBinormal) context._binormal = rsDirectionOf(data._binormal._q);
    if constexpr (Data::kHasTangent) context._tangent = rsDirectionOf(data._tangent._q);
}

}  // namespace Zr
