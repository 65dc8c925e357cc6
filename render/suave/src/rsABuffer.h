#pragma once
// The fragment buffer of the anti-aliased drawing path: one rectangular region of the picture, a
// list per pixel of shaded fragments that each own some of the pixel's 16 samples (rsAFragment.h),
// resolved through a filter kernel into the output tile by finalize.
//
// Triangles come in through three rasterizers of sub-pixel spans (16 x 16 sub-cells per pixel), one
// per vertex kind. A span is walked in three runs: the left fringe, where each sample is tested
// against its sub-scanline's ends; the interior, where every sample is covered and the mask is full
// without a test; and the right fringe. A span that lacks its first or last sub-scanline has no
// interior. A pixel that gets a fragment is shaded once, at its centre, whatever its coverage.
//
// Two modes, as in the fragment Z-buffer:
// - without Z, each fragment is pushed at the head of its list, as the instances come from near
//   to far. An opaque fragment closes its samples; a fragment with no open sample is not made, and
//   one with some keeps its whole mask.
// - with Z, each list is ordered at every sample: the fragments that cover a sample come from far
//   to near by their depth there. A new fragment goes in at the place of each of its samples, split
//   into as few records as those places allow; where the depth intervals of two fragments do not
//   overlap their order is known without looking at the samples. Only a fragment that covers the
//   whole pixel (an interior one) and is opaque lowers the pixel's Z-buffer, to the far end of its
//   interval; a fragment whose near end is at or behind it is not made.
#include <cstddef>
#include <cstdint>
#include <memory>
#include <ostream>
#include <type_traits>

#include "coRgbaColorTyped.h"
#include "geRectangle.h"
#include "ixTileManip.h"
#include "rcBase.h"
#include "rsAFragment.h"
#include "rsDrawContext.h"
#include "rsFilterKernel.h"
#include "rsFragmentArrays.h"
#include "rsPixelData.h"
#include "rsPixelSpan.h"
#include "rsRasterizer.h"
#include "rsVertexRasterizers.h"
#include "rsVertices.h"

namespace Zr {

// What an A-buffer allocates, handed on from one region's buffer to the next.
struct RsABufferMemory : RsFragmentArrays<RsAFragment, std::uint16_t> {};

class RsABuffer : public RCObject, public IxTileManip, private RsFragmentArrays<RsAFragment, std::uint16_t> {
public:
    using Rgba = CoRgbaColorTyped<float>;
    using Context = RsDrawContext;
    using Span = RsPixelSpan<4, 4>;
    template <class Vertex>
    using Rasterizer = RsRasterizer<RsABuffer, Vertex, Span>;

    using RsFragmentArrays<RsAFragment, std::uint16_t>::kEmptyDepth;

    // A buffer for the pixels x <= px < x + width, y <= py < y + height, with a Z-buffer when
    // zBuffer is set. unpremultiply is handed to the resolve. The fill colour starts as opaque
    // black, the guards empty, the kernel the box. memory, when given, lends its arrays and pool
    // and must outlive the buffer, which gives them back when it dies.
    RsABuffer(int x, int y, int width, int height, bool zBuffer, bool unpremultiply,
              RsABufferMemory* memory = nullptr);
    ~RsABuffer() override;
    RsABuffer(const RsABuffer&) = delete;
    RsABuffer& operator=(const RsABuffer&) = delete;

    // Where and how finalize resolves: the output tile, the background (may be empty), the fill
    // colour of pixels that the background does not cover, whether to add to the output, the
    // weight of the finished pixels and the filter kernel.
    void setOutput(const IxWriteGuard& output, const IxReadGuard& background, const Rgba& fillColor,
                   bool accumulate, float weight, const RsFilterKernel& kernel);

    // Resolves the fragments into the output set last: the pixels that lie at least the kernel's
    // support inside the buffer's region.
    void finalize();

    // Bytes held: the object, its pool and the pool's chunks, and the per-pixel arrays.
    std::size_t getMemorySize() const;

    GeRectangle<int> getPixelRegion() const { return {_x, _x + _width, _y, _y + _height}; }
    int getWidth() const { return _width; }
    int getHeight() const { return _height; }
    bool hasZBuffer() const { return _zBuffer != nullptr; }

    // The rasterizer of a vertex kind: RsPlainVertex, RsNormalVertex or RsTangentVertex.
    template <class Vertex>
    const Rasterizer<Vertex>& getRasterizer() const {
        return _rasterizers.template get<Vertex>();
    }
    // Draws a triangle of vertices after the perspective division, in image pixel coordinates.
    template <class Vertex>
    void rasterizeTriangle(const Context& context, const Vertex& v0, const Vertex& v1, const Vertex& v2) const {
        getRasterizer<Vertex>().rasterizeTriangle(context, v0, v1, v2);
    }

    // The span methods, for the sub-pixel span of region-relative pixel row `row`, with the pixel
    // data placed at the pixel that holds the span's _minX1: with and without Z.
    template <class Vertex>
    void drawSpanZ(const Context& context, int row, const Span& span, RsPixelData<Vertex>& data);
    template <class Vertex>
    void drawSpanNoZ(const Context& context, int row, const Span& span, RsPixelData<Vertex>& data);

    // The list head of each pixel, row after row, getWidth() per row.
    RsAFragment* const* getLists() const { return _lists.get(); }
    // The far end of the nearest opaque fragment that covers each pixel whole, with Z; else null.
    const double* getZBuffer() const { return _zBuffer.get(); }
    // The samples of each pixel that opaque fragments closed, without Z; else null.
    const std::uint16_t* getClosed() const { return _closed.get(); }

    void dump(std::ostream& os) const;

private:
    std::size_t getPixelCount() const {
        return static_cast<std::size_t>(_width) * static_cast<std::size_t>(_height);
    }
    // The span's runs: calls pixel(x, mask, interior) for each pixel from the span's first one,
    // mask 0 where no sample is covered, stepping the pixel data after each.
    template <class Vertex, class Pixel>
    static void walkSpan(const Span& span, RsPixelData<Vertex>& data, Pixel&& pixel);
    // Shades a new fragment with the mask at the pixel that the data stands for.
    template <class Vertex>
    RsAFragment* makeFragment(const Context& context, const RsPixelData<Vertex>& data, std::uint16_t mask);
    // Links n into the depth-ordered list of a pixel, split by sample where its samples belong in
    // different places. closesPixel: n is an interior opaque fragment, which lowers the pixel's
    // Z-buffer.
    void insertByDepth(RsAFragment*& head, RsAFragment* n, double& nearest, bool closesPixel);
    // The general case of the above: n lies in front of some fragments and behind others.
    void insertSplit(RsAFragment*& head, RsAFragment* n);

    int _x;
    int _y;
    int _width;
    int _height;
    bool _accumulate = false;
    bool _unpremultiply;
    float _weight = 1.0f;
    ReadGuardNoCheck _background;
    WriteGuardNoCheck _output;
    Rgba _fillColor{0.0f, 0.0f, 0.0f, 1.0f};
    RsFilterKernel _kernel{RsFilterKernel::KernelBox};
    RsABufferMemory* _memory;
    RsVertexRasterizers<RsABuffer, Span> _rasterizers;
};

}  // namespace Zr
