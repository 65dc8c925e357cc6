#pragma once
// A buffer of depths alone, for the plain shadow maps of the lights: the nearest surface's eye z
// at each pixel, written straight into an array of doubles that the caller owns.
//
// Triangles come in through one rasterizer of depth vertices, whose pixel data carries eye z and
// 1/w, both multiplied by 1/w after the perspective division; a pixel's eye z is their quotient,
// one division per pixel. Eye z is negative in front of the eye, so the nearest surface has the
// largest value: a surface is kept where its depth is greater than what the pixel holds. A new
// buffer fills the array with the lowest double, so that any surface is nearer and a pixel that no
// surface covers lights everything behind it (rsDepthMapBuffer.h).
#include "rsDepthMapBuffer.h"

namespace Zr {

class RsZBuffer : public RsDepthMapBuffer {
public:
    // A buffer of width x height pixels writing into depth, row by row, which it fills with the
    // empty depth; depth must outlive the buffer.
    RsZBuffer(int width, int height, double* depth);

    // The depths are final as drawn.
    void finalize() {}

    // Keeps the nearer of each pixel's depth and the surface's over [span._x1, span._x2) of row.
    void drawSpan(const Context& context, int row, const Span& span, RsPixelData<RsDepthVertex>& data);
};

}  // namespace Zr
