#pragma once
// What the factories of fragment buffers, with or without antialiasing, hand each buffer they
// make: the depth mode, the output tile with the way it is written (replaced, or added to with a
// weight), the background and the fill colour of the pixels it leaves, and whether the resolve
// unpremultiplies.
#include <ostream>

#include "coRgbaColorTyped.h"
#include "ixTileManip.h"

namespace Zr {

class RsBufferOutputSettings {
public:
    using Rgba = CoRgbaColorTyped<float>;

    void setUnpremultiply(bool unpremultiply) { _unpremultiply = unpremultiply; }
    void setZBuffer(bool zBuffer) { _zBuffer = zBuffer; }
    void setFillColor(const Rgba& fillColor) { _fillColor = fillColor; }
    void setBackground(const IxReadGuard& background) { _background = background; }
    // The output tile, whether the resolve adds to it instead of replacing it, and the weight of
    // the finished pixels.
    void setOutput(const IxWriteGuard& output, bool accumulate, float weight) {
        _output = output;
        _accumulate = accumulate;
        _weight = weight;
    }

    bool getZBuffer() const { return _zBuffer; }
    bool getUnpremultiply() const { return _unpremultiply; }
    bool getAccumulate() const { return _accumulate; }
    float getWeight() const { return _weight; }
    const Rgba& getFillColor() const { return _fillColor; }

    void dump(std::ostream& os) const {
        os << " _zBuffer: " << _zBuffer << " _output: ";
        _output.dump(os);
        os << " _accumulate: " << _accumulate << " _weight: " << _weight << " _fillColor: ";
        _fillColor.dump(os);
        os << " _background: ";
        _background.dump(os);
        os << " _unpremultiply: " << _unpremultiply;
    }

protected:
    // Depth test on, no output, not accumulating, weight 1, opaque black fill (no colour, full
    // coverage), no background, unpremultiplied output.
    bool _zBuffer = true;
    IxTileManip::WriteGuardNoCheck _output;
    bool _accumulate = false;
    float _weight = 1.0f;
    Rgba _fillColor{0.0f, 0.0f, 0.0f, 1.0f};
    IxTileManip::ReadGuardNoCheck _background;
    bool _unpremultiply = true;
};

}  // namespace Zr
