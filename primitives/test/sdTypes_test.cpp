// The run-time types of the scene description classes, the casts the renderer relies on, and
// the failure types of the library.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "sdCamera.h"
#include "sdEx.h"
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

TEST(SdTypes, ObjectsCastToWhatTheyAre) {
    RCShdPtr<SdObject> objects[] = {makeShared<SdStdLight>(), makeShared<SdCamera>(), makeShared<SdMeshGeometry>()};
    EXPECT_FALSE(dynamicPointerCast<SdLight>(objects[0]).isNull());
    EXPECT_TRUE(dynamicPointerCast<SdCamera>(objects[0]).isNull());
    EXPECT_FALSE(dynamicPointerCast<const SdCamera>(RCShdPtr<const SdObject>(objects[1])).isNull());
    EXPECT_FALSE(dynamicPointerCast<SdGeometry>(objects[2]).isNull());
    EXPECT_TRUE(dynamicPointerCast<SdLight>(objects[2]).isNull());
}

TEST(SdTypes, TransferModesKeepTheirNumbers) {
    using Mode = SdMaterial::TransferMode;
    const Mode modes[] = {Mode::normal,     Mode::lumapremul, Mode::dissolve,  Mode::add,
                          Mode::subtract,   Mode::multiply,   Mode::spotlight, Mode::spotlightBlend,
                          Mode::screen,     Mode::overlay,    Mode::softlight, Mode::hardlight,
                          Mode::darken,     Mode::lighten,    Mode::difference, Mode::exclusion,
                          Mode::hue,        Mode::saturation, Mode::color,     Mode::luminance};
    static_assert(sizeof(modes) / sizeof(modes[0]) == SdMaterial::transferModeCount);
    static_assert(sizeof(Mode) == 4);
    for (int i = 0; i < SdMaterial::transferModeCount; ++i) EXPECT_EQ(static_cast<int>(modes[i]), i);
    EXPECT_EQ(SdMaterial()._transferMode, Mode::normal);
}

TEST(SdEx, FailuresCarryTheirPlaceAndMessage) {
    try {
        throw SdEx::ExCantResolveBuilder(".\\primitives/sdSceneRegistry.imp", 107, "Zr::SdCamera");
    } catch (const ExBase& e) {
        EXPECT_NE(dynamic_cast<const SdEx::ExCantResolveBuilder*>(&e), nullptr);
        EXPECT_EQ(e.getFile(), ".\\primitives/sdSceneRegistry.imp");
        EXPECT_EQ(e.getLine(), 107);
        EXPECT_EQ(e.getMessage(), "Zr::SdCamera");
    }
    try {
        throw SdEx::ExDoubleRegistration("f", 74, "Zr::SdMaterial");
    } catch (const ExBase& e) {
        EXPECT_EQ(dynamic_cast<const SdEx::ExCantResolveBuilder*>(&e), nullptr);
        EXPECT_NE(std::string(e.what()).find("Zr::SdMaterial"), std::string::npos);
        EXPECT_EQ(e.getLine(), 74);
    }
}

}  // namespace
}  // namespace Zr
