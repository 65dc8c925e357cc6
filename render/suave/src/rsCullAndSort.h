#pragma once
// The pass that decides, once per render call, which geometry instances of a scene can be seen
// and in which order they are drawn. Whole instances are tested: each one's object box is taken
// into camera space, and an instance whose camera box lies wholly outside the frustum is dropped.
// The frustum planes that a kept instance's box crosses are left in its _clipMask, so that its
// faces are later clipped only against those.
//
// The pass writes _toCamera, _cameraBox and _clipMask of every instance that it admits (also of
// those it then drops); instances it does not admit keep theirs from earlier calls.
#include <vector>

#include "geAffineMatrix3.h"
#include "geFrustum.h"
#include "rcShdPtr.h"
#include "rsGeomInstance.h"
#include "rsScene.h"

namespace Zr {

using RsGeomInstanceList = std::vector<RCShdPtr<RsGeomInstance>>;

// The camera's drawing list: the instances with _visible set whose box is not wholly outside the
// frustum, ordered by ascending _renderOrder and, within one order, nearer first (the middle of
// the camera box in z, greater first, since the camera looks down negative z). Instances with the
// same order and the same middle come out with the later one of the scene first. zBuffer tells
// whether the render tests depth; the order is the same either way, so that depth-tested and
// untested pictures are drawn alike. result must come in empty.
void cullAndSortInstances(const RCShdPtr<RsScene>& scene, bool zBuffer, const GeFrustum<double>& frustum,
                          const GeAffineMatrix3<float>& worldToCamera, RsGeomInstanceList& result);

// The shadow casters of one light view: the same pass with _castsShadows in place of _visible,
// the light's world-to-view matrix and frustum, and the order by the middle of the box in z alone,
// greater first, later instance first on equal middles; _renderOrder plays no part. The
// instances' _toCamera and _cameraBox then refer to the light's view. result must come in empty.
void cullAndSortShadowCasters(const RCShdPtr<RsScene>& scene, const GeFrustum<double>& frustum,
                              const GeAffineMatrix3<float>& worldToLight, RsGeomInstanceList& result);

}  // namespace Zr
