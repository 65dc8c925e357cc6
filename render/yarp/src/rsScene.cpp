#include "rsScene.h"

#include <cmath>
#include <limits>

namespace Zr {

namespace {

// Widens [sceneMin, sceneMax] by [min, max] on one axis. An interval whose lower end is not
// strictly below its upper end counts as empty: an instance contributes nothing on such an axis,
// and an empty scene interval is replaced by the instance's.
void uniteAxis(float& sceneMin, float& sceneMax, float min, float max) {
    if (!(min < max)) return;
    if (sceneMax <= sceneMin) {
        sceneMin = min;
        sceneMax = max;
        return;
    }
    if (min < sceneMin) sceneMin = min;
    if (max > sceneMax) sceneMax = max;
}

// The extent of an axis for the diagonal; an empty interval adds nothing.
float axisExtent(float min, float max) { return max > min ? max - min : 0.0f; }

}  // namespace

RsScene::RsScene(GeomInstanceList& geomInstances, LightList& lights, CameraList& cameras) {
    _geomInstances.swap(geomInstances);
    _lights.swap(lights);
    _cameras.swap(cameras);
    computeBounds();
}

RsScene::~RsScene() = default;

void RsScene::computeBounds() {
    _bounds = GeAlignedBox3<float>();
    for (const RCShdPtr<RsGeomInstance>& instance : _geomInstances) {
        const GeAlignedBox3<float> box = instance->getBoundingBox();
        uniteAxis(_bounds.xMin, _bounds.xMax, box.xMin, box.xMax);
        uniteAxis(_bounds.yMin, _bounds.yMax, box.yMin, box.yMax);
        uniteAxis(_bounds.zMin, _bounds.zMax, box.zMin, box.zMax);
    }
    const float dx = axisExtent(_bounds.xMin, _bounds.xMax);
    const float dy = axisExtent(_bounds.yMin, _bounds.yMax);
    const float dz = axisExtent(_bounds.zMin, _bounds.zMax);
    const float diagonal = std::sqrt(dx * dx + dy * dy + dz * dz);
    const float smallest = std::numeric_limits<float>::min();  // 1.1754944e-38
    const float epsilon = diagonal * 1e-06f;
    // Written so that a diagonal that is not a number still yields the floor.
    _boundsEpsilon = epsilon >= smallest ? epsilon : smallest;
}

void RsScene::dump(std::ostream& os) const {
    os << " _geomInstances:";
    for (const auto& instance : _geomInstances) os << ' ' << static_cast<const void*>(instance.get());
    os << " _lights:";
    for (const auto& light : _lights) os << ' ' << static_cast<const void*>(light.get());
    os << " _cameras:";
    for (const auto& camera : _cameras) os << ' ' << static_cast<const void*>(camera.get());
    os << " _bounds:";
    _bounds.dump(os);
    os << " _boundsEpsilon: " << _boundsEpsilon;
}

}  // namespace Zr
