// The compositing passes of the sample scene (all in the normal mode) rendered as tiles on several threads and read back
// from their OpenEXR files: the layers carry the conventional channel names and the picture
// unchanged, both files are the same on any number of threads, every deep pixel laid front to
// back gives the picture's pixel, Z is the depth of its opaque sample, and with the camera rising
// from one frame to the next the motion pass points down the picture as it is viewed.
#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <vector>

#include <OpenImageIO/deepdata.h>

#include "zrPassImages.h"
#include "zrSampleScene.h"
#include "zrTileRenderer.h"

namespace Zr {
namespace {

struct Rendered {
    OIIO::ImageBuf picture, layers, deep;
};

Rendered renderWithPasses(int threads, int width, int height) {
    // A deep sample is a layer laid "over" what lies behind; the sample scene's one material of
    // the screen mode, which is not, is made normal here. Each thread has a description of its own.
    const auto momentAt = [width, height](double seconds) {
        const RCShdPtr<SdScene> description = ZrSampleScene::makeDescription();
        for (const RCShdPtr<SdInstance>& instance : description->getGeometry()) {
            std::vector<RCShdPtr<const SdMaterial>> materials;
            for (const RCShdPtr<const SdMaterial>& m : instance->getMaterials()) {
                RCShdPtr<SdMaterial> copy = makeShared<SdMaterial>(*m);
                copy->_transferMode = SdMaterial::TransferMode::normal;
                materials.push_back(copy);
            }
            instance->setMaterials(materials);
        }
        // The camera rises half a unit a frame (at 24 per second): the scene sinks in the picture.
        const RCShdPtr<SdInstance> camera = ZrSampleScene::makeCamera(width, height);
        camera->setMatrix(GeAffineMatrix3<float>::makeTranslation({0.0f, float(12 * seconds), 0.0f}) *
                          camera->getMatrix());
        return ZrTileRenderer::momentOf(description, camera);
    };
    ZrPassImages passes(ZrPassImages::parse("z,n,p,uv,id,motion"), true, width, height);
    ZrRenderSettings settings;
    settings.floatPixels = true;
    settings.tileSize = 32;
    settings.threads = threads;
    settings.passes = &passes;
    Rendered r;
    r.picture = ZrTileRenderer::render(momentAt, 0.0, width, height, settings);
    const std::string dir = ::testing::TempDir();
    const std::string layers = dir + "zrPasses" + std::to_string(threads) + ".exr";
    const std::string deep = dir + "zrDeep" + std::to_string(threads) + ".exr";
    ZrPassImages::writeExr(layers, passes.layers(r.picture));
    ZrPassImages::writeExr(deep, passes.deepImage());
    r.layers.reset(layers);
    r.deep.reset(deep);
    EXPECT_TRUE(r.layers.read(0, 0, true, OIIO::TypeDesc::FLOAT)) << r.layers.geterror();
    EXPECT_TRUE(r.deep.read(0, 0, true, OIIO::TypeDesc::FLOAT)) << r.deep.geterror();
    std::filesystem::remove(layers);
    std::filesystem::remove(deep);
    return r;
}

std::vector<float> valuesOf(const OIIO::ImageBuf& image) {
    std::vector<float> values(static_cast<std::size_t>(image.spec().image_pixels()) * image.nchannels());
    EXPECT_TRUE(image.get_pixels(image.roi(), OIIO::TypeDesc::FLOAT, values.data()));
    return values;
}

TEST(ZrPassImages, FilesHoldThePassesAndTheDeepPixelsFlattenToThePicture) {
    constexpr int width = 96, height = 72;
    const Rendered one = renderWithPasses(1, width, height);
    const Rendered three = renderWithPasses(3, width, height);

    std::vector<std::string> names;
    for (int c = 0; c < one.layers.nchannels(); ++c) names.push_back(one.layers.spec().channel_name(c));
    for (const char* name : {"R", "G", "B", "A", "Z", "N.X", "N.Y", "N.Z", "P.X", "P.Y", "P.Z", "UV.U", "UV.V",
                             "ObjectID", "MaterialID", "motion.u", "motion.v"})
        EXPECT_NE(std::find(names.begin(), names.end(), name), names.end()) << name;
    EXPECT_EQ(valuesOf(one.layers), valuesOf(three.layers));
    const OIIO::DeepData& deepOne = *one.deep.deepdata();
    const OIIO::DeepData& deepThree = *three.deep.deepdata();
    ASSERT_EQ(deepOne.pixels(), deepThree.pixels());
    for (std::int64_t p = 0; p < deepOne.pixels(); ++p) {
        ASSERT_EQ(deepOne.samples(p), deepThree.samples(p));
        for (int s = 0; s < int(deepOne.samples(p)); ++s)
            for (int c = 0; c < 6; ++c) ASSERT_EQ(deepOne.deep_value(p, c, s), deepThree.deep_value(p, c, s));
    }

    // The picture's pixels, as read back from the layers, against the deep pixels laid front to back.
    const std::vector<float> layered = valuesOf(one.layers);
    const int channels = one.layers.nchannels();
    const int rgba[4] = {one.layers.spec().channelindex("R"), one.layers.spec().channelindex("G"),
                         one.layers.spec().channelindex("B"), one.layers.spec().channelindex("A")};
    const int z = one.deep.spec().channelindex("Z");
    int layeredPixels = 0;
    for (std::int64_t p = 0; p < deepOne.pixels(); ++p) {
        double flat[4] = {0, 0, 0, 0};
        float last = 0.0f;
        for (int s = 0; s < int(deepOne.samples(p)); ++s) {
            const double keep = 1.0 - flat[3];
            for (int c = 0; c < 4; ++c) flat[c] += keep * deepOne.deep_value(p, one.deep.spec().channelindex(
                                                                                     std::string(1, "RGBA"[c])), s);
            EXPECT_GE(deepOne.deep_value(p, z, s), last) << "samples run front to back at pixel " << p;
            last = deepOne.deep_value(p, z, s);
        }
        if (deepOne.samples(p) > 1) ++layeredPixels;
        // Z is the depth of the front-most opaque fragment, which is the pixel's last sample.
        const int n = int(deepOne.samples(p));
        const bool opaque = n > 0 && deepOne.deep_value(p, one.deep.spec().channelindex("A"), n - 1) >= 0.9999999f;
        EXPECT_NEAR(layered[std::size_t(p) * channels + one.layers.spec().channelindex("Z")], opaque ? last : 0.0f,
                    1e-5f * last)
            << "pixel " << p;
        for (int c = 0; c < 4; ++c)
            EXPECT_NEAR(flat[c], layered[std::size_t(p) * channels + rgba[c]], 2e-6) << "pixel " << p << " channel " << c;
    }
    EXPECT_GT(layeredPixels, 100) << "the sample scene's transparent objects";

    // Motion: down the picture as viewed, wherever something opaque was drawn.
    const int id = one.layers.spec().channelindex("ObjectID"), v = one.layers.spec().channelindex("motion.v");
    for (std::size_t p = 0; p < layered.size() / channels; ++p)
        if (layered[p * channels + id] > 0) {
            EXPECT_LT(layered[p * channels + v], 0.0f) << "pixel " << p;
        }
}

}  // namespace
}  // namespace Zr
