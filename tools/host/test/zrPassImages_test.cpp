// The compositing passes of the sample scene (all in the normal mode) rendered as tiles on several threads and read back
// from their OpenEXR files: the layers carry the conventional channel names and the picture
// unchanged, both files are the same on any number of threads, every deep pixel laid front to
// back gives the picture's pixel, Z is the depth of its opaque sample, and with the camera rising
// from one frame to the next the motion pass points down the picture as it is viewed; the ID
// mattes name the scene's objects and materials and give each its coverage of the deep pixels.
#include <gtest/gtest.h>

#include <bit>
#include <filesystem>
#include <limits>
#include <map>
#include <regex>
#include <string>
#include <vector>

#include <OpenImageIO/deepdata.h>

#include "zrCryptomatte.h"
#include "zrPassImages.h"
#include "zrSampleScene.h"
#include "zrTileRenderer.h"

namespace Zr {
namespace {

struct Rendered {
    OIIO::ImageBuf picture, layers, deep;
};

// deep asks for the deep image; the passes read its samples back either way.
Rendered renderWithPasses(int threads, int width, int height, bool deep = true) {
    // A deep sample is a layer laid "over" what lies behind; the sample scene's one material of
    // the screen mode, which is not, is made normal here; the last instance and its material lose
    // their names. Each thread has a description of its own.
    const auto momentAt = [width, height](double seconds) {
        const RCShdPtr<SdScene> description = ZrSampleScene::makeDescription();
        for (const RCShdPtr<SdInstance>& instance : description->getGeometry()) {
            std::vector<RCShdPtr<const SdMaterial>> materials;
            for (const RCShdPtr<const SdMaterial>& m : instance->getMaterials()) {
                RCShdPtr<SdMaterial> copy = makeShared<SdMaterial>(*m);
                copy->_transferMode = SdMaterial::TransferMode::normal;
                if (instance == description->getGeometry().back()) copy->_name.clear();
                materials.push_back(copy);
            }
            instance->setMaterials(materials);
        }
        description->getGeometry().back()->setName("");
        // The camera rises half a unit a frame (at 24 per second): the scene sinks in the picture.
        const RCShdPtr<SdInstance> camera = ZrSampleScene::makeCamera(width, height);
        camera->setMatrix(GeAffineMatrix3<float>::makeTranslation({0.0f, float(12 * seconds), 0.0f}) *
                          camera->getMatrix());
        return ZrTileRenderer::momentOf(description, camera);
    };
    ZrPassImages passes(ZrPassImages::parse("z,n,p,uv,id,motion,crypto"), deep, width, height);
    ZrRenderSettings settings;
    settings.floatPixels = true;
    settings.tileSize = 32;
    settings.threads = threads;
    settings.passes = &passes;
    Rendered r;
    r.picture = ZrTileRenderer::render(momentAt, 0.0, width, height, settings);
    const std::string dir = ::testing::TempDir();
    const std::string layers = dir + "zrPasses" + std::to_string(threads) + ".exr";
    const std::string deepFile = dir + "zrDeep" + std::to_string(threads) + ".exr";
    ZrPassImages::writeExr(layers, passes.layers(r.picture));
    ZrPassImages::writeExr(deepFile, passes.deepImage());
    r.layers.reset(layers);
    r.deep.reset(deepFile);
    EXPECT_TRUE(r.layers.read(0, 0, true, OIIO::TypeDesc::FLOAT)) << r.layers.geterror();
    EXPECT_TRUE(r.deep.read(0, 0, true, OIIO::TypeDesc::FLOAT)) << r.deep.geterror();
    std::filesystem::remove(layers);
    std::filesystem::remove(deepFile);
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
            for (int c = 0; c < deepOne.channels(); ++c)
                ASSERT_EQ(deepOne.deep_value(p, c, s), deepThree.deep_value(p, c, s));
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

// The matte of each name, summed over the ranks whose ID the manifest gives the name, against
// the shares of the deep samples of the name's renderer ID laid front to back; ranks run by
// decreasing coverage. The metadata keys are the first hex digits of the layer names' hashes.
// The tiles gather the deep samples for the mattes without a deep image asked for.
TEST(ZrPassImages, CryptoMattesGiveEachNameOfTheSceneItsCoverageOfTheDeepPixels) {
    const Rendered r = renderWithPasses(2, 96, 72, false);
    const std::vector<float> layered = valuesOf(r.layers);
    const OIIO::DeepData& deep = *r.deep.deepdata();
    struct Type {
        const char *layer, *key, *deepId;
        std::vector<std::string> names;  // by renderer ID from 1
    };
    for (const Type& type :
         {Type{"CryptoObject", "3ae39a5", "ObjectID", {"ground", "redSphere", "greenTorus", "blueCube", "object5"}},
          Type{"CryptoMaterial", "be359d6", "MaterialID",
               {"lightCells", "darkCells", "redGloss", "greenDiffuse", "blueScreen", "material6"}}}) {
        const std::string prefix = std::string("cryptomatte/") + type.key + "/";
        EXPECT_EQ(r.layers.spec().get_string_attribute(prefix + "name"), type.layer);
        const std::string manifest = r.layers.spec().get_string_attribute(prefix + "manifest");
        std::map<std::string, std::uint32_t> ids;
        const std::regex entry("\"([^\"]*)\":\"([0-9a-f]{8})\"");
        for (std::sregex_iterator m(manifest.begin(), manifest.end(), entry); m != std::sregex_iterator(); ++m)
            ids[(*m)[1]] = std::uint32_t(std::stoul((*m)[2], nullptr, 16));
        ASSERT_EQ(ids.size(), type.names.size()) << manifest;
        for (std::size_t k = 0; k < type.names.size(); ++k) {
            ASSERT_EQ(ids.count(type.names[k]), 1u) << manifest;
            const float id = std::bit_cast<float>(ids[type.names[k]]);
            int partial = 0;
            for (std::int64_t p = 0; p < deep.pixels(); ++p) {
                double covered = 0.0, coverage = 0.0;
                for (int s = 0; s < int(deep.samples(p)); ++s) {
                    const double share = deep.deep_value(p, r.deep.spec().channelindex("A"), s) * (1.0 - covered);
                    covered += share;
                    if (deep.deep_value(p, r.deep.spec().channelindex(type.deepId), s) == float(k + 1))
                        coverage += share;
                }
                double matte = 0.0;
                float above = std::numeric_limits<float>::max();
                for (int rank = 0; rank < ZrCryptomatte::kRanks; ++rank) {
                    const std::string layer = type.layer + std::string("0") + char('0' + rank / 2);
                    const char* const channels[2][2] = {{".R", ".G"}, {".B", ".A"}};
                    const auto at = [&](const char* c) {
                        return layered[std::size_t(p) * r.layers.nchannels() + r.layers.spec().channelindex(layer + c)];
                    };
                    const float rankCoverage = at(channels[rank % 2][1]);
                    EXPECT_LE(rankCoverage, above) << type.layer << " rank " << rank << " at pixel " << p;
                    above = rankCoverage;
                    if (at(channels[rank % 2][0]) == id) matte += rankCoverage;
                }
                EXPECT_NEAR(matte, coverage, 1e-6) << type.names[k] << " at pixel " << p;
                if (coverage > 0.01 && coverage < 0.99) ++partial;
            }
            EXPECT_GT(partial, 0) << type.names[k];
        }
    }
}

// IDs are the hashes' bits, except that those whose exponent bits are all 0 or all 1 have bit 23
// flipped, which leaves no ID zero, denormal, infinite or NaN.
TEST(ZrCryptomatte, HashesOfZeroOrFullExponentBecomeNormalFloats) {
    const std::uint32_t cases[][2] = {{0x3f800000, 0x3f800000}, {0x00800000, 0x00800000}, {0x7f7fffff, 0x7f7fffff},
                                      {0x00000000, 0x00800000}, {0x807fffff, 0x80ffffff}, {0x7f800000, 0x7f000000},
                                      {0xffc00001, 0xff400001}};
    for (const auto& [hash, bits] : cases)
        EXPECT_EQ(std::bit_cast<std::uint32_t>(ZrCryptomatte::idOf(hash)), bits) << std::hex << hash;
}

}  // namespace
}  // namespace Zr
