#pragma once
// The light that one pixel of a deep shadow map lets through, as a step function of depth, per
// colour channel: 1 up to and including the first element's depth, then element i's
// transmittance up to and including element i + 1's depth, and the last element's beyond. An
// element's transmittance is what remains of the light behind it, its own layer included, so a
// surface at an element's depth is not shaded by that element itself.
//
// A function refers to its elements and does not own them: the deep shadow map that holds the
// function keeps every curve of the map in blocks of its own, so that resolving a map does not
// allocate per pixel. A function without elements (no caster at the pixel) lets everything
// through.
#include <ostream>

#include "coRgbColorTyped.h"

namespace Zr {

class RsTransmittanceFunction {
public:
    struct Element {
        float depth;                           // the map's normalised depth
        CoRgbColorTyped<float> transmittance;  // what remains behind this element
    };

    RsTransmittanceFunction() = default;

    // The curve of the count elements, nearest first, which must outlive the function.
    void setFunction(const Element* elements, int count) {
        _elements = elements;
        _size = count;
    }
    int getSize() const { return _size; }
    const Element* getElements() const { return _elements; }

    // The light left at depth: a linear search from the front, with no interpolation.
    CoRgbColorTyped<float> getTransmittance(float depth) const {
        if (_size == 0 || _elements[0].depth >= depth) return CoRgbColorTyped<float>(1.0f);
        for (int i = 0; i + 1 < _size; ++i)
            if (_elements[i + 1].depth >= depth) return _elements[i].transmittance;
        return _elements[_size - 1].transmittance;
    }

    void dump(std::ostream& os) const;

private:
    int _size = 0;
    const Element* _elements = nullptr;
};

}  // namespace Zr
