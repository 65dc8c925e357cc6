#pragma once
// The renderer's flat form of a scene: its drawable instances, its enabled light shaders and its
// camera instances, each in the order of the scene description, with the world-space bounds of
// the instances. Made once by the scene builder and handed to each render call; the lists never
// change after construction. A render call writes per-call members of the instances, so a scene
// serves one render at a time.
#include <ostream>
#include <vector>

#include "geAlignedBox3.h"
#include "rcBase.h"
#include "rcShdPtr.h"
#include "rsGeomInstance.h"
#include "rsLightShader.h"
#include "sdInstance.h"

namespace Zr {

class RsScene : public RCObject {
public:
    using GeomInstanceList = std::vector<RCShdPtr<RsGeomInstance>>;
    using LightList = std::vector<RCShdPtr<RsLightShader>>;
    using CameraList = std::vector<RCShdPtr<const SdInstance>>;

    // Takes the three lists by swapping them with the caller's, so no reference count changes and
    // the caller's lists are left empty; then computes the bounds. A null instance fails with
    // ExNullPtr.
    RsScene(GeomInstanceList& geomInstances, LightList& lights, CameraList& cameras);
    ~RsScene() override;

    RsScene(const RsScene&) = delete;
    RsScene& operator=(const RsScene&) = delete;

    void dump(std::ostream& os) const;

    GeomInstanceList _geomInstances;
    LightList _lights;
    CameraList _cameras;
    // The world-space union of the instances' boxes, axis by axis; an axis on which no instance
    // has a proper interval stays empty.
    GeAlignedBox3<float> _bounds;
    // A length small against the scene: its diagonal times 1e-06, at least the smallest normal
    // float.
    float _boundsEpsilon = 0.0f;

private:
    void computeBounds();
};

}  // namespace Zr
