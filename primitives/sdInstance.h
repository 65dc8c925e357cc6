#pragma once
// An object placed in a scene: a camera, a light or a geometry, with the matrix that takes it from
// its own space to world space, the materials of its face groups, its drawing attributes and its
// place in light linking.
//
// Materials are used cyclically: face group g of the geometry's mesh takes material
// g modulo the number of materials.
//
// Light linking (see SdLight): an instance of a light carries its light number; an instance of a
// geometry lists in its light table the numbers of the lights it names.
#include <ostream>
#include <string>
#include <utility>
#include <vector>

#include "geAffineMatrix3.h"
#include "rcBase.h"
#include "rcShdPtr.h"
#include "sdInstanceAttributes.h"
#include "sdMaterial.h"
#include "sdObject.h"

namespace Zr {

class SdInstance : public RCObject {
public:
    // The identity matrix, no object, no materials, default attributes, light number 0.
    SdInstance() = default;
    explicit SdInstance(RCShdPtr<SdObject> object,
                        const GeAffineMatrix3<float>& matrix = GeAffineMatrix3<float>());
    ~SdInstance() override;

    // Object to world.
    const GeAffineMatrix3<float>& getMatrix() const { return _matrix; }
    void setMatrix(const GeAffineMatrix3<float>& matrix) { _matrix = matrix; }

    const RCShdPtr<SdObject>& getObject() const { return _object; }
    void setObject(RCShdPtr<SdObject> object);

    const std::vector<RCShdPtr<const SdMaterial>>& getMaterials() const { return _materials; }
    unsigned int getMaterialCount() const { return static_cast<unsigned int>(_materials.size()); }
    void setMaterials(std::vector<RCShdPtr<const SdMaterial>> materials);
    void addMaterial(RCShdPtr<const SdMaterial> material);
    // The material of face group groupIndex: entry groupIndex modulo the count. The instance
    // must have a material.
    const RCShdPtr<const SdMaterial>& getMaterialOfGroup(unsigned int groupIndex) const;

    const SdInstanceAttributes& getAttributes() const { return _attributes; }
    SdInstanceAttributes& getAttributes() { return _attributes; }
    void setAttributes(const SdInstanceAttributes& attributes) { _attributes = attributes; }

    // The number by which geometry instances name this instance's light.
    unsigned int getLightNumber() const { return _lightNumber; }
    void setLightNumber(unsigned int number) { _lightNumber = number; }

    // The light numbers this geometry instance names, in the order given; repeats allowed.
    const std::vector<unsigned int>& getLightTable() const { return _lightTable; }
    void setLightTable(std::vector<unsigned int> lights);
    void addLight(unsigned int lightNumber) { _lightTable.push_back(lightNumber); }

    // The instance's name, as the host's scene calls it; the compositing passes name their IDs by
    // it. Empty by default.
    const std::string& getName() const { return _name; }
    void setName(std::string name) { _name = std::move(name); }

    void dump(std::ostream& os) const;

private:
    GeAffineMatrix3<float> _matrix;
    RCShdPtr<SdObject> _object;
    std::vector<RCShdPtr<const SdMaterial>> _materials;
    SdInstanceAttributes _attributes;
    unsigned int _lightNumber = 0;
    std::vector<unsigned int> _lightTable;
    std::string _name;
};

}  // namespace Zr
