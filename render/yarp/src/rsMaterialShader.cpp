#include "rsMaterialShader.h"

#include "assertions.h"
#include "nullTextureSampler.h"

namespace Zr {

namespace {
// Where an unbalanced unlockMemory is reported. Hosts match on this position, so it is fixed and
// does not follow edits to this file.
constexpr const char* kSourceFile = "render\\yarp\\src\\rsMaterialShader";
constexpr int kUnlockAssertLine = 232;
}  // namespace

RsMaterialShader::RsMaterialShader(const RCShdPtr<const SdMaterial>& material)
    : _material(material),
      _transferMode(material->_transferMode),
      _wireframe(material->_wireframe),
      _screenSpace(material->_screenSpace),
      _wireSize(material->_wireSize) {}

RsMaterialShader::~RsMaterialShader() = default;

void RsMaterialShader::initialize(RCShdPtr<RsScene>&, RCShdPtr<const RsGeomInstance>&) {}

bool RsMaterialShader::isWireframe() const { return _wireframe; }

bool RsMaterialShader::isScreenSpace() const { return _screenSpace; }

float RsMaterialShader::getWireSize() const { return _wireSize; }

void RsMaterialShader::lockMemory() {
    LkLockGuard guard(_lock);
    // The count goes up only after the memory is in: a lockMemoryImpl that fails leaves the
    // shader unlocked, and the next lockMemory tries again. Other threads wait on _lock
    // meanwhile, so none of them sees a count above 0 before the samplers stand.
    if (_lockCount == 0) lockMemoryImpl();
    ++_lockCount;
}

void RsMaterialShader::unlockMemory() {
    LkLockGuard guard(_lock);
    ZR_ASSERT_AT(_lockCount > 0, kSourceFile, kUnlockAssertLine);
    --_lockCount;
    if (_lockCount == 0) unlockMemoryImpl();
}

std::int32_t RsMaterialShader::getLockCount() const {
    LkLockGuard guard(_lock);
    return _lockCount;
}

OPtr<SdTextureSampler> RsMaterialShader::createSampler(
    const RCShdPtr<const SdTextureParams>& params) {
    if (params) {
        OPtr<SdTextureSampler> own = params->createSampler();
        if (own) return own;
    }
    return makeOwned<NullTextureSampler>();
}

CoRgbColorTyped<float> RsMaterialShader::scaleByTexture(
    const CoRgbColorTyped<float>& colour, const RCShdPtr<const SdTextureParams>& params) {
    if (!params) return colour;
    return colour * params->getWeight();
}

CoRgbaColorTyped<float> RsMaterialShader::scaleByTexture(
    const CoRgbColorTyped<float>& colour, float alpha,
    const RCShdPtr<const SdTextureParams>& params) {
    return CoRgbaColorTyped<float>(scaleByTexture(colour, params), alpha);
}

CoRgbColorTyped<float> RsMaterialShader::scaleByTextures(
    const CoRgbColorTyped<float>& colour, const RCShdPtr<const SdTextureParams>& params1,
    const RCShdPtr<const SdTextureParams>& params2) {
    return scaleByTexture(scaleByTexture(colour, params1), params2);
}

unsigned int RsMaterialShader::neededContextOfMap(const RCShdPtr<const SdTextureParams>& map,
                                                  unsigned int bits) {
    return map ? bits : 0u;
}

unsigned int RsMaterialShader::neededContextOfBumpMap(const RCShdPtr<const SdTextureParams>& map,
                                                      unsigned int bits) {
    return (map && map->getWeight() != 0.0f) ? bits : 0u;
}

void RsMaterialShader::dump(std::ostream& os) const {
    os << " _material: " << static_cast<const void*>(_material.get())
       << " _transferMode: " << static_cast<int>(_transferMode)
       << " _lockCount: " << getLockCount() << " _lock: " << _lock.getName()
       << " _wireframe: " << _wireframe << " _screenSpace: " << _screenSpace
       << " _wireSize: " << _wireSize;
}

}  // namespace Zr
