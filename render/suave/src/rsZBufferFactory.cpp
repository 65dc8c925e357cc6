#include "rsZBufferFactory.h"

namespace Zr {

RsZBufferFactory::RsZBufferFactory() : RsDepthBufferFactory("render\\suave\\src\\rsZBufferFactory") {}

}  // namespace Zr
