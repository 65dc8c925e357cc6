// The block test of the per-render vertex data: every face that it passes over as beside a region
// is one that the clipper's own outside test drops, so skipping it changes no picture.
#include <random>

#include <gtest/gtest.h>

#include "rsInstanceVertices.h"
#include "rsPolygonClipper.h"
#include "rsTestSupport.h"
#include "rsVertices.h"

namespace Zr {
namespace {

using RsTest::makeInstance;
using RsTest::makeMesh;

TEST(RsInstanceVertices, SkippedBlocksHoldOnlyFacesOutsideTheRegion) {
    std::mt19937 rng(20261123);
    std::uniform_real_distribution<float> coord(-3.0f, 3.0f);
    std::uniform_int_distribution<int> corner(-40, 300);
    std::uniform_int_distribution<int> extent(1, 160);
    const GeProjectiveMatrix3<float> viewport(128.0f, 0.0f, 0.0f, 128.0f,  //
                                              0.0f, 128.0f, 0.0f, 128.0f,  //
                                              0.0f, 0.0f, 0.5f, 0.5f,      //
                                              0.0f, 0.0f, 0.0f, 1.0f);
    const GeProjectiveMatrix3<float> pixelMatrix =
        viewport * GeProjectiveMatrix3<float>(RsTest::perspective(1.0, 0.5, 50.0));
    int skipped = 0;
    int kept = 0;
    for (int trial = 0; trial < 40; ++trial) {
        // Clusters of small triangles, one a block, scattered around the view, in a ragged count of faces so that the last block is partial.
        std::vector<GePoint3<float>> vertices;
        std::vector<std::uint32_t> triangles;
        const int faces = 50 + trial * 41;
        GePoint3<float> cluster;
        for (int f = 0; f < faces; ++f) {
            // Every fourth cluster sits at the eye's plane, with triangles reaching behind it.
            const int block = f / static_cast<int>(RsInstanceVertices::kFacesPerBlock);
            if (f % RsInstanceVertices::kFacesPerBlock == 0)
                cluster = {coord(rng), coord(rng), block % 4 == 3 ? 0.0f : coord(rng) - 3.5f};
            const GePoint3<float> centre(cluster.x + 0.1f * coord(rng), cluster.y + 0.1f * coord(rng),
                                         cluster.z + 0.1f * coord(rng));
            for (int c = 0; c < 3; ++c) {
                const float spread = block % 4 == 3 ? 0.3f : 0.03f;
                vertices.emplace_back(centre.x + spread * coord(rng), centre.y + spread * coord(rng),
                                      centre.z + spread * coord(rng));
                triangles.push_back(static_cast<std::uint32_t>(vertices.size() - 1));
            }
        }
        const RCShdPtr<RsGeomInstance> instance = makeInstance(makeMesh(vertices, triangles));
        instance->_toCamera = GeAffineMatrix3<float>();
        const RsInstanceVertices data(*instance, pixelMatrix, false, false);
        const SdMesh& mesh = data.getMesh();
        const auto& pixels = data.getPixelPositions();

        for (int r = 0; r < 20; ++r) {
            const int x0 = corner(rng), y0 = corner(rng);
            const GeRectangle<int> region(x0, x0 + extent(rng), y0, y0 + extent(rng));
            RsPolygonClipper<RsPlainVertex> clipper(region);
            clipper.setClipFlags(0x0fu);
            const unsigned int count = mesh.getFaceCount();
            for (unsigned int f = 0; f < count; ++f) {
                const unsigned int near = data.nextFaceNear(f, count, region);
                ASSERT_GE(near, f);
                for (; f < near; ++f) {
                    ++skipped;
                    const SdMesh::Face face = mesh.getFace(f);
                    EXPECT_TRUE(clipper.isOutside(GeHomogeneousCoord3<double>(pixels[face.getVertexIndex(0)]),
                                                  GeHomogeneousCoord3<double>(pixels[face.getVertexIndex(1)]),
                                                  GeHomogeneousCoord3<double>(pixels[face.getVertexIndex(2)])))
                        << "face " << f << " passed over";
                }
                kept += near < count;
            }
        }
    }
    // Both answers occur, so the property is not met vacuously.
    EXPECT_GT(skipped, 10000);
    EXPECT_GT(kept, 10000);

    // A face from in front of the eye, left of the picture, to behind the eye: after the division
    // every corner lies left of the picture, yet the face crosses it.
    const RCShdPtr<RsGeomInstance> crossing =
        makeInstance(makeMesh({{-1.0f, 0.0f, -1.0f}, {1.0f, 0.0f, 0.2f}, {1.0f, 1.0f, 0.2f}}, {0, 1, 2}));
    crossing->_toCamera = GeAffineMatrix3<float>();
    EXPECT_EQ(RsInstanceVertices(*crossing, pixelMatrix, false, false).nextFaceNear(0, 1, {0, 256, 0, 256}), 0u);
}

}  // namespace
}  // namespace Zr
