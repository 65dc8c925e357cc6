#pragma once
// Shared helpers of the rasterizer tests: a buffer that records what the rasterizer delivers, an
// exact reference of the fill rule, vertex makers, and an interrupt handler that counts and throws.
//
// Coordinates. Test vertices lie on a grid of 1/256 pixel (Pt holds integers in that unit), so
// that they are exact in float and double. The reference works in the rasterizer's walking frame,
// where samples lie on the integers: w = (x - regionOrigin) * 2^bits - 1/2, held exactly as
// integers in units of 1/512 (kWalkUnit).
#include <algorithm>
#include <cmath>
#include <cstdint>
#include <functional>
#include <optional>
#include <random>
#include <type_traits>
#include <vector>

#include "exRenderCancelled.h"
#include "pxInterruptHandler.h"
#include "pxRequestMgr.h"
#include "rcShdPtr.h"
#include "rsRasterizer.h"

namespace Zr::RsRasterTest {

using i64 = std::int64_t;

constexpr i64 kPixelUnit = 256;  // test coordinates are integers in 1/256 pixel
constexpr i64 kWalkUnit = 512;   // reference walking coordinates are integers in 1/512

struct Pt {
    i64 x;  // in 1/256 pixel, absolute
    i64 y;
};

inline double toPixels(i64 v) { return static_cast<double>(v) / kPixelUnit; }

// A vertex of the given kind at p. 3D kinds get w = 1 and the depth z; their other attributes are
// left at zero for the callers that set them.
template <class Vertex>
Vertex makeVertex(Pt p, double z = 0.0) {
    Vertex v{};
    if constexpr (std::is_same_v<Vertex, Rs2DVertex>) {
        v._x = static_cast<float>(toPixels(p.x));
        v._y = static_cast<float>(toPixels(p.y));
        (void)z;
    } else {
        v._pixCoord = GeHomogeneousCoord3<double>(toPixels(p.x), toPixels(p.y), z, 1.0);
        v._w = 1.0;
    }
    return v;
}

// The exact walking-frame coordinate, in kWalkUnit, of an absolute coordinate in 1/256 pixel.
inline i64 walk(i64 v, int origin, int bits) {
    return 2 * (v - kPixelUnit * origin) * (i64(1) << bits) - kPixelUnit;
}

inline i64 floorDiv(i64 a, i64 b) { return a >= 0 ? a / b : -((-a + b - 1) / b); }
inline i64 ceilDiv(i64 a, i64 b) { return -floorDiv(-a, b); }

// The fill rule in exact arithmetic, by edge functions: a sample is covered when it lies strictly
// inside all three edges, or on an edge that is a left edge or a top edge.
class ReferenceTriangle {
public:
    ReferenceTriangle(Pt a, Pt b, Pt c, int originX, int originY, int xBits, int yBits)
        : _v{{walk(a.x, originX, xBits), walk(a.y, originY, yBits)},
             {walk(b.x, originX, xBits), walk(b.y, originY, yBits)},
             {walk(c.x, originX, xBits), walk(c.y, originY, yBits)}} {
        const i64 area = edge(_v[0], _v[1], _v[2]);
        if (area < 0) std::swap(_v[1], _v[2]);
        _valid = area != 0;
    }

    bool isValid() const { return _valid; }

    // Sample (sx, sy) in walking integers, i.e. region-relative sample indices.
    bool covers(i64 sx, i64 sy) const {
        if (!_valid) return false;
        const Pt p{sx * kWalkUnit, sy * kWalkUnit};
        for (int i = 0; i < 3; ++i) {
            const Pt& a = _v[i];
            const Pt& b = _v[(i + 1) % 3];
            const i64 e = edge(a, b, p);
            if (e < 0) return false;
            if (e == 0) {
                // With the interior on the positive side, an edge going up has the interior on
                // its right (a left edge); a horizontal edge going right has it below (a top edge).
                const bool leftOrTop = b.y < a.y || (b.y == a.y && b.x > a.x);
                if (!leftOrTop) return false;
            }
        }
        return true;
    }

    // Horizontal distance, in walking units, from the sample to the nearest edge line that is not
    // horizontal; large when there is none.
    double horizontalDistance(i64 sx, i64 sy) const {
        double best = 1e300;
        const Pt p{sx * kWalkUnit, sy * kWalkUnit};
        for (int i = 0; i < 3; ++i) {
            const Pt& a = _v[i];
            const Pt& b = _v[(i + 1) % 3];
            if (a.y == b.y) continue;
            const double d = std::abs(static_cast<double>(edge(a, b, p))) /
                             std::abs(static_cast<double>(b.y - a.y)) / kWalkUnit;
            best = std::min(best, d);
        }
        return best;
    }

    // Sample rows and columns that can be covered: [rowBegin, rowEnd) x [colBegin, colEnd).
    i64 rowBegin() const { return ceilDiv(std::min({_v[0].y, _v[1].y, _v[2].y}), kWalkUnit); }
    i64 rowEnd() const { return ceilDiv(std::max({_v[0].y, _v[1].y, _v[2].y}), kWalkUnit); }
    i64 colBegin() const { return ceilDiv(std::min({_v[0].x, _v[1].x, _v[2].x}), kWalkUnit); }
    i64 colEnd() const { return ceilDiv(std::max({_v[0].x, _v[1].x, _v[2].x}), kWalkUnit) + 1; }
    // Largest |x| and |dx/dy| of the edges, in walking units, for rounding bounds.
    double maxAbsX() const {
        return std::max({std::abs(_v[0].x), std::abs(_v[1].x), std::abs(_v[2].x)}) /
               double(kWalkUnit);
    }
    double maxAbsSlope() const {
        double s = 0;
        for (int i = 0; i < 3; ++i) {
            const Pt& a = _v[i];
            const Pt& b = _v[(i + 1) % 3];
            if (a.y != b.y) s = std::max(s, std::abs(double(b.x - a.x) / double(b.y - a.y)));
        }
        return s;
    }

private:
    static i64 edge(const Pt& a, const Pt& b, const Pt& p) {
        return (b.x - a.x) * (p.y - a.y) - (b.y - a.y) * (p.x - a.x);
    }

    Pt _v[3];
    bool _valid;
};

// A buffer that records what reaches it: a count per sample at the span's grain (per pixel, or
// per sub-cell), every delivery if asked, and a per-pixel hook that sees the pixel data as a
// consumer would, stepping it along the span.
//
// Sub-pixel spans are read the way the A-buffer reads them: pixels from the one holding _minX1
// while below _maxX2, each sample tested against its sub-scanline's start and end. The pixels
// that such a consumer would take as interior (covered on every sub-scanline without a test) are
// checked to be fully covered.
template <class Vertex, class PixelSpan>
class RecordingBuffer {
public:
    struct Context {
        int tag = 0;
    };
    using PixelData = RsPixelData<Vertex>;
    using Rasterizer = RsRasterizer<RecordingBuffer, Vertex, PixelSpan>;
    static constexpr int kXBits = PixelSpan::kSubPixelBits;
    static constexpr int kYBits = PixelSpan::kSubScanlineBits;

    struct Delivery {
        int row;
        PixelSpan span;
    };

    explicit RecordingBuffer(GeRectangle<int> region)
        : _region(region),
          _samplesX(region.getWidth() << kXBits),
          _samplesY(region.getHeight() << kYBits),
          _counts(static_cast<std::size_t>(_samplesX) * _samplesY, 0) {}

    GeRectangle<int> getPixelRegion() const { return _region; }

    void drawSpan(const Context& context, int row, const PixelSpan& span, PixelData& data) {
        ++_calls;
        if (_expectedContext && &context != _expectedContext) ++_wrongContext;
        if (_keepDeliveries) _deliveries.push_back({row, span});
        if (_pendingFirstRow) {
            _rowOffset = *_pendingFirstRow - row;
            _pendingFirstRow.reset();
        }
        row += _rowOffset;
        if constexpr (kXBits == 0) {
            for (int x = span._x1; x < span._x2; ++x) {
                hit(x, row);
                if (_onPixel) _onPixel(x, row, data);
                data.stepX();
            }
        } else {
            constexpr int kCells = 1 << kXBits;
            constexpr int kRows = 1 << kYBits;
            const bool allRows = span._x1[0] != -1 && span._x1[kRows - 1] != -1;
            const int interiorEnd = span._minX2 & ~(kCells - 1);
            for (int px = (span._minX1 >> kXBits) << kXBits; px < span._maxX2; px += kCells) {
                int covered = 0;
                for (int r = 0; r < kRows; ++r) {
                    for (int s = px; s < px + kCells; ++s) {
                        if (span._x1[r] <= s && s < span._x2[r]) {
                            hit(s, (row << kYBits) + r);
                            ++covered;
                        }
                    }
                }
                if (allRows && px >= span._maxX1 && px + kCells <= interiorEnd &&
                    covered != kCells * kRows)
                    ++_interiorViolations;
                if (_onPixel) _onPixel(px >> kXBits, row, data);
                data.stepX();
            }
        }
    }

    // Sample counts, region-relative, at the span's grain.
    int count(int sx, int sy) const { return _counts[static_cast<std::size_t>(sy) * _samplesX + sx]; }
    int samplesX() const { return _samplesX; }
    int samplesY() const { return _samplesY; }
    const std::vector<int>& counts() const { return _counts; }
    long outOfRange() const { return _outOfRange; }
    long hits() const { return _hits; }
    long interiorViolations() const { return _interiorViolations; }
    long calls() const { return _calls; }
    long wrongContext() const { return _wrongContext; }
    const std::vector<Delivery>& deliveries() const { return _deliveries; }

    void clear() {
        std::fill(_counts.begin(), _counts.end(), 0);
        _deliveries.clear();
        _outOfRange = _interiorViolations = _calls = _wrongContext = _hits = 0;
    }
    void keepDeliveries(bool keep) { _keepDeliveries = keep; }
    void expectContext(const Context* context) { _expectedContext = context; }
    void onPixel(std::function<void(int, int, const PixelData&)> f) { _onPixel = std::move(f); }
    // For spans whose delivered rows are not their true rows (8 x 4 cells): the first span that
    // arrives next lies at true pixel row trueRow, and the following ones keep the same offset.
    void expectFirstRow(int trueRow) { _pendingFirstRow = trueRow; }

private:
    void hit(int sx, int sy) {
        if (sx < 0 || sy < 0 || sx >= _samplesX || sy >= _samplesY) {
            ++_outOfRange;
            return;
        }
        ++_counts[static_cast<std::size_t>(sy) * _samplesX + sx];
        ++_hits;
    }

    GeRectangle<int> _region;
    int _samplesX;
    int _samplesY;
    std::vector<int> _counts;
    long _outOfRange = 0;
    long _hits = 0;
    long _interiorViolations = 0;
    long _calls = 0;
    long _wrongContext = 0;
    bool _keepDeliveries = false;
    std::vector<Delivery> _deliveries;
    const Context* _expectedContext = nullptr;
    std::function<void(int, int, const PixelData&)> _onPixel;
    std::optional<int> _pendingFirstRow;
    int _rowOffset = 0;
};

// A recording buffer with its rasterizer over a region, drawing triangles given on the test grid.
template <class Vertex, class PixelSpan>
class Harness {
public:
    using Buffer = RecordingBuffer<Vertex, PixelSpan>;
    using Rasterizer = typename Buffer::Rasterizer;
    static constexpr int kXBits = PixelSpan::kSubPixelBits;
    static constexpr int kYBits = PixelSpan::kSubScanlineBits;
    static constexpr bool kSubPixel = kXBits != 0;
    // Relative rounding of the edge walk: float for whole pixels, double for sub-pixels.
    static constexpr double kEpsilon = kSubPixel ? 0x1p-52 : 0x1p-23;

    // Spans whose rows are not delivered at their place (8 x 4 cells) can only be put back in
    // place by the buffer when a triangle arrives in one block: they get a block of 4096 rows.
    Harness(GeRectangle<int> region, int blockWidth, int blockHeight)
        : _region(region),
          _buffer(region),
          _rasterizer(_buffer, &Buffer::drawSpan, region, blockWidth,
                      kXBits != kYBits ? 4096 : blockHeight) {
        _buffer.expectContext(&_context);
    }

    ReferenceTriangle reference(Pt a, Pt b, Pt c) const {
        return ReferenceTriangle(a, b, c, _region.x0, _region.y0, kXBits, kYBits);
    }

    void draw(Pt a, Pt b, Pt c) {
        if constexpr (kXBits != kYBits) {
            // Rows of such spans are not delivered at their place; tell the buffer where the
            // first one really lies.
            _buffer.expectFirstRow(
                static_cast<int>(floorDiv(reference(a, b, c).rowBegin(), i64(1) << kYBits)));
        }
        _rasterizer.rasterizeTriangle(_context, makeVertex<Vertex>(a), makeVertex<Vertex>(b),
                                      makeVertex<Vertex>(c));
    }

    // A bound on how far the walked edges of the triangle may stray from the exact ones, in
    // walking units.
    static double roundingBound(const ReferenceTriangle& t) {
        const double rows = static_cast<double>(t.rowEnd() - t.rowBegin()) + 2.0;
        return rows * (t.maxAbsX() + t.maxAbsSlope() + 1.0) * kEpsilon * 4.0;
    }

    const GeRectangle<int>& region() const { return _region; }
    Buffer& buffer() { return _buffer; }
    Rasterizer& rasterizer() { return _rasterizer; }
    const typename Buffer::Context& context() const { return _context; }

private:
    GeRectangle<int> _region;
    Buffer _buffer;
    Rasterizer _rasterizer;
    typename Buffer::Context _context{7};
};

// Counts interrupt checks, and throws on the check numbered throwAt (1-based) if it is set.
class CountingInterruptHandler : public PxInterruptHandler {
public:
    void onInterruptCheck() override {
        ++_checks;
        if (_checks == _throwAt) throw ExRenderCancelled("test cancel");
    }
    long checks() const { return _checks; }
    void reset(long throwAt = -1) {
        _checks = 0;
        _throwAt = throwAt;
    }

private:
    long _checks = 0;
    long _throwAt = -1;
};

// Installs a handler on the request manager for the lifetime of the scope.
class InterruptHandlerScope {
public:
    explicit InterruptHandlerScope(const RCShdPtr<PxInterruptHandler>& handler) {
        PxRequestMgr::getInstance()->setInterruptHandler(handler);
    }
    ~InterruptHandlerScope() { PxRequestMgr::getInstance()->setInterruptHandler(nullptr); }
    InterruptHandlerScope(const InterruptHandlerScope&) = delete;
    InterruptHandlerScope& operator=(const InterruptHandlerScope&) = delete;
};

// A random position in [lo, hi) pixels on the 1/256 grid.
inline i64 randomCoord(std::mt19937& rng, double lo, double hi) {
    std::uniform_int_distribution<i64> d(static_cast<i64>(lo * kPixelUnit),
                                         static_cast<i64>(hi * kPixelUnit) - 1);
    return d(rng);
}

}  // namespace Zr::RsRasterTest
