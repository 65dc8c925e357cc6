#pragma once
// Small helpers with which a host puts a renderer scene together by hand: materials, instances
// with one material shader per material, the scene itself, and a camera aimed at a point.
//
// An instance's face group g is drawn with material g modulo the number of materials; each
// material gets a shader of its own from a ShaderMaker (by default ZrDiffuseShader). Shadow
// shaders are left out: the scenes made here have no lights.
#include <functional>
#include <vector>

#include "coRgbColorTyped.h"
#include "geAffineMatrix3.h"
#include "gePoint3.h"
#include "rcShdPtr.h"
#include "rsGeomInstance.h"
#include "rsMaterialShader.h"
#include "rsScene.h"
#include "sdInstance.h"
#include "sdMaterial.h"
#include "sdMesh.h"

namespace Zr {

class ZrSceneKit {
public:
    using ShaderMaker = std::function<RCShdPtr<RsMaterialShader>(const RCShdPtr<const SdMaterial>&)>;
    using MaterialList = std::vector<RCShdPtr<const SdMaterial>>;

    // The maker of the host's own shader.
    static ShaderMaker diffuseShaderMaker();

    // A material of the given colour and opacity, composited in the given mode.
    static RCShdPtr<SdMaterial> makeMaterial(const CoRgbColorTyped<float>& diffuse, float opacity = 1.0f,
                                             SdMaterial::TransferMode mode = SdMaterial::TransferMode::normal);

    // An instance of mesh placed by objectToWorld, one shader per material.
    static RCShdPtr<RsGeomInstance> makeInstance(const RCShdPtr<const SdMesh>& mesh, const MaterialList& materials,
                                                 const GeAffineMatrix3<float>& objectToWorld,
                                                 const ShaderMaker& shaderMaker);

    // A scene of the instances, without lights or cameras.
    static RCShdPtr<RsScene> makeScene(std::vector<RCShdPtr<RsGeomInstance>> instances);

    // A perspective camera at eye looking at target with world +y up, with the given vertical
    // field of view in degrees, for pictures of width over height aspect.
    static RCShdPtr<SdInstance> makeCamera(const GePoint3<double>& eye, const GePoint3<double>& target,
                                           double fieldOfViewDegrees, double aspect, float nearPlane, float farPlane);

    // The frame of an eye at eye looking at target, with up (world +y unless given) pointing up in
    // the view, as the matrix from its own space to the world: its -z axis points at the target, as
    // cameras, spot lights and direct lights look. An up along the line of sight is replaced by
    // another axis. Computed in double precision and rounded once to float.
    static GeAffineMatrix3<float> makeLookAt(const GePoint3<double>& eye, const GePoint3<double>& target,
                                             const GeVector3<double>& up = {0, 1, 0});

    // A placement: scaled evenly by scale, turned by angleDegrees about axis, then moved to
    // position. Computed in double precision and rounded once to float.
    static GeAffineMatrix3<float> makePlacement(const GePoint3<double>& position, const GeVector3<double>& axis = {0, 1, 0},
                                                double angleDegrees = 0.0, double scale = 1.0);
};

}  // namespace Zr
