#pragma once
// One map of a material shader together with the sampler made from it, and the ways in which the
// library's material shaders look a map up: at the fragment's texture coordinate, or through the
// sphere map by the normal (irradiance), by the reflected view vector (reflection) or by the
// refracted one (refraction).
//
// The map's parameters come from the material when the shader is constructed; the sampler is
// made by the shader at its first lock (RsMaterialShader::createSampler) and lives as long as the
// shader, which lets its tiles go at each last unlock. All lookups are per-fragment code: single
// precision, no allocation, one virtual call into the sampler.
#include <cmath>

#include "coRgbColorTyped.h"
#include "coRgbaColorTyped.h"
#include "gePoint2.h"
#include "geVector3.h"
#include "oPtr.h"
#include "rcShdPtr.h"
#include "rsShadingContext.h"
#include "sdTextureParams.h"
#include "sdTextureSampler.h"

namespace Zr {

struct RsShaderMap {
    explicit RsShaderMap(const RCShdPtr<const SdTextureParams>& params) : _params(params) {}

    // Whether the material has this map at all.
    bool exists() const { return static_cast<bool>(_params); }

    // Lets the sampler's cached tiles go, if the sampler has been made.
    void releaseTiles() const {
        if (_sampler) _sampler->releaseTiles();
    }

    // The colour at the fragment's texture coordinate, over its footprint.
    CoRgbaColorTyped<float> sample(const RsShadingContext& context) const {
        return _sampler->sample(context._texCoord, context._texCoordDerivatives);
    }

    // Where a unit direction d lands on a sphere map: (d.x / m + 1/2, d.y / m + 1/2) with
    // m = sqrt(8 d.z + 8). The direction straight back (d.z = -1) divides by zero; the sampler
    // receives what results.
    static GePoint2<double> sphereMapPosition(const GeVector3<float>& d) {
        const float m = std::sqrt(8.0f * d.z + 8.0f);
        return GePoint2<double>(d.x / m + 0.5f, d.y / m + 0.5f);
    }

    // The irradiance arriving along the normal: the sphere map read at the normal's position. The
    // fragment's texture coordinate is restored afterwards, since the diffuse map still reads it.
    CoRgbColorTyped<float> lookUpByNormal(RsShadingContext& context) const {
        const GePoint2<double> texCoord = context._texCoord;
        context._texCoord = sphereMapPosition(context._normal);
        const CoRgbaColorTyped<float> s = sample(context);
        context._texCoord = texCoord;
        return CoRgbColorTyped<float>(s.r, s.g, s.b);
    }

    // What is seen in the mirror direction R = 2 (V . N) N - V of the view vector V. The lookup
    // position stays in the context.
    CoRgbColorTyped<float> lookUpByReflection(RsShadingContext& context,
                                              const GeVector3<float>& view) const {
        const GeVector3<float>& n = context._normal;
        const GeVector3<float> reflected = n * (2.0f * view.dot(n)) - view;
        context._texCoord = sphereMapPosition(reflected);
        const CoRgbaColorTyped<float> s = sample(context);
        return CoRgbColorTyped<float>(s.r, s.g, s.b);
    }

    // What is seen through the surface: T = 2 (V . N') N' - V with the normal scaled by the
    // refraction index, N' = index N. T is mapped as (-T.x, T.y, 1 - T.z) divided by twice its
    // length, about the map's centre: x is mirrored and y is not, on purpose. The lookup position
    // stays in the context.
    CoRgbColorTyped<float> lookUpByRefraction(RsShadingContext& context,
                                              const GeVector3<float>& view,
                                              float refractionIndex) const {
        const GeVector3<float> n = context._normal * refractionIndex;
        const GeVector3<float> t = n * (2.0f * view.dot(n)) - view;
        const float x = -t.x;
        const float y = t.y;
        const float z = 1.0f - t.z;
        const float m = 2.0f * std::sqrt(x * x + y * y + z * z);
        context._texCoord = GePoint2<double>(x / m + 0.5f, y / m + 0.5f);
        const CoRgbaColorTyped<float> s = sample(context);
        return CoRgbColorTyped<float>(s.r, s.g, s.b);
    }

    RCShdPtr<const SdTextureParams> _params;
    OPtr<SdTextureSampler> _sampler;
};

// Adds what a lookup brought to the colour channels of a shaded result; alpha stays.
inline void addTo(CoRgbaColorTyped<float>& result, const CoRgbColorTyped<float>& light) {
    result.r += light.r;
    result.g += light.g;
    result.b += light.b;
}

}  // namespace Zr
