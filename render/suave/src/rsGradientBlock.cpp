#include "rsGradientBlock.h"

namespace Zr {

// With _invDet = 1 the interpolants' formulas turn the deltas set here straight into gradients.
// The rules for the longest edge being edge 0 or edge 1 mirror each other; the rule for edge 2 is
// not their mirror image (it keeps _dx2 and _dy2 and puts the negated reciprocal of _dy2 into
// _dx0). That is deliberate: changing it would change the gradients of such triangles.
void RsGradientBlock::setUpDegenerate() {
    _invDet = 1.0;
    const double l0 = _dx0 * _dx0 + _dy0 * _dy0;
    const double l1 = _dx1 * _dx1 + _dy1 * _dy1;
    const double l2 = _dx2 * _dx2 + _dy2 * _dy2;
    int longest;
    double longestLength;
    if (l2 > l0 && l2 > l1) {
        longest = 2;
        longestLength = l2;
    } else if (l1 > l0) {
        longest = 1;
        longestLength = l1;
    } else {
        longest = 0;
        longestLength = l0;
    }
    if (!(longestLength > kDegenerateEpsilon)) {
        // A point: every attribute keeps the value of the first vertex.
        _dx0 = _dx1 = _dx2 = 0.0;
        _dy0 = _dy1 = _dy2 = 0.0;
        return;
    }
    // The rule of longest edge 0 or 1: e is the longest edge, n the one after it, p the one before.
    const auto alongEdge = [](double& dxE, double& dyE, double& dxN, double& dyN, double& dxP, double& dyP) {
        dyN = reciprocal(dxE);
        dyP = -dyN;
        dxP = reciprocal(dyE);
        dxN = -dxP;
        dxE = 0.0;
        dyE = 0.0;
    };
    switch (longest) {
    case 0:
        alongEdge(_dx0, _dy0, _dx1, _dy1, _dx2, _dy2);
        break;
    case 1:
        alongEdge(_dx1, _dy1, _dx2, _dy2, _dx0, _dy0);
        break;
    default:
        _dy0 = reciprocal(_dx2);
        _dx0 = -reciprocal(_dy2);
        _dx1 = 0.0;
        _dy1 = 0.0;
        break;
    }
}

void RsGradientBlock::dump(std::ostream& os) const {
    os << " _dx0: " << _dx0 << " _dx1: " << _dx1 << " _dx2: " << _dx2 << " _dy0: " << _dy0
       << " _dy1: " << _dy1 << " _dy2: " << _dy2 << " _invDet: " << _invDet;
}

}  // namespace Zr
