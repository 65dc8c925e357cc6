// The parts of the fragment Z-buffer path that turn a region's fragments into a deep shadow map
// instead of pixels. They need the deep shadow map's own class, which this build does not have
// yet: until it comes, a buffer or factory directed at a map stops with a program abort rather
// than producing nothing in silence. Setting a map as output is harmless by itself.
#include "assertions.h"
#include "rsFZBufferFactory.h"
#include "rsImageCreatorFZ.h"

namespace Zr {

namespace {
constexpr const char* kSourceFile = "render\\suave\\src\\rsFZBufferDeepShadowMap";
}  // namespace

void RsImageCreatorFZ::createDeepShadowMap(RsFZBuffer&, int, int, int, int, RsDeepShadowMap&) {
    Assertions::throwProgramAborted(kSourceFile, __LINE__, "deep shadow map output is not available");
}

GeRectangle<int> RsFZBufferFactory::getDeepShadowMapRegion() const {
    Assertions::throwProgramAborted(kSourceFile, __LINE__, "deep shadow map output is not available");
}

}  // namespace Zr
