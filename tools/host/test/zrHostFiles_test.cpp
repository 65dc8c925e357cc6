// Model files in, image files out: what the host reads from a model, and what it writes.
#include <gtest/gtest.h>

#include <cmath>
#include <filesystem>
#include <fstream>

#include <OpenImageIO/imagebufalgo.h>

#include "sdCamera.h"
#include "sdGeometry.h"
#include "sdMaterial.h"
#include "sdMesh.h"
#include "sdTextureParams.h"
#include "zrHostError.h"
#include "zrImageFile.h"
#include "zrModelFile.h"
#include "zrOptions.h"

namespace Zr {
namespace {

namespace fs = std::filesystem;
const fs::path testModels = "/usr/share/assimp/models";

class ZrHostFiles : public testing::Test {
protected:
    void SetUp() override {
        _dir = fs::temp_directory_path() / ("zrhost-" + std::to_string(::getpid()));
        fs::create_directories(_dir);
    }
    void TearDown() override { fs::remove_all(_dir); }
    std::string file(const std::string& name) const { return (_dir / name).string(); }
    void write(const std::string& name, const std::string& text) const { std::ofstream(file(name)) << text; }

    // A picture of 2 x 2 pixels, top row red and green, bottom row blue and half-transparent white.
    static OIIO::ImageBuf smallPicture(OIIO::TypeDesc type) {
        OIIO::ImageBuf picture(OIIO::ImageSpec(2, 2, 4, type));
        const float pixels[16] = {1, 0, 0, 1, 0, 1, 0, 1, 0, 0, 1, 1, 1, 1, 1, 0.4f};
        picture.set_pixels(picture.roi(), OIIO::TypeDesc::FLOAT, pixels);
        return picture;
    }

    fs::path _dir;
};

TEST_F(ZrHostFiles, AnObjWithItsMaterialAndTextureBecomesAScene) {
    ZrImageFile::write(file("tex.png"), smallPicture(OIIO::TypeDesc::UINT8), ZrImageFile::Storage::uint8);
    write("quad.mtl", "newmtl paint\nKd 0.2 0.4 0.6\nKs 0.5 0.5 0.5\nNs 32\nd 0.5\nmap_Kd tex.png\n"
                      "newmtl bare\nKd 0.9 0.1 0.1\nmap_Kd missing.png\n");
    write("quad.obj", "mtllib quad.mtl\nv 0 0 0\nv 2 0 0\nv 2 1 0\nv 0 1 0\nvt 0 0\nvt 1 0\nvt 1 1\nvt 0 1\n"
                      "usemtl paint\nf 1/1 2/2 3/3 4/4\nv 0 0 -1\nv 1 0 -1\nv 0 1 -1\nusemtl bare\nf 5 6 7\n");
    const ZrModelFile model(file("quad.obj"));
    const RCShdPtr<SdScene> scene = model.sceneAt(0.0);
    ASSERT_EQ(2u, scene->getGeometry().size());
    EXPECT_EQ(3u, scene->getLights().size());  // the default rig
    // The missing texture is left out with a warning naming it; its material stays.
    ASSERT_EQ(1u, model.warnings().size());
    EXPECT_NE(std::string::npos, model.warnings()[0].find("missing.png"));

    unsigned faces = 0;
    for (const RCShdPtr<SdInstance>& instance : scene->getGeometry()) {
        const SdMaterial& material = *instance->getMaterials().at(0);
        const unsigned count = static_cast<const SdGeometry&>(*instance->getObject()).getMesh()->getFaceCount();
        faces += count;
        if (count != 2) continue;  // the quad, triangulated
        EXPECT_FLOAT_EQ(0.4f, material._diffuse.g);
        EXPECT_FLOAT_EQ(0.5f, material._specular.r);
        EXPECT_FLOAT_EQ(0.5f, material._opacity);
        EXPECT_NEAR(0.5f, material._shininess, 1e-6f);  // 2^(10 s) = 32
        ASSERT_TRUE(material._diffuseMap);
        const SdTexture& texture = *material._diffuseMap->getTexture();
        // Texture row 0 is the image's bottom row: texture coordinates count upwards.
        EXPECT_EQ(1.0f, texture.getTexel(0, 0).b);
        EXPECT_NEAR(0.4f, texture.getTexel(1, 0).a, 1.0f / 255);
        EXPECT_EQ(1.0f, texture.getTexel(0, 1).r);
    }
    EXPECT_EQ(3u, faces);
}

TEST_F(ZrHostFiles, UnreadableAndEmptyModelsFailInOneLineNamingTheFile) {
    write("junk.obj", "this is not a model\n");
    write("points.obj", "v 0 0 0\nv 1 0 0\np 1 2\n");
    for (const std::string& name : {file("absent.obj"), file("junk.obj"), file("points.obj")}) {
        try {
            ZrModelFile model(name);
            ADD_FAILURE() << name << " was read";
        } catch (const ZrHostError& e) {
            const std::string message = e.what();
            EXPECT_EQ(0u, message.find(name)) << message;
            EXPECT_EQ(std::string::npos, message.find('\n')) << message;
        }
    }
}

TEST_F(ZrHostFiles, TheFramingCameraSeesTheWholeBoxFillingThePicture) {
    ZrModelFile::Bounds bounds;
    bounds.add({-3.0, 1.0, 10.0});
    bounds.add({5.0, 1.5, 14.0});
    for (const double aspect : {0.5, 1.0, 2.5}) {
        const RCShdPtr<SdInstance> instance = ZrModelFile::frameBounds(bounds, aspect);
        GeProjectiveMatrix3<double> projection;
        static_cast<const SdCamera&>(*instance->getObject()).computeProjection(projection);
        const GeProjectiveMatrix3<double> toScreen =
            projection * GeAffineMatrix3<double>(instance->getMatrix().computeInverse());
        double reach = 0.0;
        for (int corner = 0; corner < 8; ++corner) {
            const GePoint3<double> p{corner & 1 ? bounds.hi.x : bounds.lo.x, corner & 2 ? bounds.hi.y : bounds.lo.y,
                                     corner & 4 ? bounds.hi.z : bounds.lo.z};
            const GePoint3<double> s = toScreen.transformAndProject(p);
            for (const double c : {s.x, s.y, s.z}) EXPECT_LT(std::abs(c), 1.0) << aspect << " corner " << corner;
            reach = std::max({reach, std::abs(s.x), std::abs(s.y)});
        }
        EXPECT_GT(reach, 0.3) << aspect;
    }
}

TEST_F(ZrHostFiles, FileAnimationAndCamerasComeThrough) {
    const fs::path animated = testModels / "Collada/anims_with_full_rotations_between_keys.DAE";
    const fs::path cameras = testModels / "Collada/cameras.dae";
    if (!fs::exists(animated) || !fs::exists(cameras)) GTEST_SKIP() << "assimp-testmodels is not installed";
    const ZrModelFile model(animated.string());
    const auto matrices = [&](double seconds) {
        std::vector<GeAffineMatrix3<float>> result;
        const RCShdPtr<SdScene> scene = model.sceneAt(seconds);
        for (const RCShdPtr<SdInstance>& i : scene->getGeometry()) result.push_back(i->getMatrix());
        return result;
    };
    EXPECT_NE(matrices(0.0), matrices(0.5));

    const ZrModelFile withCameras(cameras.string());
    ASSERT_FALSE(withCameras.cameraNames().empty());
    const std::string last = withCameras.cameraNames().back();
    EXPECT_TRUE(withCameras.cameraAt(last, 0.0, 1.5));
    try {
        withCameras.cameraAt("no such camera", 0.0, 1.5);
        ADD_FAILURE() << "an unknown camera was found";
    } catch (const ZrHostError& e) {
        EXPECT_NE(std::string::npos, std::string(e.what()).find(last)) << e.what();
    }
}

TEST_F(ZrHostFiles, PicturesGoToFilesInTheirStorage) {
    struct Case { const char* name; ZrImageFile::Storage storage; float tolerance; };
    for (const Case& c : {Case{"p.png", ZrImageFile::Storage::uint8, 0.0f},
                          Case{"p.tif", ZrImageFile::Storage::uint8, 0.0f},
                          Case{"p.exr", ZrImageFile::Storage::half, 1e-3f}}) {
        const bool isFloat = c.storage != ZrImageFile::Storage::uint8;
        const OIIO::ImageBuf picture = smallPicture(isFloat ? OIIO::TypeDesc::FLOAT : OIIO::TypeDesc::UINT8);
        EXPECT_EQ(c.storage, ZrImageFile::storageFor(file(c.name), false));
        ZrImageFile::write(file(c.name), picture, c.storage);
        // Stored as given: no premultiplication on either side.
        const ZrImageFile::Difference difference = ZrImageFile::compare(ZrImageFile::read(file(c.name)), picture, c.tolerance);
        EXPECT_FALSE(difference.any()) << c.name << ": " << difference.describe();
    }
    // A format without alpha drops it; it reads back as 1.
    ZrImageFile::write(file("p.jpg"), smallPicture(OIIO::TypeDesc::UINT8), ZrImageFile::Storage::uint8);
    const OIIO::ImageBuf alpha = OIIO::ImageBufAlgo::channels(ZrImageFile::read(file("p.jpg")), 1, {3});
    EXPECT_FALSE(ZrImageFile::compare(alpha, OIIO::ImageBufAlgo::fill({1.0f}, alpha.roi()), 0.0f).any());
    EXPECT_EQ(ZrImageFile::Storage::float32, ZrImageFile::storageFor(file("f.exr"), true));
    EXPECT_THROW(ZrImageFile::storageFor(file("f.png"), true), ZrHostError);
    EXPECT_THROW(ZrImageFile::storageFor(file("f.nosuchformat"), false), ZrHostError);
    // An output that cannot be written fails and leaves nothing behind.
    const std::string unwritable = file("no/such/folder/p.png");
    EXPECT_THROW(ZrImageFile::write(unwritable, smallPicture(OIIO::TypeDesc::UINT8), ZrImageFile::Storage::uint8),
                 ZrHostError);
    EXPECT_FALSE(fs::exists(file("no")));
}

TEST(ZrOptions, FramePatternsNumberTheOutput) {
    ZrOptions options;
    const struct { const char* pattern; int frame; const char* name; } table[] = {
        {"out.####.exr", 7, "out.0007.exr"}, {"out.#.png", 123, "out.123.png"},
        {"a#b##.tif", 5, "a5b05.tif"},       {"still.png", 9, "still.png"},
    };
    for (const auto& row : table) {
        options.output = row.pattern;
        EXPECT_EQ(row.name, options.outputOfFrame(row.frame));
    }
}

}  // namespace
}  // namespace Zr
