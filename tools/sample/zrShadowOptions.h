#pragma once
// How a host's lights make their shadows: the sample scene's and those of model files.
#include "sdStdLight.h"

namespace Zr {

struct ZrShadowOptions {
    enum class Shadows { none, z, midpoint, deep };
    // No shadows, or the lights' map type: nearest depth, midpoint of the two nearest depths, or
    // deep maps of transmittance.
    Shadows shadows = Shadows::z;
    // Width and height of each light's map (of each cube face for the omni light), in pixels.
    int mapSize = 1024;

    // Gives the light shadows of this kind, or none.
    void applyTo(SdStdLight& light) const {
        using Type = SdStdLight::ShadowMapType;
        light._shadowsEnabled = shadows != Shadows::none ? 1 : 0;
        light._shadowMapType = shadows == Shadows::midpoint ? Type::ShadowMapMidpoint
                               : shadows == Shadows::deep   ? Type::ShadowMapDeep
                                                            : Type::ShadowMapZ;
        light._shadowMapSize = mapSize;
    }
};

}  // namespace Zr
