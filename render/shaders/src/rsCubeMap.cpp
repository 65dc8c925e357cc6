#include "rsCubeMap.h"

#include <bit>
#include <cstdint>

#include "geAlignedBox3.h"
#include "geCameraBuilder.h"
#include "rsScene.h"
#include "rsShadowPass.h"

namespace Zr {

namespace {

// The faces' common opening, 95 degrees in radians: 5 degrees beyond the quarter turn so that
// neighbouring faces overlap.
const float kFieldOfView = std::bit_cast<float>(std::uint32_t{0x3fd43b67});

// The near distance as a part of the far one.
constexpr double kNearToFar = 0.0001;

// Each face's rotation, given as storage entries 0-2, 4-6 and 8-10 of the matrix, that is column
// after column.
constexpr float kFaceRotations[6][9] = {
    {1, 0, 0, 0, 0, -1, 0, 1, 0},   // looks along +y
    {1, 0, 0, 0, 0, 1, 0, -1, 0},   // -y
    {0, 0, 1, 0, 1, 0, -1, 0, 0},   // -x
    {0, 0, -1, 0, 1, 0, 1, 0, 0},   // +x
    {1, 0, 0, 0, 1, 0, 0, 0, 1},    // -z
    {-1, 0, 0, 0, 1, 0, 0, 0, -1},  // +z
};

}  // namespace

GeAffineMatrix3<float> rsCubeFaceRotation(int face) {
    GeAffineMatrix3<float> r;
    for (int col = 0; col < 3; ++col)
        for (int row = 0; row < 3; ++row) r._m[4 * col + row] = kFaceRotations[face][3 * col + row];
    return r;
}

GeProjectiveMatrix3<float> rsCubeProjection(const GePoint3<float>& center, const RCShdPtr<RsScene>& scene) {
    const GeAlignedBox3<float> box = RsShadowPass::computeSceneBox(*scene);
    GeVector3<float> nearest;
    GeVector3<float> farthest;
    box.computeMinMaxDistanceVectors(center, nearest, farthest);
    float far = farthest.length();
    // A scene with no geometry, or one that lies wholly at the centre, has nothing to cast a
    // shadow; any finite depth range draws its nothing alike, while 0 or infinity would make the
    // projection no number.
    if (box.isEmpty() || !(far > 0.0f) || !std::isfinite(far)) far = 1.0f;
    const float near = static_cast<float>(static_cast<double>(far) * kNearToFar);
    return GeCameraBuilder<float>::makePerspective(kFieldOfView, near, far, 1.0f);
}

}  // namespace Zr
