#pragma once
// The one question a light asks about shadow: of the light that would reach a point of the render
// call's camera space, how much arrives, per colour channel (1 where nothing shadows, 0 where
// everything does). Depth maps and deep transmittance maps answer it alike.
#include "coRgbColorTyped.h"
#include "gePoint3.h"

namespace Zr {

class RsShadowEvaluator {
public:
    virtual ~RsShadowEvaluator() = default;
    // A single test at the point: cheap, hard-edged.
    virtual CoRgbColorTyped<float> computeFastShadow(const GePoint3<float>& point) const = 0;
    // The filtered answer, soft across the map's filter width.
    virtual CoRgbColorTyped<float> computeBestShadow(const GePoint3<float>& point) const = 0;

protected:
    RsShadowEvaluator() = default;
    RsShadowEvaluator(const RsShadowEvaluator&) = default;
    RsShadowEvaluator& operator=(const RsShadowEvaluator&) = default;
};

}  // namespace Zr
