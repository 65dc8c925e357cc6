#pragma once
// What is known at one fragment when its material shader is called. The region drawer owns one
// context and fills it anew for every fragment; only the members that the material asks for
// through its needed-context mask are filled, the others keep whatever they held. All vectors lie
// in eye space, the camera space of the render call, which looks down negative z.
//
// A shader receives the context by non-const reference: bump mapping replaces _normal and the
// environment lookups write their lookup position into _texCoord. Such changes last until the
// next fragment's fill unless the shader restores them.
#include <cmath>
#include <ostream>

#include "coRgbColorTyped.h"
#include "geLinearMatrix2.h"
#include "gePoint2.h"
#include "gePoint3.h"
#include "geVector3.h"

namespace Zr {

class SdTextureSampler;

struct RsShadingContext {
    // Bits of the needed-context mask that a material shader returns from getNeededContext.
    // The rasterizer interpolates only what a bit asks for.
    static constexpr unsigned int needsEyeCoord = 0x01u;  // _eyeCoord and its screen derivatives
    static constexpr unsigned int needsNormal = 0x02u;    // _normal
    static constexpr unsigned int needsTexCoord = 0x3cu;  // _texCoord and _texCoordDerivatives
    static constexpr unsigned int needsTangents = 0x40u;  // _tangent and _binormal

    // The instance's own flag: whether the lights evaluate their shadows at this fragment.
    bool _receivesShadows = false;
    // Whether the projection of the render call is orthographic.
    bool _orthographic = false;
    // The direction in which an orthographic camera looks; unit length.
    GeVector3<float> _viewDirection{0.0f, 0.0f, -1.0f};
    // The fragment's position and its change per pixel step in x and in y.
    GePoint3<float> _eyeCoord;
    GeVector3<float> _dEyeCoord_dx;
    GeVector3<float> _dEyeCoord_dy;
    // The shading normal, unit length (or zero where the surface has none), and the tangent frame.
    GeVector3<float> _normal{0.0f, 0.0f, 1.0f};
    GeVector3<float> _tangent;
    GeVector3<float> _binormal;
    // The texture coordinate and the pixel's footprint in texture space: element (0, 0) is
    // ds/dx, (1, 0) ds/dy, (0, 1) dt/dx, (1, 1) dt/dy.
    GePoint2<double> _texCoord;
    GeLinearMatrix2<double> _texCoordDerivatives{0.0, 0.0, 0.0, 0.0};
    // Light that reaches the fragment from nowhere in particular; black unless a host sets it.
    CoRgbColorTyped<float> _ambient;

    // The unit vector from the surface towards the viewer: the negated, normalised position
    // under perspective (zero at the eye itself), the negated view direction under an
    // orthographic projection.
    GeVector3<float> computeViewVector() const;

    // Tilts _normal by a bump map whose sampler is given, with the map's weight. The sample at
    // _texCoord, less 0.5 in each of red, green and blue, is a direction in the frame of
    // _tangent, _binormal and _normal; the normal is moved towards that direction by the weight,
    // which is not clamped (a weight above 1 overshoots), and normalised again. A weight whose
    // magnitude is no more than the smallest normal float changes nothing and samples nothing.
    void applyBumpMap(const SdTextureSampler& bumpSampler, float weight);

    // The normalisation rule of the shaders: a vector of length exactly 0 stays the zero vector,
    // any other is scaled by the reciprocal of its single-precision length.
    // Inline: shaders call it several times per fragment.
    static GeVector3<float> normalizeOrZero(const GeVector3<float>& v) {
        const float length = std::sqrt(v.x * v.x + v.y * v.y + v.z * v.z);
        if (length == 0.0f) return GeVector3<float>(0.0f, 0.0f, 0.0f);
        const float inverse = 1.0f / length;
        return GeVector3<float>(v.x * inverse, v.y * inverse, v.z * inverse);
    }

    void dump(std::ostream& os) const;
};

}  // namespace Zr
