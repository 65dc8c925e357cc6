#pragma once
// Something placed in a scene that yields a triangle mesh.
#include "rcShdPtr.h"
#include "sdObject.h"

namespace Zr {

class SdMesh;

class SdGeometry : public SdObject {
public:
    using RttiClassType = RttiGenType1<SdGeometry, SdObject>;
    const RttiType<SdObject>& getType() const override { return RttiClassType::getInstance(); }

    // The mesh in object space; null when the geometry has none (it is then not drawn).
    virtual RCShdPtr<const SdMesh> getMesh() const = 0;

protected:
    SdGeometry() = default;
};

}  // namespace Zr
