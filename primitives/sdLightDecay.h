#pragma once
// How a light's strength falls off with distance d: it is multiplied by
//
//   1 / (_constant + d * (_linear + d * _quadratic))        (the _quadratic term only when
//                                                            _hasQuadratic is set)
//
// and a light whose factor is not positive does not reach the point. The default is no falloff.
#include <ostream>

namespace Zr {

class SdLightDecay {
public:
    // No falloff: false, 1, 0, 0.
    SdLightDecay() = default;
    // From a light's decay setting. parameter is the distance at which the strength has fallen to
    // half: with quadratic false the factor is 1 / (1 + d / parameter), with quadratic true it is
    // 1 / (1 + (d / parameter)^2). A parameter that is not positive (or not a number) means no
    // falloff, whichever the kind.
    SdLightDecay(bool quadratic, float parameter);

    // The factor at distance d, by the formula above; not positive where the light does not reach.
    float computeFactor(float distance) const;

    void dump(std::ostream& os) const;

    bool _hasQuadratic = false;
    float _constant = 1.0f;
    float _linear = 0.0f;
    float _quadratic = 0.0f;
};

}  // namespace Zr
