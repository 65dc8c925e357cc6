#pragma once
// The common base of everything an SdInstance can place in a scene: geometry, cameras, lights, and
// of the other described things (materials, textures, meshes). Shared by reference count and
// handed about as RCShdPtr, mostly to const: the renderer never changes a described object.
//
// Each class answers its run-time type from getType(), by which registries find the code that
// handles it. A class derived by a host names its own type object (see rttiGenType.h):
//
//   class MyLight : public SdStdLight {
//   public:
//       using RttiClassType = RttiGenType1<MyLight, SdStdLight>;
//       const RttiType<SdObject>& getType() const override { return RttiClassType::getInstance(); }
//   };
#include "rcBase.h"
#include "rttiGenType.h"

namespace Zr {

class SdObject : public RCObject {
public:
    using RttiClassType = RttiGenType0<SdObject, SdObject>;

    // The run-time type of the object's class.
    virtual const RttiTypeBase& getType() const;

protected:
    SdObject() = default;
    SdObject(const SdObject&) = default;
    SdObject& operator=(const SdObject&) = default;
};

}  // namespace Zr
