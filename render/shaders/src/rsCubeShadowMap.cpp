#include "rsCubeShadowMap.h"

#include <bit>
#include <cmath>
#include <cstdint>

#include "geAlignedBox3.h"
#include "geCameraBuilder.h"
#include "geVector3.h"
#include "rsScene.h"

namespace Zr {

namespace {

// The faces' common opening, 95 degrees in radians: 5 degrees beyond the quarter turn so that
// neighbouring faces overlap.
const float kFieldOfView = std::bit_cast<float>(std::uint32_t{0x3fd43b67});

// The near distance as a part of the far one.
constexpr double kNearToFar = 0.0001;

// Each face's rotation from world directions to the face camera's, which looks down its negative
// z axis. Given as storage entries 0-2, 4-6 and 8-10 of the matrix, that is column after column.
constexpr float kFaceRotations[RsCubeShadowMap::kFaceCount][9] = {
    {1, 0, 0, 0, 0, -1, 0, 1, 0},   // looks along +y
    {1, 0, 0, 0, 0, 1, 0, -1, 0},   // -y
    {0, 0, 1, 0, 1, 0, -1, 0, 0},   // -x
    {0, 0, -1, 0, 1, 0, 1, 0, 0},   // +x
    {1, 0, 0, 0, 1, 0, 0, 0, 1},    // -z
    {-1, 0, 0, 0, 1, 0, 0, 0, -1},  // +z
};

GeAffineMatrix3<float> makeFaceRotation(int face) {
    GeAffineMatrix3<float> r;
    for (int col = 0; col < 3; ++col)
        for (int row = 0; row < 3; ++row) r._m[4 * col + row] = kFaceRotations[face][3 * col + row];
    return r;
}

}  // namespace

RsCubeShadowMap::RsCubeShadowMap() = default;

RsCubeShadowMap::~RsCubeShadowMap() = default;

RsCubeShadowMap::CubeFace RsCubeShadowMap::chooseFace(const GeVector3<float>& q) {
    const float ax = std::fabs(q.x);
    const float ay = std::fabs(q.y);
    const float az = std::fabs(q.z);
    if (ay > az) {
        if (!(ax > ay)) return q.y > 0.0f ? FacePositiveY : FaceNegativeY;
    } else if (!(ax > az)) {
        return q.z > 0.0f ? FacePositiveZ : FaceNegativeZ;
    }
    return q.x > 0.0f ? FacePositiveX : FaceNegativeX;
}

const RsShadowMap& RsCubeShadowMap::pickFace(const GePoint3<float>& point) const {
    return _faces[chooseFace(_cameraMatrix.transformPoint(point) - _center)];
}

CoRgbColorTyped<float> RsCubeShadowMap::computeBestShadow(const GePoint3<float>& point) const {
    return pickFace(point).computeBestShadow(point);
}

CoRgbColorTyped<float> RsCubeShadowMap::computeFastShadow(const GePoint3<float>& point) const {
    return pickFace(point).computeFastShadow(point);
}

void RsCubeShadowMap::setSize(float size) {
    for (RsShadowMap& face : _faces) face.setSize(size);
}

void RsCubeShadowMap::setRange(float range) {
    for (RsShadowMap& face : _faces) face.setRange(range);
}

void RsCubeShadowMap::setBias(float bias) {
    for (RsShadowMap& face : _faces) face.setBias(bias);
}

void RsCubeShadowMap::setCameraMatrix(const GeAffineMatrix3<float>& cameraToWorld) {
    _cameraMatrix = cameraToWorld;
    for (RsShadowMap& face : _faces) face.setCameraMatrix(cameraToWorld);
}

void RsCubeShadowMap::setMapsCenter(const GePoint3<float>& center, const RCShdPtr<RsScene>& scene) {
    _center = center;
    // The far plane reaches the scene's farthest corner from the centre.
    GeVector3<float> nearest;
    GeVector3<float> farthest;
    scene->_bounds.computeMinMaxDistanceVectors(center, nearest, farthest);
    const float far = farthest.length();
    const float near = static_cast<float>(static_cast<double>(far) * kNearToFar);
    const GeProjectiveMatrix3<float> projection =
        GeCameraBuilder<float>::makePerspective(kFieldOfView, near, far, 1.0f);
    const GeAffineMatrix3<float> toCenter = GeAffineMatrix3<float>::makeTranslation(-center.toVector());
    for (int f = 0; f < kFaceCount; ++f) _faces[f].setMatrices(makeFaceRotation(f) * toCenter, projection);
}

void RsCubeShadowMap::dump(std::ostream& os) const {
    for (int f = 0; f < kFaceCount; ++f) {
        os << " _faces[" << f << "]:";
        _faces[f].dump(os);
    }
    os << " _cameraMatrix:";
    _cameraMatrix.dump(os);
    os << " _center:";
    _center.dump(os);
}

}  // namespace Zr
