#include "sdInstance.h"

#include <utility>

#include "assertions.h"

namespace Zr {

namespace {
constexpr const char* kSourceFile = ".\\primitives/sdInstance.cpp";
}

SdInstance::SdInstance(RCShdPtr<SdObject> object, const GeAffineMatrix3<float>& matrix)
    : _matrix(matrix), _object(std::move(object)) {}

SdInstance::~SdInstance() = default;

void SdInstance::setObject(RCShdPtr<SdObject> object) { _object = std::move(object); }

void SdInstance::setMaterials(std::vector<RCShdPtr<const SdMaterial>> materials) {
    _materials = std::move(materials);
}

void SdInstance::addMaterial(RCShdPtr<const SdMaterial> material) {
    _materials.push_back(std::move(material));
}

const RCShdPtr<const SdMaterial>& SdInstance::getMaterialOfGroup(unsigned int groupIndex) const {
    ZR_ASSERT_AT(!_materials.empty(), kSourceFile, __LINE__);
    return _materials[groupIndex % _materials.size()];
}

void SdInstance::setLightTable(std::vector<unsigned int> lights) { _lightTable = std::move(lights); }

void SdInstance::dump(std::ostream& os) const {
    os << " _matrix:";
    _matrix.dump(os);
    os << " _object: " << static_cast<const void*>(_object.get())
       << " _materials: " << _materials.size();
    _attributes.dump(os);
    os << " _lightNumber: " << _lightNumber << " _lightTable:";
    for (unsigned int light : _lightTable) os << ' ' << light;
}

}  // namespace Zr
