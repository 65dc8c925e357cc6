#pragma once
// What the two depth buffers of the plain shadow maps (RsZBuffer, RsMZBuffer) share: a buffer of
// width x height depths written straight into an array of doubles that the caller owns, filled
// with the empty depth on construction, and one rasterizer of depth vertices over the whole map.
//
// Eye z is negative in front of the eye, so the nearest surface has the largest value, and the
// empty depth is the lowest double. The rasterizer calls the buffer's own drawSpan, which each
// buffer passes in as a member of this class (a buffer derived from it is one), so that the spans
// go through one member function pointer, as they would with the rasterizer over the buffer itself.
#include <cstddef>
#include <ostream>
#include <type_traits>

#include "geRectangle.h"
#include "rcBase.h"
#include "rsDrawContext.h"
#include "rsPixelData.h"
#include "rsPixelSpan.h"
#include "rsRasterizer.h"
#include "rsVertices.h"

namespace Zr {

class RsDepthMapBuffer : public RCObject {
public:
    using Context = RsDrawContext;
    // The region renderer draws depth alone into these buffers, with no material.
    static constexpr bool kDepthOnly = true;
    using Span = RsPixelSpan<0, 0>;
    using Rasterizer = RsRasterizer<RsDepthMapBuffer, RsDepthVertex, Span, RsPixelData<RsDepthVertex>>;

    // The depth of a pixel that no surface covers: the lowest double.
    static constexpr double kEmptyDepth = -1.7976931348623157e308;

    RsDepthMapBuffer(const RsDepthMapBuffer&) = delete;
    RsDepthMapBuffer& operator=(const RsDepthMapBuffer&) = delete;

    GeRectangle<int> getPixelRegion() const { return {0, _width, 0, _height}; }
    template <class Vertex>
    const Rasterizer& getRasterizer() const {
        static_assert(std::is_same_v<Vertex, RsDepthVertex>, "a depth buffer draws depth vertices only");
        return _rasterizer;
    }

    void dump(std::ostream& os) const;

protected:
    // A buffer of width x height pixels writing into depth, row by row, which it fills with the
    // empty depth; depth must outlive the buffer. drawSpan is the derived buffer's span method.
    RsDepthMapBuffer(int width, int height, double* depth, Rasterizer::DrawSpan drawSpan);

    // The number of pixels, width * height.
    std::size_t getPixelCount() const { return static_cast<std::size_t>(_width) * static_cast<std::size_t>(_height); }

    int _width;
    int _height;
    double* _depth;

private:
    Rasterizer _rasterizer;
};

}  // namespace Zr
