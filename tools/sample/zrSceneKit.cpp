#include "zrSceneKit.h"

#include <numbers>

#include "sdCamera.h"
#include "zrDiffuseShader.h"

namespace Zr {

namespace {

double radians(double degrees) { return degrees * std::numbers::pi / 180.0; }

}  // namespace

ZrSceneKit::ShaderMaker ZrSceneKit::diffuseShaderMaker() {
    return [](const RCShdPtr<const SdMaterial>& material) -> RCShdPtr<RsMaterialShader> {
        return makeShared<ZrDiffuseShader>(material);
    };
}

RCShdPtr<SdMaterial> ZrSceneKit::makeMaterial(const CoRgbColorTyped<float>& diffuse, float opacity,
                                              SdMaterial::TransferMode mode) {
    RCShdPtr<SdMaterial> material = makeShared<SdMaterial>();
    material->_diffuse = diffuse;
    material->_opacity = opacity;
    material->_transferMode = mode;
    return material;
}

RCShdPtr<RsGeomInstance> ZrSceneKit::makeInstance(const RCShdPtr<const SdMesh>& mesh, const MaterialList& materials,
                                                  const GeAffineMatrix3<float>& objectToWorld,
                                                  const ShaderMaker& shaderMaker) {
    RsGeomInstance::MaterialList shaders;
    for (const RCShdPtr<const SdMaterial>& material : materials) shaders.push_back(shaderMaker(material));
    return makeShared<RsGeomInstance>(objectToWorld, mesh, shaders, RsGeomInstance::MaterialList{},
                                      SdInstanceAttributes{}, std::vector<unsigned int>{});
}

RCShdPtr<RsScene> ZrSceneKit::makeScene(std::vector<RCShdPtr<RsGeomInstance>> instances) {
    RsScene::LightList lights;
    RsScene::CameraList cameras;
    return makeShared<RsScene>(instances, lights, cameras);
}

RCShdPtr<SdInstance> ZrSceneKit::makeCamera(const GePoint3<double>& eye, const GePoint3<double>& target,
                                            double fieldOfViewDegrees, double aspect, float nearPlane,
                                            float farPlane) {
    RCShdPtr<SdCamera> camera = makeShared<SdCamera>();
    camera->_fieldOfView = static_cast<float>(radians(fieldOfViewDegrees));
    camera->_aspect = static_cast<float>(aspect);
    camera->_near = nearPlane;
    camera->_far = farPlane;

    return makeShared<SdInstance>(camera, makeLookAt(eye, target));
}

GeAffineMatrix3<float> ZrSceneKit::makeLookAt(const GePoint3<double>& eye, const GePoint3<double>& target,
                                               const GeVector3<double>& up) {
    // The eye looks down its -z axis, so its z axis points from the target back to the eye; x is
    // to the right of the view and y completes the frame.
    const GeVector3<double> back = (eye - target).getNormalized();
    GeVector3<double> right = up.cross(back);
    if (right.length() < 1e-9 * up.length()) right = GeVector3<double>(1, 0, 0).cross(back);
    if (right.length() < 1e-9) right = GeVector3<double>(0, 0, 1).cross(back);
    right = right.getNormalized();
    const GeVector3<double> viewUp = back.cross(right);
    const GeAffineMatrix3<double> eyeToWorld(right.x, viewUp.x, back.x, eye.x,  //
                                             right.y, viewUp.y, back.y, eye.y,  //
                                             right.z, viewUp.z, back.z, eye.z);
    return GeAffineMatrix3<float>(eyeToWorld);
}

GeAffineMatrix3<float> ZrSceneKit::makePlacement(const GePoint3<double>& position, const GeVector3<double>& axis,
                                                 double angleDegrees, double scale) {
    const GeAffineMatrix3<double> placement =
        GeAffineMatrix3<double>::makeTranslation({position.x, position.y, position.z}) *
        GeAffineMatrix3<double>::makeRotation(axis, radians(angleDegrees)) *
        GeAffineMatrix3<double>::makeScale(scale, scale, scale);
    return GeAffineMatrix3<float>(placement);
}

}  // namespace Zr
