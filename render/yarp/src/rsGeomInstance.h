#pragma once
// One drawable object of a renderer scene: a mesh, the matrix that places it in the world, the
// shaders of its face groups, the lights linked to it, its drawing attributes, and the members
// that each render call rewrites (object to camera matrix, camera-space box, crossed frustum
// planes). It is a record that the culling pass, the region drawing and the shadow passes read;
// it draws nothing itself.
#include <cstdint>
#include <ostream>
#include <set>
#include <string>
#include <vector>

#include "geAffineMatrix3.h"
#include "geAlignedBox3.h"
#include "rcBase.h"
#include "rcShdPtr.h"
#include "rsMaterialShader.h"
#include "sdInstanceAttributes.h"
#include "sdMesh.h"

namespace Zr {

class RsScene;

class RsGeomInstance : public RCObject {
public:
    using MaterialList = std::vector<RCShdPtr<RsMaterialShader>>;
    using LightSet = std::set<unsigned int>;

    // Copies both shader lists element by element (each element gains a reference), the
    // attribute block whole, and the light table without its repeats. The per-call members start
    // as the identity, the empty box and no crossed plane.
    RsGeomInstance(const GeAffineMatrix3<float>& matrix, const RCShdPtr<const SdMesh>& mesh,
                   const MaterialList& materials, const MaterialList& shadowMaterials,
                   SdInstanceAttributes attributes, const std::vector<unsigned int>& lightTable);
    ~RsGeomInstance() override;

    RsGeomInstance(const RsGeomInstance&) = delete;
    RsGeomInstance& operator=(const RsGeomInstance&) = delete;

    // Called once on each instance when a renderer scene has been made, before its shaders are
    // initialised. Does nothing here; derived instances may prepare per-scene data.
    virtual void initialize(RCShdPtr<RsScene>& scene);

    // The world-space box: the mesh's object-space box with its eight corners taken through
    // _matrix. Fails with ExNullPtr without a mesh.
    GeAlignedBox3<float> getBoundingBox() const;

    // The box around the eight corners of box after the transform (corner bit 0 picks the x end,
    // bit 1 the y end, bit 2 the z end), folded per axis with a minimum and a maximum. The world
    // box and the culling pass's camera box are both made this way.
    static GeAlignedBox3<float> transformBoxCorners(const GeAffineMatrix3<float>& matrix,
                                                    const GeAlignedBox3<float>& box);

    // The drawing attributes as one block, as they came from the scene description.
    SdInstanceAttributes getAttributes() const;

    void dump(std::ostream& os) const;

    // Object to world; fixed after construction.
    GeAffineMatrix3<float> _matrix;
    RCShdPtr<const SdMesh> _mesh;
    // One shader per material of the instance, and one shadow shader per material, in the order
    // of the instance's material list.
    MaterialList _materials;
    MaterialList _shadowMaterials;

    // The attribute block of the scene description, member for member.
    std::int32_t _renderOrder = 0;  // primary drawing order, also a depth offset
    bool _visible = true;           // false keeps it out of the camera's list
    bool _castsShadows = true;      // true lets it into the lights' caster lists
    bool _receivesShadows = true;   // handed to the shading context
    bool _drawFrontFaces = true;
    bool _drawBackFaces = true;

    // The numbers of the lights linked to the instance, each once.
    LightSet _lights;

    // The name of the scene description's instance, for the passes that name objects.
    std::string _name;

    // Written by each render call for the instances it considers: object to camera space, the
    // box in camera space, and the frustum planes that the box crosses.
    GeAffineMatrix3<float> _toCamera;
    GeAlignedBox3<float> _cameraBox;
    unsigned int _clipMask = 0;
};

}  // namespace Zr
