#pragma once
// A cube map of square shadow maps that answers the shadow question (rsShadowEvaluator.h): both
// queries go to the one face that covers the point (rsCubeMap.h) and answer as that face does.
// The faces are held by value, so a face's query is a direct call.
#include "coRgbColorTyped.h"
#include "gePoint3.h"
#include "rsCubeMap.h"
#include "rsShadowEvaluator.h"

namespace Zr {

template <class Face>
class RsCubeShadowEvaluator : public RsShadowEvaluator, public RsCubeMap<Face> {
public:
    CoRgbColorTyped<float> computeBestShadow(const GePoint3<float>& point) const override {
        return this->pickFace(point).computeBestShadow(point);
    }
    CoRgbColorTyped<float> computeFastShadow(const GePoint3<float>& point) const override {
        return this->pickFace(point).computeFastShadow(point);
    }
};

}  // namespace Zr
