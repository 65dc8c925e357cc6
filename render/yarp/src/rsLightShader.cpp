#include "rsLightShader.h"

namespace Zr {

void RsLightShader::initialize(const RCShdPtr<RsScene>&) {}

}  // namespace Zr
