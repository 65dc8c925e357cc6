#pragma once
// The base of the material shaders that mirror their surroundings: on top of the diffuse colour
// and map, a bump map and three lookups of the environment through a sphere map - irradiance by
// the normal, reflection and refraction by the view vector - each scaled by its material colour
// times its map's weight, folded at construction.
//
// A subclass's shade bends the normal with bumpAndView, computes the surface's own colour and
// hands it to withEnvironment. Both are inline, as they run per fragment.
#include <ostream>

#include "coRgbColorTyped.h"
#include "coRgbaColorTyped.h"
#include "geVector3.h"
#include "rsDiffuseMapShader.h"
#include "rsShaderMap.h"

namespace Zr {

class RsEnvironmentShader : public RsDiffuseMapShader {
public:
    void dump(std::ostream& os) const;

protected:
    // neededContext: the bits of the subclass's own lighting; those of the maps are added: the
    // eye position and normal for a reflection or refraction map, the normal for an irradiance
    // map, and with a bump map of non-zero weight the normal, texture coordinates and tangents.
    RsEnvironmentShader(const RCShdPtr<const SdMaterial>& material, unsigned int neededContext);

    // Makes the samplers of the diffuse map and of the four maps here at the first lock.
    void lockMemoryImpl() override;
    // Lets the five samplers' tiles go.
    void unlockMemoryImpl() override;

    // The view vector, then the context's normal bent by the bump map, if there is one. The view
    // is taken first: it does not depend on the normal.
    GeVector3<float> bumpAndView(RsShadingContext& context) const {
        const GeVector3<float> view = context.computeViewVector();
        if (_bumpMap.exists()) context.applyBumpMap(*_bumpMap._sampler, _bumpMap._params->getWeight());
        return view;
    }

    // surface plus the irradiance, all textured by the diffuse map (alpha included); then the
    // reflection and refraction on top, untextured and leaving alpha alone. Writes the last
    // lookup position into the context's _texCoord.
    CoRgbaColorTyped<float> withEnvironment(CoRgbaColorTyped<float> surface, RsShadingContext& context,
                                            const GeVector3<float>& view) const {
        if (_irradianceMap.exists()) addTo(surface, _irradiance * _irradianceMap.lookUpByNormal(context));
        surface *= _diffuseMap.sample(context);
        if (_reflectionMap.exists()) addTo(surface, _reflection * _reflectionMap.lookUpByReflection(context, view));
        if (_refractionMap.exists())
            addTo(surface, _refraction * _refractionMap.lookUpByRefraction(context, view, _refractionIndex));
        return surface;
    }

private:
    CoRgbColorTyped<float> _reflection;
    CoRgbColorTyped<float> _refraction;
    // Times the weights of both the diffuse and the irradiance map: it is textured with the rest.
    CoRgbColorTyped<float> _irradiance;
    float _refractionIndex;
    RsShaderMap _reflectionMap;
    RsShaderMap _refractionMap;
    RsShaderMap _irradianceMap;
    RsShaderMap _bumpMap;
};

}  // namespace Zr
