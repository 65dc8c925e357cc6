#include "ixPixelFormat.h"

namespace Zr {

void IxPixelFormat::dump(std::ostream& os) const {
    os << " _comps: " << static_cast<int>(_comps) << " _depth: " << static_cast<int>(_depth)
       << " _aspectRatio: " << _aspectRatio.numerator << "/" << _aspectRatio.denominator
       << " _reserved: " << _reserved;
}

}  // namespace Zr
