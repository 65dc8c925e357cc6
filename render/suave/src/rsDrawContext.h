#pragma once
// The drawing context that a region drawer hands through the rasterizer to the span methods of
// the fragment buffers: what a span method needs to make a fragment besides the pixel data.
//
// The region drawer fills it once per drawing of a face group with one material: the transfer
// function and opacity of the material's transfer mode, and the material itself. The shading
// context is the drawer's one scratch record of what is known at a fragment: a span method fills
// it from the pixel data and hands it to the material's shade, which may change it. It is mutable
// because the rasterizer passes the drawing context on as const, and filling it is no change to
// the drawing state.
#include "rsMaterialShader.h"
#include "rsShadingContext.h"
#include "rsTransferFunc.h"

namespace Zr {

struct RsDrawContext {
    // How the material's fragments are laid over what is behind them; stored in each fragment.
    RsTransferFunc::Function _transfer = nullptr;
    // Whether the transfer mode lets a fragment of alpha one hide everything behind it.
    bool _canBeOpaque = false;
    // The material's needed-context mask. The span methods fill the eye position and the texture
    // coordinates, with their derivatives, only when it asks for them: a division and a dozen
    // products per fragment that nobody would read.
    unsigned int _needed = ~0u;
    mutable RsShadingContext _shadingContext;
    // The material being drawn; not owned, the drawer holds it for the drawing.
    RsMaterialShader* _material = nullptr;
    // The IDs of the instance and material being drawn, for renders with auxiliary outputs only.
    float _objectId = 0.0f;
    float _materialId = 0.0f;
    // Whether the instance has texture coordinates of its own, which the UV channel holds.
    bool _hasTexCoords = false;
};

}  // namespace Zr
