#include "rsCullAndSort.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <cstdint>

namespace Zr {

namespace {

// An admitted instance with the keys of its place in the drawing order.
struct SortEntry {
    std::int32_t renderOrder;
    float zMiddle;
    std::size_t position;  // index in the scene's list
};

// Orders z middles nearer first: greater z before smaller. A middle that is not a number (from a
// degenerate box) goes after every number, so that the ordering stays strict and weak.
// Returns -1 when a goes first, 1 when b goes first, 0 when they tie.
int compareMiddles(float a, float b) {
    const bool aNan = std::isnan(a);
    const bool bNan = std::isnan(b);
    if (aNan || bNan) return aNan == bNan ? 0 : (aNan ? 1 : -1);
    if (a > b) return -1;
    if (b > a) return 1;
    return 0;
}

// Ties go to the later instance of the scene, as the drawing order has always had it: equal
// keys mean that the later one is drawn first.
bool laterFirst(const SortEntry& a, const SortEntry& b) { return a.position > b.position; }

// The camera's order: _renderOrder ascending, then nearer first, then later first.
struct CameraOrder {
    bool operator()(const SortEntry& a, const SortEntry& b) const {
        if (a.renderOrder != b.renderOrder) return a.renderOrder < b.renderOrder;
        const int byMiddle = compareMiddles(a.zMiddle, b.zMiddle);
        if (byMiddle != 0) return byMiddle < 0;
        return laterFirst(a, b);
    }
};

// A light's caster order: nearer to the light first, then later first.
struct CasterOrder {
    bool operator()(const SortEntry& a, const SortEntry& b) const {
        const int byMiddle = compareMiddles(a.zMiddle, b.zMiddle);
        if (byMiddle != 0) return byMiddle < 0;
        return laterFirst(a, b);
    }
};

// Admits the instances whose flag (_visible or _castsShadows) is set, brings their boxes into
// the view's space, classifies them against the frustum and collects the ones not wholly
// outside, in scene order.
template <bool RsGeomInstance::*Admits>
std::vector<SortEntry> selectInstances(const RsScene& scene, const GeFrustum<double>& frustum,
                                       const GeAffineMatrix3<float>& worldToView) {
    std::vector<SortEntry> entries;
    entries.reserve(scene._geomInstances.size());
    for (std::size_t position = 0; position < scene._geomInstances.size(); ++position) {
        RsGeomInstance& instance = *scene._geomInstances[position];
        if (!(instance.*Admits)) continue;

        instance._toCamera = worldToView * instance._matrix;
        GeAlignedBox3<float> objectBox;
        instance._mesh->getBoundingBox(objectBox);
        instance._cameraBox = RsGeomInstance::transformBoxCorners(instance._toCamera, objectBox);

        const GeAlignedBox3<double> box(instance._cameraBox);
        const auto classification = frustum.classify(box, instance._clipMask, 6);
        if (classification == GeFrustum<double>::OUTSIDE) continue;

        const float zMiddle = (instance._cameraBox.zMin + instance._cameraBox.zMax) * 0.5f;
        entries.push_back({instance._renderOrder, zMiddle, position});
    }
    return entries;
}

template <class Order>
void emitSorted(const RsScene& scene, std::vector<SortEntry>& entries, Order order, RsGeomInstanceList& result) {
    std::sort(entries.begin(), entries.end(), order);
    for (const SortEntry& entry : entries) result.push_back(scene._geomInstances[entry.position]);
}

}  // namespace

void cullAndSortInstances(const RCShdPtr<RsScene>& scene, bool zBuffer, const GeFrustum<double>& frustum,
                          const GeAffineMatrix3<float>& worldToCamera, RsGeomInstanceList& result) {
    // Depth-tested and untested renders are drawn in one order, so zBuffer does not change it.
    static_cast<void>(zBuffer);
    const RsScene& theScene = *scene;
    result.reserve(theScene._geomInstances.size());
    std::vector<SortEntry> entries = selectInstances<&RsGeomInstance::_visible>(theScene, frustum, worldToCamera);
    emitSorted(theScene, entries, CameraOrder(), result);
}

void cullAndSortShadowCasters(const RCShdPtr<RsScene>& scene, const GeFrustum<double>& frustum,
                              const GeAffineMatrix3<float>& worldToLight, RsGeomInstanceList& result) {
    const RsScene& theScene = *scene;
    result.reserve(theScene._geomInstances.size());
    std::vector<SortEntry> entries =
        selectInstances<&RsGeomInstance::_castsShadows>(theScene, frustum, worldToLight);
    emitSorted(theScene, entries, CasterOrder(), result);
}

}  // namespace Zr
