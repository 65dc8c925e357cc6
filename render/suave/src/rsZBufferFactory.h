#pragma once
// The maker of the RsZBuffer of a plain shadow map: the nearest depth of each map pixel.
#include "rsDepthBufferFactory.h"
#include "rsZBuffer.h"

namespace Zr {

class RsZBufferFactory : public RsDepthBufferFactory<RsZBuffer> {
public:
    RsZBufferFactory();
};

}  // namespace Zr
