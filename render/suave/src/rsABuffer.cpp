#include "rsABuffer.h"

#include <algorithm>
#include <climits>

#include "assertions.h"
#include "rsImageCreatorA.h"
#include "rsShadingInputs.h"
#include "rsTolerance.h"

namespace Zr {

namespace {

constexpr const char* kSourceFile = "render\\suave\\src\\rsABuffer";

using Span = RsABuffer::Span;
constexpr int kCellBits = Span::kSubPixelBits;
constexpr int kCells = Span::kSubPixels;

// The span method of a vertex kind for the buffer's mode.
template <class Vertex>
typename RsABuffer::Rasterizer<Vertex>::DrawSpan spanMethod(bool zBuffer) {
    return zBuffer ? &RsABuffer::drawSpanZ<Vertex> : &RsABuffer::drawSpanNoZ<Vertex>;
}

// The samples of the pixel that starts at sub-pixel px that the span covers. A sub-scanline that
// the triangle misses holds -1 at both ends and covers nothing.
std::uint16_t coverageAt(const Span& span, int px) {
    unsigned int mask = 0;
    for (int i = 0; i < RsAFragment::kSamples; ++i) {
        const int s = px + RsAFragment::kSamplePattern[i];
        mask |= static_cast<unsigned int>(span._x1[i] <= s && s < span._x2[i]) << i;
    }
    return static_cast<std::uint16_t>(mask);
}

// The samples of n, among the shared ones, where n's plane lies at or behind f's. Where the depth
// intervals do not overlap, they decide for all samples at once.
unsigned int sharedSamplesBehind(const RsAFragment& n, const RsAFragment& f, unsigned int shared) {
    if (f._zMin > n._zMax) return 0;
    if (n._zMin >= f._zMax) return shared;
    unsigned int behind = 0;
    for (int i = 0; i < RsAFragment::kSamples; ++i)
        if ((shared >> i) & 1u) behind |= static_cast<unsigned int>(n.depthAt(i) >= f.depthAt(i)) << i;
    return behind;
}

}  // namespace

RsABuffer::RsABuffer(int x, int y, int width, int height, bool zBuffer, bool unpremultiply,
                     RsABufferMemory* memory)
    : _x(x),
      _y(y),
      _width(width),
      _height(height),
      _unpremultiply(unpremultiply),
      _memory(memory),
      _rasterizers(*this, spanMethod<RsPlainVertex>(zBuffer), spanMethod<RsNormalVertex>(zBuffer),
                   spanMethod<RsTangentVertex>(zBuffer), getPixelRegion()) {
    ZR_ASSERT_AT(width >= 0 && height >= 0, kSourceFile, __LINE__);
    acquire(getPixelCount(), zBuffer, memory);
}

RsABuffer::~RsABuffer() {
    // The per-pixel arrays and the pool go back, or go first; the rasterizers and the guards follow
    // as members.
    release(_memory);
}

void RsABuffer::setOutput(const IxWriteGuard& output, const IxReadGuard& background, const Rgba& fillColor,
                          bool accumulate, float weight, const RsFilterKernel& kernel) {
    _output = output;
    _background = background;
    _fillColor = fillColor;
    _accumulate = accumulate;
    _weight = weight;
    _kernel = kernel;
}

void RsABuffer::finalize() {
    RsImageCreatorA::createImage(*this, getPixelRegion(), _kernel, _accumulate, _weight, _unpremultiply,
                                 _fillColor, _background, _output);
}

std::size_t RsABuffer::getMemorySize() const {
    return sizeof(RsABuffer) + getArrayBytes();
}

template <class Vertex, class Pixel>
void RsABuffer::walkSpan(const Span& span, RsPixelData<Vertex>& data, Pixel&& pixel) {
    int px = (span._minX1 >> kCellBits) << kCellBits;
    const int end = span._maxX2;
    if (span._x1[0] == Span::kMissed || span._x1[kCells - 1] == Span::kMissed) {
        // The triangle begins or ends inside this pixel row: no pixel is covered whole.
        for (; px < end; px += kCells, data.stepX()) pixel(px >> kCellBits, coverageAt(span, px), false);
        return;
    }
    for (; px < span._maxX1; px += kCells, data.stepX()) pixel(px >> kCellBits, coverageAt(span, px), false);
    // Every sub-scanline starts at or before px and ends at or after px + 16.
    const int interiorEnd = span._minX2 & ~(kCells - 1);
    for (; px < interiorEnd; px += kCells, data.stepX()) pixel(px >> kCellBits, RsAFragment::kFullCoverage, true);
    for (; px < end; px += kCells, data.stepX()) pixel(px >> kCellBits, coverageAt(span, px), false);
}

template <class Vertex>
RsAFragment* RsABuffer::makeFragment(const Context& context, const RsPixelData<Vertex>& data,
                                     std::uint16_t mask) {
    RsAFragment* fragment = _pool->allocate<RsAFragment>();
    const double z = data._z._q;
    const double slope = data._z._slope;
    fragment->_z = z;
    fragment->_zMax = z + slope;
    fragment->_zMin = z - slope;
    fragment->_dz_dx = data._z._dq_dx;
    fragment->_dz_dy = data._z._dq_dy;
    fragment->_coverage = mask;
    fragment->_transfer = context._transfer;
    // One shade per pixel and triangle, at the pixel's centre, whatever the coverage.
    rsFillShadingContext(context._shadingContext, data, context._needed);
    fragment->_color = context._material->shade(context._shadingContext);
    return fragment;
}

template <class Vertex>
void RsABuffer::drawSpanNoZ(const Context& context, int row, const Span& span, RsPixelData<Vertex>& data) {
    const std::ptrdiff_t rowStart = std::ptrdiff_t(row) * _width;
    std::uint16_t* const closed = _closed.get() + rowStart;
    RsAFragment** const lists = _lists.get() + rowStart;
    walkSpan(span, data, [&](int x, std::uint16_t mask, bool) {
        // Nothing to add where every covered sample is closed; the fragment keeps its whole mask.
        if ((mask & ~closed[x]) == 0) return;
        RsAFragment* fragment = makeFragment(context, data, mask);
        // The drawing order alone decides: the last drawn lies farthest.
        fragment->_next = lists[x];
        lists[x] = fragment;
        if (context._canBeOpaque && RsTolerance::isOne(fragment->_color.a)) closed[x] |= mask;
    });
}

template <class Vertex>
void RsABuffer::drawSpanZ(const Context& context, int row, const Span& span, RsPixelData<Vertex>& data) {
    const std::ptrdiff_t rowStart = std::ptrdiff_t(row) * _width;
    double* const nearest = _zBuffer.get() + rowStart;
    RsAFragment** const lists = _lists.get() + rowStart;
    walkSpan(span, data, [&](int x, std::uint16_t mask, bool interior) {
        // Nothing is shaded for no sample, nor wholly at or behind an opaque cover of the pixel.
        if (mask == 0 || !(nearest[x] > data._z._q - data._z._slope)) return;
        RsAFragment* fragment = makeFragment(context, data, mask);
        // A partial fragment cannot hide anything for the whole pixel.
        const bool closesPixel = interior && context._canBeOpaque && RsTolerance::isOne(fragment->_color.a);
        insertByDepth(lists[x], fragment, nearest[x], closesPixel);
    });
}

void RsABuffer::insertByDepth(RsAFragment*& head, RsAFragment* n, double& nearest, bool closesPixel) {
    if (closesPixel) nearest = std::min(n->_zMax, nearest);
    const auto linkAfter = [&head](RsAFragment* prev, RsAFragment* f) {
        RsAFragment*& link = prev == nullptr ? head : prev->_next;
        f->_next = link;
        link = f;
    };

    // The samples of n where it lies in front of some fragment that covers them, and those where
    // it lies at or behind one (ties count n as behind). The list is ordered at every sample, so
    // once a sample has met a fragment that n lies behind, all later ones that cover it lie nearer.
    unsigned int inFront = 0;
    unsigned int behindSome = 0;
    RsAFragment* last = nullptr;
    for (RsAFragment* cur = head; cur != nullptr && behindSome != n->_coverage; last = cur, cur = cur->_next) {
        const unsigned int shared = n->_coverage & cur->_coverage & ~behindSome;
        if (shared == 0) continue;
        const unsigned int behind = sharedSamplesBehind(*n, *cur, shared);
        behindSome |= behind;
        inFront |= shared & ~behind;
    }
    // Most often n lies behind all it meets, or in front of all: it goes in whole, at the head or
    // at the end (the fragments it passes there share none of its samples with it).
    if (inFront == 0) return linkAfter(nullptr, n);
    if (behindSome == 0) return linkAfter(last, n);
    insertSplit(head, n);
}

void RsABuffer::insertSplit(RsAFragment*& head, RsAFragment* n) {
    constexpr int kSamples = RsAFragment::kSamples;
    constexpr int kEnd = INT_MAX;  // the position after the list's last fragment
    // Where each sample of n may go, as positions between the list's fragments (position k lies
    // just before fragment k): after the last fragment that covers the sample and lies behind n
    // there, and at the latest just before the first one that covers it and does not.
    int after[kSamples];
    int before[kSamples];
    std::fill(after, after + kSamples, -1);
    std::fill(before, before + kSamples, kEnd);
    unsigned int open = n->_coverage;  // samples whose latest position is still unknown
    int k = 0;
    for (const RsAFragment* cur = head; cur != nullptr && open != 0; cur = cur->_next, ++k) {
        const unsigned int shared = open & cur->_coverage;
        if (shared == 0) continue;
        const unsigned int behind = sharedSamplesBehind(*n, *cur, shared);
        for (int i = 0; i < kSamples; ++i) {
            if (((shared >> i) & 1u) == 0) continue;
            if ((behind >> i) & 1u) before[i] = k;
            else after[i] = k;
        }
        open &= ~behind;
    }

    // As few records as will do: each at the latest position of the samples that must be placed
    // first, taking every sample that may go there as well.
    unsigned int unplaced = n->_coverage;
    RsAFragment* prev = nullptr;  // the fragment after which the next record goes
    int next = 0;                 // the list position just after prev
    RsAFragment* record = n;
    while (unplaced != 0) {
        int position = kEnd;
        for (int i = 0; i < kSamples; ++i)
            if (((unplaced >> i) & 1u) && before[i] < position) position = before[i];
        unsigned int group = 0;
        for (int i = 0; i < kSamples; ++i)
            if (((unplaced >> i) & 1u) && after[i] < position) group |= 1u << i;
        unplaced &= ~group;
        if (record == nullptr) {
            record = _pool->allocate<RsAFragment>();
            *record = *n;
        }
        record->_coverage = static_cast<std::uint16_t>(group);
        for (RsAFragment* following = prev == nullptr ? head : prev->_next; next < position && following != nullptr;
             following = following->_next, ++next)
            prev = following;
        RsAFragment*& link = prev == nullptr ? head : prev->_next;
        record->_next = link;
        link = record;
        prev = record;
        record = nullptr;
    }
}

template void RsABuffer::drawSpanZ<RsPlainVertex>(const Context&, int, const Span&, RsPixelData<RsPlainVertex>&);
template void RsABuffer::drawSpanZ<RsNormalVertex>(const Context&, int, const Span&, RsPixelData<RsNormalVertex>&);
template void RsABuffer::drawSpanZ<RsTangentVertex>(const Context&, int, const Span&, RsPixelData<RsTangentVertex>&);
template void RsABuffer::drawSpanNoZ<RsPlainVertex>(const Context&, int, const Span&, RsPixelData<RsPlainVertex>&);
template void RsABuffer::drawSpanNoZ<RsNormalVertex>(const Context&, int, const Span&, RsPixelData<RsNormalVertex>&);
template void RsABuffer::drawSpanNoZ<RsTangentVertex>(const Context&, int, const Span&,
                                                       RsPixelData<RsTangentVertex>&);

void RsABuffer::dump(std::ostream& os) const {
    os << " _x: " << _x << " _y: " << _y << " _width: " << _width << " _height: " << _height
       << " _accumulate: " << _accumulate << " _unpremultiply: " << _unpremultiply << " _weight: " << _weight
       << " _background: ";
    _background.dump(os);
    os << " _output: ";
    _output.dump(os);
    os << " _fillColor: ";
    _fillColor.dump(os);
    os << " _kernel:";
    _kernel.dump(os);
    dumpArrays(os);
}

}  // namespace Zr
