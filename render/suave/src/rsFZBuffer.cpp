#include "rsFZBuffer.h"

#include <algorithm>

#include "assertions.h"
#include "rsAuxOutputs.h"
#include "rsImageCreatorFZ.h"
#include "rsShadingInputs.h"
#include "rsTolerance.h"

namespace Zr {

namespace {

constexpr const char* kSourceFile = "render\\suave\\src\\rsFZBuffer";

// The span method of a vertex kind for the buffer's mode, recording auxiliary outputs or not.
template <class Vertex>
typename RsFZBuffer::Rasterizer<Vertex>::DrawSpan spanMethod(bool zBuffer, bool aux) {
    if (aux) return zBuffer ? &RsFZBuffer::drawSpanZ<Vertex, true> : &RsFZBuffer::drawSpanNoZ<Vertex, true>;
    return zBuffer ? &RsFZBuffer::drawSpanZ<Vertex> : &RsFZBuffer::drawSpanNoZ<Vertex>;
}

}  // namespace

RsFZBuffer::RsFZBuffer(int x, int y, int width, int height, bool zBuffer, bool unpremultiply,
                       RsFZBufferMemory* memory, RsAuxOutputs* aux)
    : _x(x),
      _y(y),
      _width(width),
      _height(height),
      _unpremultiply(unpremultiply),
      _aux(aux != nullptr && (aux->hasSurface() || aux->hasDeep()) ? aux : nullptr),
      _memory(memory),
      _rasterizers(*this, spanMethod<RsPlainVertex>(zBuffer, _aux != nullptr),
                   spanMethod<RsNormalVertex>(zBuffer, _aux != nullptr),
                   spanMethod<RsTangentVertex>(zBuffer, _aux != nullptr), getPixelRegion()) {
    ZR_ASSERT_AT(width >= 0 && height >= 0, kSourceFile, __LINE__);
    ZR_ASSERT_AT(_aux == nullptr || width == 0 || height == 0 ||
                     (_aux->getRegion().contains(x, y) && _aux->getRegion().contains(x + width - 1, y + height - 1)),
                 kSourceFile, __LINE__);
    acquire(getPixelCount(), zBuffer, memory);
}

RsFZBuffer::~RsFZBuffer() {
    // The per-pixel arrays and the pool go back, or go first; the rasterizers and the guards follow
    // as members.
    release(_memory);
}

void RsFZBuffer::setOutput(const IxWriteGuard& output, const IxReadGuard& background, const Rgba& fillColor,
                           bool accumulate, float weight) {
    _output = output;
    _background = background;
    _fillColor = fillColor;
    _accumulate = accumulate;
    _weight = weight;
    _deepShadowMap = nullptr;
}

void RsFZBuffer::setOutput(RsDeepShadowMap& map) { _deepShadowMap = &map; }

void RsFZBuffer::finalize() {
    if (_deepShadowMap != nullptr) {
        RsImageCreatorFZ::createDeepShadowMap(*this, _x, _y, _width, _height, *_deepShadowMap);
        return;
    }
    if (_aux != nullptr) _aux->finishRegion(*this);
    RsImageCreatorFZ::createImage(*this, getPixelRegion(), _accumulate, _weight, _unpremultiply, _fillColor,
                                  _background, _output);
}

std::size_t RsFZBuffer::getMemorySize() const {
    return sizeof(RsFZBuffer) + getArrayBytes();
}

template <class Vertex>
RsFragment* RsFZBuffer::makeFragment(const Context& context, const RsPixelData<Vertex>& data) {
    RsFragment* fragment = _pool->allocate();
    fragment->_depth = data._z._q;
    fragment->_transfer = context._transfer;
    rsFillShadingContext(context._shadingContext, data, context._needed);
    fragment->_color = context._material->shade(context._shadingContext);
    return fragment;
}

template <class Vertex, bool kAux>
void RsFZBuffer::drawSpanNoZ(const Context& context, int row, const Span& span, RsPixelData<Vertex>& data) {
    const std::ptrdiff_t rowStart = std::ptrdiff_t(row) * _width;
    unsigned char* const closed = _closed.get() + rowStart;
    RsFragment** const lists = _lists.get() + rowStart;
    std::size_t auxRow = 0;
    if constexpr (kAux) auxRow = _aux->indexOf(_x, _y + row);
    for (int x = span._x1; x < span._x2; ++x) {
        if (closed[x] == 0) {
            RsFragment* fragment = makeFragment(context, data);
            if constexpr (kAux) {
                _aux->recordIds(fragment, context);
                _aux->record(auxRow + std::size_t(x), fragment->_depth, fragment->_color.a, false, data, context);
            }
            // The drawing order alone decides: the last drawn lies farthest.
            fragment->_next = lists[x];
            lists[x] = fragment;
            if (context._canBeOpaque && RsTolerance::isOne(fragment->_color.a)) closed[x] = 1;
        }
        // Interpolants move on over closed pixels too.
        data.stepX();
    }
}

template <class Vertex, bool kAux>
void RsFZBuffer::drawSpanZ(const Context& context, int row, const Span& span, RsPixelData<Vertex>& data) {
    const std::ptrdiff_t rowStart = std::ptrdiff_t(row) * _width;
    double* const nearest = _zBuffer.get() + rowStart;
    RsFragment** const lists = _lists.get() + rowStart;
    std::size_t auxRow = 0;
    if constexpr (kAux) auxRow = _aux->indexOf(_x, _y + row);
    for (int x = span._x1; x < span._x2; ++x) {
        // At or behind the nearest opaque surface nothing is shaded.
        if (nearest[x] > data._z._q) {
            RsFragment* fragment = makeFragment(context, data);
            const double depth = fragment->_depth;
            if constexpr (kAux) {
                _aux->recordIds(fragment, context);
                _aux->record(auxRow + std::size_t(x), depth, fragment->_color.a, true, data, context);
            }
            const bool opaque = context._canBeOpaque && RsTolerance::isOne(fragment->_color.a);
            RsFragment* const head = lists[x];
            if (head == nullptr || depth >= head->_depth) {
                // Farthest so far, or level with the head: the newcomer goes behind.
                fragment->_next = head;
                lists[x] = fragment;
            } else {
                RsFragment* prev = head;
                while (prev->_next != nullptr && prev->_next->_depth > depth) prev = prev->_next;
                fragment->_next = prev->_next;
                // An opaque fragment drops everything behind it; the dropped ones stay in the pool.
                if (opaque) lists[x] = fragment;
                else prev->_next = fragment;
            }
            if (opaque) nearest[x] = depth;
        }
        data.stepX();
    }
}

#define RS_FZ_SPANS(Vertex, aux)                                                                      \
    template void RsFZBuffer::drawSpanZ<Vertex, aux>(const Context&, int, const Span&, RsPixelData<Vertex>&); \
    template void RsFZBuffer::drawSpanNoZ<Vertex, aux>(const Context&, int, const Span&, RsPixelData<Vertex>&);
RS_FZ_SPANS(RsPlainVertex, false)
RS_FZ_SPANS(RsNormalVertex, false)
RS_FZ_SPANS(RsTangentVertex, false)
RS_FZ_SPANS(RsPlainVertex, true)
RS_FZ_SPANS(RsNormalVertex, true)
RS_FZ_SPANS(RsTangentVertex, true)
#undef RS_FZ_SPANS

void RsFZBuffer::dump(std::ostream& os) const {
    os << " _x: " << _x << " _y: " << _y << " _width: " << _width << " _height: " << _height
       << " _accumulate: " << _accumulate << " _unpremultiply: " << _unpremultiply << " _weight: " << _weight
       << " _background: ";
    _background.dump(os);
    os << " _output: ";
    _output.dump(os);
    os << " _fillColor: ";
    _fillColor.dump(os);
    dumpArrays(os);
    os << " _deepShadowMap: " << static_cast<const void*>(_deepShadowMap);
}

}  // namespace Zr
