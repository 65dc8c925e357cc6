#pragma once
// The fragment buffer of the drawing path without anti-aliasing: one rectangular region of the
// picture, a list of shaded fragments per pixel, resolved into the output tile by finalize.
//
// Triangles come in through the three rasterizers, one per vertex kind; the buffer's span methods
// shade each pixel that is to get a fragment at once (the material's shade is called when the
// fragment is made, never later) and link the fragment into the pixel's list. Lists run from far
// to near, head farthest, in both of the buffer's modes:
// - with Z, each list is kept sorted by depth: a fragment goes in at its depth, behind the ones
//   of equal depth that came before it. An opaque fragment cuts off everything behind it and
//   becomes the list's head; its depth goes to the Z-buffer, and later fragments at or behind it
//   are rejected before anything is shaded.
// - without Z, depth is not compared at all: each fragment is pushed at the head, as the instances
//   come in order from near to far. An opaque fragment closes its pixel to all later ones.
// A fragment is opaque when its material's mode can be opaque and its alpha is one within the
// float tolerance (RsTolerance::isOne).
//
// Fragments come from a pool of chunks that is never freed piecemeal; the first chunk holds one
// fragment per pixel. A buffer made with an RsFZBufferMemory takes its per-pixel arrays and pool
// from it when they are large enough and gives them back when it dies, so that the regions of a
// render, drawn one after the other, map their memory once.
#include <cstddef>
#include <memory>
#include <ostream>
#include <type_traits>

#include "coRgbaColorTyped.h"
#include "geRectangle.h"
#include "ixTileManip.h"
#include "rcBase.h"
#include "rsDrawContext.h"
#include "rsFragment.h"
#include "rsFragmentArrays.h"
#include "rsPixelData.h"
#include "rsPixelSpan.h"
#include "rsRasterizer.h"
#include "rsVertexRasterizers.h"
#include "rsVertices.h"

namespace Zr {

class RsAuxOutputs;
class RsDeepShadowMap;

// What a fragment buffer allocates, handed on from one buffer to the next.
struct RsFZBufferMemory : RsFragmentArrays<RsFragment, unsigned char> {};

class RsFZBuffer : public RCObject, public IxTileManip, private RsFragmentArrays<RsFragment, unsigned char> {
public:
    using Rgba = CoRgbaColorTyped<float>;
    using Context = RsDrawContext;
    using Span = RsPixelSpan<0, 0>;
    template <class Vertex>
    using Rasterizer = RsRasterizer<RsFZBuffer, Vertex, Span>;

    using RsFragmentArrays<RsFragment, unsigned char>::kEmptyDepth;

    // A buffer for the pixels x <= px < x + width, y <= py < y + height, with a Z-buffer when
    // zBuffer is set. unpremultiply is handed to the resolve. The fill colour starts as opaque
    // black, the guards empty. memory, when given, lends its arrays and pool and must outlive the
    // buffer.
    // aux, when given, gathers the surface channels and deep samples of the buffer's pixels,
    // which its region must hold; the buffer then draws with the span methods that record them.
    RsFZBuffer(int x, int y, int width, int height, bool zBuffer, bool unpremultiply,
               RsFZBufferMemory* memory = nullptr, RsAuxOutputs* aux = nullptr);
    ~RsFZBuffer() override;
    RsFZBuffer(const RsFZBuffer&) = delete;
    RsFZBuffer& operator=(const RsFZBuffer&) = delete;

    // Where and how finalize resolves: the output tile, the background (may be empty), the fill
    // colour of pixels that the background does not cover, whether to add to the output, and the
    // weight of the finished pixels. Clears a deep shadow map set before.
    void setOutput(const IxWriteGuard& output, const IxReadGuard& background, const Rgba& fillColor,
                   bool accumulate, float weight);
    // Makes finalize turn the fragments into the deep shadow map instead.
    void setOutput(RsDeepShadowMap& map);

    // Resolves the fragments into the output set last.
    void finalize();

    // Bytes held: the object, its pool and the pool's chunks, and the per-pixel arrays.
    std::size_t getMemorySize() const;

    // The buffer's pixels in image coordinates.
    GeRectangle<int> getPixelRegion() const { return {_x, _x + _width, _y, _y + _height}; }
    int getX() const { return _x; }
    int getY() const { return _y; }
    int getWidth() const { return _width; }
    int getHeight() const { return _height; }
    bool hasZBuffer() const { return _zBuffer != nullptr; }

    // The rasterizer of a vertex kind: RsPlainVertex, RsNormalVertex or RsTangentVertex.
    template <class Vertex>
    const Rasterizer<Vertex>& getRasterizer() const {
        return _rasterizers.template get<Vertex>();
    }

    // The span methods, for the pixels [span._x1, span._x2) of region-relative row `row`, with the
    // pixel data placed at the first of them: with and without Z. Defined for the three vertex
    // kinds of the rasterizers. With kAux the front-most fragments and the IDs of every fragment
    // are also recorded in the auxiliary outputs.
    template <class Vertex, bool kAux = false>
    void drawSpanZ(const Context& context, int row, const Span& span, RsPixelData<Vertex>& data);
    template <class Vertex, bool kAux = false>
    void drawSpanNoZ(const Context& context, int row, const Span& span, RsPixelData<Vertex>& data);

    // The list head of each pixel, row after row, getWidth() per row. For the resolve.
    RsFragment* const* getLists() const { return _lists.get(); }
    // The depth of the nearest opaque fragment of each pixel, in the mode with Z; else null.
    const double* getZBuffer() const { return _zBuffer.get(); }
    // Non-zero for each pixel that an opaque fragment has closed, in the mode without Z; else null.
    const unsigned char* getClosed() const { return _closed.get(); }
    const RsFragmentPool& getPool() const { return *_pool; }

    void dump(std::ostream& os) const;

private:
    std::size_t getPixelCount() const { return static_cast<std::size_t>(_width) * static_cast<std::size_t>(_height); }
    // Shades a new fragment at the pixel that the data stands for.
    template <class Vertex>
    RsFragment* makeFragment(const Context& context, const RsPixelData<Vertex>& data);

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
    RsDeepShadowMap* _deepShadowMap = nullptr;
    RsAuxOutputs* _aux;
    RsFZBufferMemory* _memory;
    RsVertexRasterizers<RsFZBuffer, Span> _rasterizers;
};

}  // namespace Zr
