#pragma once
// The maker of the RsMZBuffer of a midpoint shadow map: the mean of the two nearest depths of
// each map pixel.
#include "rsDepthBufferFactory.h"
#include "rsMZBuffer.h"

namespace Zr {

class RsMZBufferFactory : public RsDepthBufferFactory<RsMZBuffer> {
public:
    RsMZBufferFactory();
};

}  // namespace Zr
