#pragma once
// The screen-space set-up shared by all attribute planes of one triangle: its edge deltas and the
// reciprocal of its doubled signed area. From it each attribute's plane follows with a few
// multiplications and no further division.
#include <cmath>
#include <ostream>

namespace Zr {

struct RsGradientBlock {
    // Below this the doubled area counts as zero and the triangle as degenerate on the screen.
    static constexpr double kDegenerateEpsilon = 7.120236347223045e-307;

    double _dx0;  // x1 - x0
    double _dx1;  // x2 - x1
    double _dx2;  // x0 - x2
    double _dy0;  // y1 - y0
    double _dy1;  // y2 - y1
    double _dy2;  // y0 - y2
    double _invDet;

    RsGradientBlock() = default;

    // From the screen positions of the three vertices. A triangle without area on the screen
    // gets gradients along its longest edge instead of a division by zero, or none at all when
    // it is a point.
    RsGradientBlock(double x0, double y0, double x1, double y1, double x2, double y2)
        : _dx0(x1 - x0), _dx1(x2 - x1), _dx2(x0 - x2), _dy0(y1 - y0), _dy1(y2 - y1), _dy2(y0 - y2) {
        const double det = _dx2 * _dy0 - _dx0 * _dy2;
        if (std::abs(det) > kDegenerateEpsilon) {
            _invDet = 1.0 / det;
        } else {
            setUpDegenerate();
        }
    }

    void dump(std::ostream& os) const;

private:
    // The reciprocal used by the degenerate rules: that of 0 counts as 0.
    static double reciprocal(double v) { return v != 0.0 ? 1.0 / v : 0.0; }
    void setUpDegenerate();
};

}  // namespace Zr
