#pragma once
// The drawing attributes of an instance: one block of plain values that the renderer copies whole
// into its own instance record, so its members keep this order and these widths.
#include <cstdint>
#include <ostream>

namespace Zr {

struct SdInstanceAttributes {
    // Instances are drawn in ascending order; the value is also added to the pixel depth of the
    // instance's fragments, so that a higher order lies behind at equal depth.
    std::int32_t _renderOrder = 0;
    // Seen by the camera.
    bool _visible = true;
    // Seen by the lights: throws shadows.
    bool _castsShadows = true;
    // Shadows fall on it.
    bool _receivesShadows = true;
    // Faces turned towards and away from the viewer are drawn.
    bool _drawFrontFaces = true;
    bool _drawBackFaces = true;

    void dump(std::ostream& os) const {
        os << " _renderOrder: " << _renderOrder << " _visible: " << _visible
           << " _castsShadows: " << _castsShadows << " _receivesShadows: " << _receivesShadows
           << " _drawFrontFaces: " << _drawFrontFaces << " _drawBackFaces: " << _drawBackFaces;
    }

    friend bool operator==(const SdInstanceAttributes&, const SdInstanceAttributes&) = default;
};

static_assert(sizeof(std::int32_t) == 4 && sizeof(bool) == 1,
              "the attribute block is a 32-bit order and five 8-bit flags");

}  // namespace Zr
