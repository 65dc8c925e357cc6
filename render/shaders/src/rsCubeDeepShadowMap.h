#pragma once
// The coloured, semi-transparent shadow of a light that shines in all directions: six deep
// shadow maps (RsDeepShadowMap) around a centre, one per axis direction; rsCubeMap.h tells how a
// face is chosen and placed.
#include "rsCubeShadowEvaluator.h"
#include "rsDeepShadowMap.h"

namespace Zr {

// A new cube map has six empty faces, the identity camera matrix and the centre at the origin. Its
// implicit copying moves each face's curves (as the face's copying does); every other member is
// copied.
class RsCubeDeepShadowMap : public RsCubeShadowEvaluator<RsDeepShadowMap> {
public:
    // The face, its curves made anew and empty, ready for its pass.
    RsDeepShadowMap& getMap(CubeFace face);
};

}  // namespace Zr
