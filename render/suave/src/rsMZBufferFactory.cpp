#include "rsMZBufferFactory.h"

namespace Zr {

RsMZBufferFactory::RsMZBufferFactory() : RsDepthBufferFactory("render\\suave\\src\\rsMZBufferFactory") {}

}  // namespace Zr
