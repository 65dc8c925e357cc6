#pragma once
// A whole scene as three lists of instances: geometry, cameras and lights, each kept in the order
// in which the instances were added. The renderer's scene builder walks them in that order.
#include <vector>

#include "rcBase.h"
#include "rcShdPtr.h"
#include "sdInstance.h"

namespace Zr {

class SdScene : public RCObject {
public:
    using InstanceList = std::vector<RCShdPtr<SdInstance>>;

    SdScene() = default;
    ~SdScene() override;

    const InstanceList& getGeometry() const { return _geometry; }
    const InstanceList& getCameras() const { return _cameras; }
    const InstanceList& getLights() const { return _lights; }

    void addGeometry(RCShdPtr<SdInstance> instance);
    void addCamera(RCShdPtr<SdInstance> instance);
    void addLight(RCShdPtr<SdInstance> instance);
    // Appends the instance to the list of its object's kind: light, camera or geometry. An
    // instance without an object, or of an object of none of these kinds, fails with
    // ExAssertionFailed.
    void add(RCShdPtr<SdInstance> instance);

    void clear();

private:
    InstanceList _geometry;
    InstanceList _cameras;
    InstanceList _lights;
};

}  // namespace Zr
