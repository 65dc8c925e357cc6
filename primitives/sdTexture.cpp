#include "sdTexture.h"

#include <utility>

#include "assertions.h"

namespace Zr {

namespace {
constexpr const char* kSourceFile = ".\\primitives/sdTexture.cpp";
}

SdTexture::SdTexture(int width, int height, std::vector<CoRgbaColorTyped<float>> texels)
    : _width(width), _height(height), _texels(std::move(texels)) {
    ZR_ASSERT_AT(width > 0 && height > 0, kSourceFile, __LINE__);
    ZR_ASSERT_AT(_texels.size() == static_cast<std::size_t>(width) * static_cast<std::size_t>(height),
                 kSourceFile, __LINE__);
}

}  // namespace Zr
