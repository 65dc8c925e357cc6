#pragma once
// A texture image: a rectangle of straight (not premultiplied) float RGBA texels, row after row,
// row 0 first. Texture coordinates address it as (s, t) over [0, 1] x [0, 1]: texel (x, y)
// covers s in [x / width, (x + 1) / width) and t in [y / height, (y + 1) / height).
#include <vector>

#include "coRgbaColorTyped.h"
#include "sdObject.h"

namespace Zr {

class SdTexture : public SdObject {
public:
    using RttiClassType = RttiGenType1<SdTexture, SdObject>;
    const RttiType<SdObject>& getType() const override { return RttiClassType::getInstance(); }

    // An empty texture of no texels.
    SdTexture() = default;
    // texels holds width * height colours, row after row; both sizes at least 1.
    SdTexture(int width, int height, std::vector<CoRgbaColorTyped<float>> texels);

    int getWidth() const { return _width; }
    int getHeight() const { return _height; }
    bool isEmpty() const { return _texels.empty(); }
    // The texel at column x and row y, both within the image.
    const CoRgbaColorTyped<float>& getTexel(int x, int y) const {
        return _texels[static_cast<std::size_t>(y) * static_cast<std::size_t>(_width) +
                       static_cast<std::size_t>(x)];
    }
    const std::vector<CoRgbaColorTyped<float>>& getTexels() const { return _texels; }

private:
    int _width = 0;
    int _height = 0;
    std::vector<CoRgbaColorTyped<float>> _texels;
};

}  // namespace Zr
