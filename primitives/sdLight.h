#pragma once
// The base of all lights: whether the light is on, which instances it reaches, and which terms of
// a material's lighting it feeds.
//
// Light linking: each geometry instance lists light numbers in its light table, and each light
// instance carries its own number (SdInstance). With LinkMode::include a light shines on the
// instances that list it; with LinkMode::exclude on those that do not. The default, exclude, lets
// a light shine on everything in a scene whose light tables are all empty.
//
// The settings are plain public members: a described light has no invariant to keep, and the
// renderer reads them once, when it builds its light shaders.
#include <cstdint>
#include <ostream>

#include "sdObject.h"

namespace Zr {

class SdLight : public SdObject {
public:
    using RttiClassType = RttiGenType1<SdLight, SdObject>;
    const RttiType<SdObject>& getType() const override { return RttiClassType::getInstance(); }

    enum class LinkMode : std::int32_t { include = 0, exclude = 1 };

    // A disabled light gets no light shader at all.
    bool _enabled = true;
    LinkMode _linkMode = LinkMode::exclude;
    // Whether the light adds to the ambient, diffuse and specular terms of the materials it
    // reaches.
    bool _emitAmbient = false;
    bool _emitDiffuse = true;
    bool _emitSpecular = true;

    void dump(std::ostream& os) const;

protected:
    SdLight() = default;
};

}  // namespace Zr
