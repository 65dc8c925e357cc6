// The run-time types of the scene description classes and the casts the renderer relies on.
#include <gtest/gtest.h>

#include <vector>

#include "exBase.h"
#include "sdCamera.h"
#include "sdMaterial.h"
#include "sdMeshBuilder.h"
#include "sdMeshGeometry.h"
#include "sdStdLight.h"
#include "sdTexture.h"

namespace Zr {
namespace {

std::vector<const RttiTypeBase*> ancestorsOf(const RttiTypeBase& type) {
    std::vector<const RttiTypeBase*> result;
    for (ConstIterator<RttiTypeBase*> it = type.getAncestors(); !it.atEnd(); ++it) result.push_back(*it);
    return result;
}

// A host's own material and light, registered under their own types.
class GlassMaterial : public SdMaterial {
public:
    using RttiClassType = RttiGenType1<GlassMaterial, SdMaterial>;
    const RttiType<SdMaterial>& getType() const override { return RttiClassType::getInstance(); }
};
class AreaLight : public SdLight {
public:
    using RttiClassType = RttiGenType1<AreaLight, SdLight>;
    const RttiType<SdObject>& getType() const override { return RttiClassType::getInstance(); }
};

TEST(SdTypes, EachClassAnswersItsTypeWithItsAncestors) {
    const RttiTypeBase* object = &SdObject::RttiClassType::getInstance();
    const RttiTypeBase* light = &RttiGenType1<SdLight, SdObject>::getInstance();
    const RttiTypeBase* geometry = &SdGeometry::RttiClassType::getInstance();
    const RttiTypeBase* material = &RttiGenType0<SdMaterial, SdMaterial>::getInstance();

    struct Case {
        RCShdPtr<const SdObject> instance;
        const RttiTypeBase* type;
        std::vector<const RttiTypeBase*> ancestors;
    };
    const std::vector<Case> cases = {
        {makeShared<SdStdLight>(), &RttiGenType1<SdStdLight, SdLight>::getInstance(), {light, object}},
        {makeShared<AreaLight>(), &AreaLight::RttiClassType::getInstance(), {light, object}},
        {makeShared<SdCamera>(), &SdCamera::RttiClassType::getInstance(), {object}},
        {makeShared<SdMeshGeometry>(), &SdMeshGeometry::RttiClassType::getInstance(), {geometry, object}},
        {makeShared<SdTexture>(), &SdTexture::RttiClassType::getInstance(), {object}},
        {SdMeshBuilder().build(), &SdMesh::RttiClassType::getInstance(), {object}},
        // Materials root a hierarchy of their own.
        {makeShared<SdMaterial>(), material, {}},
        {makeShared<GlassMaterial>(), &GlassMaterial::RttiClassType::getInstance(), {material}},
    };
    for (const Case& c : cases) {
        const RttiTypeBase& type = c.instance->getType();
        SCOPED_TRACE(type.getName());
        EXPECT_EQ(&type, c.type);
        EXPECT_EQ(ancestorsOf(type), c.ancestors);
    }
}

TEST(SdTypes, TypesAreTypedByTheirHierarchy) {
    // What the registries of materials and lights take.
    const RttiType<SdMaterial>& material = RttiGenType0<SdMaterial, SdMaterial>::getInstance();
    const RttiType<SdObject>& stdLight = RttiGenType1<SdStdLight, SdLight>::getInstance();
    RCShdPtr<const SdMaterial> glass = makeShared<GlassMaterial>();
    const RttiType<SdMaterial>& glassType = glass->getType();
    EXPECT_TRUE(glassType.isA(material));
    RCShdPtr<const SdLight> light = makeShared<SdStdLight>();
    EXPECT_EQ(&light->getType(), &stdLight);
    // From a plain object, the light's type is found in its hierarchy by a checked cast.
    RCShdPtr<const SdObject> object = light;
    EXPECT_EQ(&RttiType<SdObject>::cast(object->getType()), &stdLight);
    EXPECT_THROW(RttiType<SdMaterial>::cast(object->getType()), ExCastFailed);
}

}  // namespace
}  // namespace Zr
