#pragma once
// The plainest geometry: one fixed mesh. Several instances, and several geometries, may share the
// mesh.
#include "sdGeometry.h"
#include <utility>

#include "sdMesh.h"

namespace Zr {

class SdMeshGeometry : public SdGeometry {
public:
    using RttiClassType = RttiGenType1<SdMeshGeometry, SdGeometry>;
    const RttiType<SdObject>& getType() const override { return RttiClassType::getInstance(); }

    SdMeshGeometry() = default;
    explicit SdMeshGeometry(RCShdPtr<const SdMesh> mesh) : _mesh(std::move(mesh)) {}

    RCShdPtr<const SdMesh> getMesh() const override { return _mesh; }
    void setMesh(RCShdPtr<const SdMesh> mesh) { _mesh = std::move(mesh); }

private:
    RCShdPtr<const SdMesh> _mesh;
};

}  // namespace Zr
