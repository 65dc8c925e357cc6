// Instances and scenes: cyclic materials, sorting instances into the scene's lists, and the
// lifetime of everything a scene holds.
#include <gtest/gtest.h>

#include <random>
#include <vector>

#include "exBase.h"
#include "sdCamera.h"
#include "sdMeshBuilder.h"
#include "sdMeshGeometry.h"
#include "sdScene.h"
#include "sdStdLight.h"

namespace Zr {
namespace {

TEST(SdInstance, FaceGroupsTakeMaterialsCyclically) {
    std::mt19937 rng(9);
    for (unsigned int count = 1; count <= 5; ++count) {
        SdInstance instance;
        std::vector<RCShdPtr<const SdMaterial>> materials;
        for (unsigned int i = 0; i < count; ++i) {
            materials.push_back(makeShared<SdMaterial>());
            instance.addMaterial(materials.back());
        }
        ASSERT_EQ(instance.getMaterialCount(), count);
        // Near groups one by one and far groups at random, against the remainder.
        std::uniform_int_distribution<unsigned int> far(0, 0xffffffffu);
        for (unsigned int k = 0; k < 3 * count + 22; ++k) {
            const unsigned int g = k < 3 * count + 2 ? k : far(rng);
            EXPECT_EQ(instance.getMaterialOfGroup(g).get(), materials[g % count].get()) << g;
        }
    }
    EXPECT_THROW(SdInstance().getMaterialOfGroup(0), ExAssertionFailed);
}

TEST(SdScene, AddSortsInstancesByTheKindOfTheirObject) {
    SdScene scene;
    RCShdPtr<SdInstance> camera = makeShared<SdInstance>(makeShared<SdCamera>());
    RCShdPtr<SdInstance> light1 = makeShared<SdInstance>(makeShared<SdStdLight>());
    RCShdPtr<SdInstance> geometry = makeShared<SdInstance>(makeShared<SdMeshGeometry>());
    RCShdPtr<SdInstance> light2 = makeShared<SdInstance>(makeShared<SdStdLight>());
    for (const RCShdPtr<SdInstance>& instance : {camera, light1, geometry, light2}) scene.add(instance);

    ASSERT_EQ(scene.getGeometry().size(), 1u);
    ASSERT_EQ(scene.getCameras().size(), 1u);
    ASSERT_EQ(scene.getLights().size(), 2u);
    EXPECT_EQ(scene.getGeometry()[0], geometry);
    EXPECT_EQ(scene.getCameras()[0], camera);
    EXPECT_EQ(scene.getLights()[0], light1);  // in the order added
    EXPECT_EQ(scene.getLights()[1], light2);

    // Neither an empty instance nor one holding a material belongs to a list.
    EXPECT_THROW(scene.add(makeShared<SdInstance>()), ExAssertionFailed);
    EXPECT_THROW(scene.add(makeShared<SdInstance>(makeShared<SdMaterial>())), ExAssertionFailed);
    EXPECT_EQ(scene.getGeometry().size() + scene.getCameras().size() + scene.getLights().size(), 4u);
}

// Counts the live objects of the classes below, to see that nothing outlives the last reference.
int liveObjects = 0;

class CountedMaterial : public SdMaterial {
public:
    CountedMaterial() { ++liveObjects; }
    ~CountedMaterial() override { --liveObjects; }
};
class CountedGeometry : public SdMeshGeometry {
public:
    explicit CountedGeometry(RCShdPtr<const SdMesh> mesh) : SdMeshGeometry(std::move(mesh)) { ++liveObjects; }
    ~CountedGeometry() override { --liveObjects; }
};
class CountedLight : public SdStdLight {
public:
    CountedLight() { ++liveObjects; }
    ~CountedLight() override { --liveObjects; }
};

TEST(SdScene, ReleasesEverythingWithTheLastReference) {
    RCShdPtr<const SdMesh> mesh =
        SdMeshBuilder().setVertices({{0, 0, 0}, {1, 0, 0}, {0, 1, 0}}).setTriangles({0, 1, 2}).build();
    RCShdPtr<const SdMaterial> shared(new CountedMaterial);
    {
        RCShdPtr<SdScene> scene = makeShared<SdScene>();
        for (int i = 0; i < 3; ++i) {
            RCShdPtr<SdInstance> instance = makeShared<SdInstance>(RCShdPtr<SdObject>(new CountedGeometry(mesh)));
            instance->addMaterial(shared);
            instance->addMaterial(RCShdPtr<const SdMaterial>(new CountedMaterial));
            scene->addGeometry(instance);
        }
        RCShdPtr<SdInstance> light = makeShared<SdInstance>(RCShdPtr<SdObject>(new CountedLight));
        scene->addLight(light);
        EXPECT_EQ(liveObjects, 1 + 3 * 2 + 1);
        // One reference from the test, one from each instance.
        EXPECT_EQ(shared->getReferenceCount(), 4);
        EXPECT_EQ(mesh->getReferenceCount(), 4);
        EXPECT_EQ(light->getReferenceCount(), 2);

        // An instance kept beyond the scene keeps its own objects alive, as does the light
        // instance still held here.
        RCShdPtr<SdInstance> kept = scene->getGeometry()[1];
        scene = nullptr;
        EXPECT_EQ(liveObjects, 1 + 2 + 1);
        EXPECT_EQ(light->getReferenceCount(), 1);
        EXPECT_EQ(shared->getReferenceCount(), 2);
        EXPECT_EQ(kept->getReferenceCount(), 1);
    }
    EXPECT_EQ(liveObjects, 1);
    EXPECT_EQ(shared->getReferenceCount(), 1);
    EXPECT_EQ(mesh->getReferenceCount(), 1);
    shared = nullptr;
    EXPECT_EQ(liveObjects, 0);
}

}  // namespace
}  // namespace Zr
