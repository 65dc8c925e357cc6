#include "rsLightShader.h"

#include "assertions.h"

namespace Zr {

namespace {
// Where an unbalanced unlockMemory is reported. Hosts match on this position, so it is fixed and
// does not follow edits to this file.
constexpr const char* kSourceFile = "render\\yarp\\src\\rsLightShader";
constexpr int kUnlockAssertLine = 144;
}  // namespace

RsLightShader::RsLightShader(unsigned int lightId, const SdLight& light)
    : _lightId(lightId),
      _linkMode(light._linkMode),
      _emitAmbient(light._emitAmbient),
      _emitDiffuse(light._emitDiffuse),
      _emitSpecular(light._emitSpecular) {}

void RsLightShader::initialize(const RCShdPtr<RsScene>&) {}

bool RsLightShader::includes(const std::set<unsigned int>& lights) const {
    const bool found = lights.count(_lightId) != 0;
    return _linkMode == SdLight::LinkMode::exclude ? !found : found;
}

void RsLightShader::lockMemory() {
    if (_lockCount == 0) lockMemoryImpl();
    ++_lockCount;
}

void RsLightShader::unlockMemory() {
    ZR_ASSERT_AT(_lockCount > 0, kSourceFile, kUnlockAssertLine);
    --_lockCount;
    if (_lockCount == 0) unlockMemoryImpl();
}

}  // namespace Zr
