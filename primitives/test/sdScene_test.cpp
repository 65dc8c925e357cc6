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
        for (unsigned int i = 0; i < count; ++i) instance.addMaterial(materials.emplace_back(makeShared<SdMaterial>()));
        ASSERT_EQ(instance.getMaterialCount(), count);
        for (unsigned int k = 0; k < 3 * count + 22; ++k) {  // near groups one by one, far ones at random
            const unsigned int g = k < 3 * count + 2 ? k : static_cast<unsigned int>(rng());
            EXPECT_EQ(instance.getMaterialOfGroup(g).get(), materials[g % count].get()) << g;
        }
    }
    EXPECT_THROW(SdInstance().getMaterialOfGroup(0), ExAssertionFailed);
}

// Counts the live objects of the classes below, to see that nothing outlives the last reference.
int liveObjects = 0;

struct CountedMaterial : SdMaterial {
    CountedMaterial() { ++liveObjects; }
    ~CountedMaterial() override { --liveObjects; }
};
struct CountedGeometry : SdMeshGeometry {
    explicit CountedGeometry(RCShdPtr<const SdMesh> mesh) : SdMeshGeometry(std::move(mesh)) { ++liveObjects; }
    ~CountedGeometry() override { --liveObjects; }
};
struct CountedLight : SdStdLight {
    CountedLight() { ++liveObjects; }
    ~CountedLight() override { --liveObjects; }
};

// Instances go to the list of their object's kind in the order added; the scene holds them, and
// they their objects and materials, until the last reference goes.
TEST(SdScene, AddSortsInstancesByKindAndReleasesEverythingWithTheLastReference) {
    const RCShdPtr<const SdMesh> mesh = SdMeshBuilder().setVertices({{0, 0, 0}, {1, 0, 0}, {0, 1, 0}}).build();
    RCShdPtr<const SdMaterial> shared(new CountedMaterial);
    {
        RCShdPtr<SdScene> scene = makeShared<SdScene>();
        const auto camera = makeShared<SdInstance>(makeShared<SdCamera>());
        const auto light = makeShared<SdInstance>(RCShdPtr<SdObject>(new CountedLight));
        const auto light2 = makeShared<SdInstance>(makeShared<SdStdLight>());
        std::vector<RCShdPtr<SdInstance>> geometry;
        for (int i = 0; i < 3; ++i) {
            geometry.push_back(makeShared<SdInstance>(RCShdPtr<SdObject>(new CountedGeometry(mesh))));
            geometry.back()->addMaterial(shared);
            geometry.back()->addMaterial(RCShdPtr<const SdMaterial>(new CountedMaterial));
        }
        for (const auto& instance : {camera, geometry[0], light, geometry[1], light2, geometry[2]})
            scene->add(instance);
        EXPECT_EQ(scene->getGeometry(), geometry);
        EXPECT_EQ(scene->getCameras(), (SdScene::InstanceList{camera}));
        EXPECT_EQ(scene->getLights(), (SdScene::InstanceList{light, light2}));
        // Neither an empty instance nor one holding a material belongs to a list.
        EXPECT_THROW(scene->add(makeShared<SdInstance>()), ExAssertionFailed);
        EXPECT_THROW(scene->add(makeShared<SdInstance>(makeShared<SdMaterial>())), ExAssertionFailed);
        EXPECT_EQ(scene->getGeometry().size() + scene->getCameras().size() + scene->getLights().size(), 6u);
        EXPECT_EQ(liveObjects, 1 + 3 * 2 + 1);
        EXPECT_EQ(shared->getReferenceCount(), 4);  // the test's and one from each instance
        EXPECT_EQ(mesh->getReferenceCount(), 4);
        const RCShdPtr<SdInstance> kept = geometry[1];
        geometry.clear();
        scene = nullptr;  // an instance kept beyond the scene keeps its own objects alive
        EXPECT_EQ(liveObjects, 1 + 2 + 1);
        EXPECT_EQ(light->getReferenceCount() + shared->getReferenceCount() + kept->getReferenceCount(), 4);
    }
    EXPECT_EQ(liveObjects, 1);
    EXPECT_EQ(shared->getReferenceCount() + mesh->getReferenceCount(), 2);
    shared = nullptr;
    EXPECT_EQ(liveObjects, 0);
}

}  // namespace
}  // namespace Zr
