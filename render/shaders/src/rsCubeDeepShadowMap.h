#pragma once
// The coloured, semi-transparent shadow of a light that shines in all directions: six deep
// shadow maps (RsDeepShadowMap) around a centre, one per axis direction; rsCubeMap.h tells how a
// face is chosen and placed.
#include <ostream>

#include "coRgbColorTyped.h"
#include "gePoint3.h"
#include "rsCubeMap.h"
#include "rsDeepShadowMap.h"
#include "rsShadowEvaluator.h"

namespace Zr {

class RsCubeDeepShadowMap : public RsShadowEvaluator, public RsCubeMap<RsDeepShadowMap> {
public:
    // Six empty faces, the identity camera matrix and the centre at the origin.
    RsCubeDeepShadowMap();
    ~RsCubeDeepShadowMap() override;

    // Move each face's curves (RsDeepShadowMap's copying does); every other member is copied.
    RsCubeDeepShadowMap(RsCubeDeepShadowMap& other) = default;
    RsCubeDeepShadowMap(RsCubeDeepShadowMap&& other) = default;
    RsCubeDeepShadowMap& operator=(RsCubeDeepShadowMap& other) = default;
    RsCubeDeepShadowMap& operator=(RsCubeDeepShadowMap&& other) = default;

    CoRgbColorTyped<float> computeBestShadow(const GePoint3<float>& point) const override;
    CoRgbColorTyped<float> computeFastShadow(const GePoint3<float>& point) const override;

    // The face, its curves made anew and empty, ready for its pass.
    RsDeepShadowMap& getMap(CubeFace face);
};

}  // namespace Zr
