#include "rsGeomInstance.h"

#include <typeinfo>

#include "gePoint3.h"
#include "rcExUtil.h"

namespace Zr {

// The attribute block is copied member by member below; a field added to it must be added here.
static_assert(sizeof(SdInstanceAttributes) == 12,
              "the attribute block is a 32-bit order and five flags; copy any new field");

RsGeomInstance::RsGeomInstance(const GeAffineMatrix3<float>& matrix, const RCShdPtr<const SdMesh>& mesh,
                               const MaterialList& materials, const MaterialList& shadowMaterials,
                               SdInstanceAttributes attributes, const std::vector<unsigned int>& lightTable)
    : _matrix(matrix),
      _mesh(mesh),
      _materials(materials),
      _shadowMaterials(shadowMaterials),
      _renderOrder(attributes._renderOrder),
      _visible(attributes._visible),
      _castsShadows(attributes._castsShadows),
      _receivesShadows(attributes._receivesShadows),
      _drawFrontFaces(attributes._drawFrontFaces),
      _drawBackFaces(attributes._drawBackFaces),
      _lights(lightTable.begin(), lightTable.end()) {}

RsGeomInstance::~RsGeomInstance() = default;

void RsGeomInstance::initialize(RCShdPtr<RsScene>& /*scene*/) {}

GeAlignedBox3<float> RsGeomInstance::transformBoxCorners(const GeAffineMatrix3<float>& matrix,
                                                         const GeAlignedBox3<float>& box) {
    GeAlignedBox3<float> result;
    for (int corner = 0; corner < 8; ++corner) {
        const GePoint3<float> p = matrix.transformPoint(box.getCorner(corner));
        // Per axis with a minimum and a maximum, so that a mirroring matrix still gives a
        // well-ordered box.
        result.grow(p);
    }
    return result;
}

GeAlignedBox3<float> RsGeomInstance::getBoundingBox() const {
    if (_mesh.isNull()) RCExUtil::throwExNullPtr(typeid(SdMesh).name());
    GeAlignedBox3<float> objectBox;
    _mesh->getBoundingBox(objectBox);
    return transformBoxCorners(_matrix, objectBox);
}

SdInstanceAttributes RsGeomInstance::getAttributes() const {
    SdInstanceAttributes attributes;
    attributes._renderOrder = _renderOrder;
    attributes._visible = _visible;
    attributes._castsShadows = _castsShadows;
    attributes._receivesShadows = _receivesShadows;
    attributes._drawFrontFaces = _drawFrontFaces;
    attributes._drawBackFaces = _drawBackFaces;
    return attributes;
}

void RsGeomInstance::dump(std::ostream& os) const {
    os << " _matrix:";
    _matrix.dump(os);
    os << " _mesh: " << static_cast<const void*>(_mesh.get());
    os << " _materials:";
    for (const auto& material : _materials) os << ' ' << static_cast<const void*>(material.get());
    os << " _shadowMaterials:";
    for (const auto& material : _shadowMaterials) os << ' ' << static_cast<const void*>(material.get());
    getAttributes().dump(os);
    os << " _lights:";
    for (unsigned int light : _lights) os << ' ' << light;
    os << " _toCamera:";
    _toCamera.dump(os);
    os << " _cameraBox:";
    _cameraBox.dump(os);
    os << " _clipMask: " << _clipMask;
}

}  // namespace Zr
