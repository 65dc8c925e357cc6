#include "rsTransmittanceFunction.h"

namespace Zr {

void RsTransmittanceFunction::dump(std::ostream& os) const {
    os << " _size: " << _size << " _elements:";
    for (int i = 0; i < _size; ++i) {
        os << " [" << _elements[i].depth;
        _elements[i].transmittance.dump(os);
        os << " ]";
    }
}

}  // namespace Zr
