#include "sdTextureParams.h"

#include <utility>

#include "nullTextureSampler.h"
#include "sdImageSampler.h"

namespace Zr {

SdTextureParams::SdTextureParams(RCShdPtr<const SdTexture> texture, float weight, Filter filter,
                                 Wrap wrap)
    : _texture(std::move(texture)), _weight(weight), _filter(filter), _wrap(wrap) {}

SdTextureParams::~SdTextureParams() = default;

OPtr<SdTextureSampler> SdTextureParams::createSampler() const {
    if (_texture.isNull() || _texture->isEmpty()) return makeOwned<NullTextureSampler>();
    return makeOwned<SdImageSampler>(_texture, _filter, _wrap);
}

}  // namespace Zr
