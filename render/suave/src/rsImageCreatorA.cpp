#include "rsImageCreatorA.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

#include "assertions.h"
#include "rsABuffer.h"
#include "rsFilterTable.h"
#include "rsImageCreatorUtil.h"
#include "rsTolerance.h"

namespace Zr {

namespace {

constexpr const char* kSourceFile = "render\\suave\\src\\rsImageCreatorA";

using Rgba = RsImageCreatorA::Rgba;
using Util = RsImageCreatorUtil;

// A group of samples whose colour waits while another group goes on through the list: its mask,
// its colour so far and the fragment where it goes on.
struct PendingGroup {
    std::uint16_t _mask = 0;
    const RsAFragment* _next = nullptr;
    Rgba _color{0.0f, 0.0f, 0.0f, 1.0f};
};

// The scatter of sample groups into the ring of output rows that a source row reaches, for a
// kernel of Support pixels (the loops over the taps then have fixed counts).
template <int Support>
class FilterRing {
public:
    // Room for 256 waiting groups: more than the 16 samples can ever need.
    static constexpr std::size_t kStackSize = 256;

    FilterRing(const RsFilterTable& table, int width)
        : _table(table), _rowLength(width + 2 * Support), _stack(kStackSize) {
        _rows.reserve(std::size_t(kTaps));
        for (int j = 0; j < kTaps; ++j) _rows.push_back(std::make_unique<Rgba[]>(std::size_t(_rowLength)));
    }

    // Composites each pixel of a source row over its background colour (straight) and scatters
    // each of its sample groups.
    void compositeRow(const Rgba* background, RsAFragment* const* lists, int width) {
        PendingGroup* const stack = _stack.data();
        for (int x = 0; x < width; ++x) {
            const Rgba& b = background[x];
            Rgba colour(b.r * b.a, b.g * b.a, b.b * b.a, b.a);
            const RsAFragment* f = lists[x];
            if (f == nullptr) {
                scatter(x, colour, RsAFragment::kFullCoverage);
                continue;
            }
            unsigned int mask = RsAFragment::kFullCoverage;
            int depth = 0;
            for (;;) {
                while (f != nullptr) {
                    const unsigned int covered = mask & f->_coverage;
                    mask &= ~static_cast<unsigned int>(f->_coverage);
                    if (covered != 0) {
                        // The covered samples wait with the blended colour; the others go on.
                        PendingGroup& group = stack[depth++];
                        group._mask = static_cast<std::uint16_t>(covered);
                        group._next = f->_next;
                        f->_transfer(f->_color, colour, group._color);
                    }
                    if (mask == 0) {
                        const PendingGroup& group = stack[--depth];
                        colour = group._color;
                        mask = group._mask;
                        f = group._next;
                    } else {
                        f = f->_next;
                    }
                }
                // The list has ended for this group; go on with a waiting one that has fragments
                // left, scattering those that have none.
                scatter(x, colour, mask);
                bool resumed = false;
                while (depth > 0) {
                    const PendingGroup& group = stack[--depth];
                    colour = group._color;
                    mask = group._mask;
                    f = group._next;
                    if (f != nullptr) {
                        resumed = true;
                        break;
                    }
                    scatter(x, colour, mask);
                }
                if (!resumed) break;
            }
        }
    }

    // The oldest row: complete once every source row that reaches it is scattered.
    Rgba* oldestRow() const { return _rows.front().get(); }

    // Clears the oldest row and makes it the newest.
    void rotate() {
        std::fill(_rows.front().get(), _rows.front().get() + _rowLength, Rgba(0.0f, 0.0f, 0.0f, 0.0f));
        std::rotate(_rows.begin(), _rows.begin() + 1, _rows.end());
    }

private:
    // Adds the colour of a group of samples of source column x to the output pixels it reaches.
    void scatter(int x, const Rgba& colour, unsigned int mask) {
        const float* low = _table.getLowWeights(mask & 0xffu);
        const float* high = _table.getHighWeights(mask >> 8);
        for (int j = 0, t = 0; j < kTaps; ++j) {
            Rgba* row = _rows[std::size_t(j)].get() + x;
            for (int k = 0; k < kTaps; ++k, ++t) {
                const float w = low[t] + high[t];
                row[k].r += colour.r * w;
                row[k].g += colour.g * w;
                row[k].b += colour.b * w;
                row[k].a += colour.a * w;
            }
        }
    }

    static constexpr int kTaps = 2 * Support + 1;  // taps across one axis

    const RsFilterTable& _table;
    int _rowLength;
    std::vector<std::unique_ptr<Rgba[]>> _rows;
    std::vector<PendingGroup> _stack;
};

// What one call resolves: its arguments, the background window, the row functions and the table.
struct Resolve {
    RsAFragment* const* lists;
    const GeRectangle<int>& region;
    bool accumulate;
    float weight;
    bool unpremultiply;
    const Rgba& fillColor;
    const IxReadGuard& background;
    const IxWriteGuard& output;
    const Util::BackgroundWindow& window;
    const Util::RowFunctions& functions;
    const RsFilterTable& table;
};

// The rows of the region, top to bottom, each composited and scattered, and the output row that it
// completes finished and written.
template <int Support>
void resolveRows(const Resolve& r) {
    const int y0 = r.region.y0, y1 = r.region.y1;
    const int width = r.region.x1 - r.region.x0;
    const bool scale = !RsTolerance::isEqual(r.weight, 1.0f);
    Util::AlignedRow backgroundRow(width);
    Rgba* const row = backgroundRow.get();
    Util::fill(row, row + width, r.fillColor);
    bool rowHoldsBackground = false;
    FilterRing<Support> ring(r.table, width);
    for (int y = y0; y < y1; ++y) {
        if (r.window.holdsRow(y)) {
            Util::readBackground(r.functions, r.background, r.window, y, row, width);
            rowHoldsBackground = true;
        } else if (rowHoldsBackground) {
            Util::fill(row + r.window.leftPad, row + width - r.window.rightPad, r.fillColor);
            rowHoldsBackground = false;
        }
        ring.compositeRow(row, r.lists + std::ptrdiff_t(y - y0) * width, width);

        // The oldest ring row is output row y - Support, complete once 2 * Support rows are in.
        if (y - y0 >= 2 * Support && width > 2 * Support) {
            Rgba* const out = ring.oldestRow();
            for (int e = 2 * Support; e < width; ++e) {
                if (r.unpremultiply) Util::unpremultiply(out[e]);
                if (scale) out[e] *= r.weight;
            }
            Util::writeOutput(r.functions, r.output, r.region.x0 + Support, y - Support, out + 2 * Support,
                              width - 2 * Support);
        }
        ring.rotate();
    }
}

}  // namespace

void RsImageCreatorA::createImage(RsABuffer& buffer, const GeRectangle<int>& region, const RsFilterKernel& kernel,
                                  bool accumulate, float weight, bool unpremultiply, const Rgba& fillColor,
                                  const IxReadGuard& background, const IxWriteGuard& output) {
    createImage(buffer.getLists(), region, kernel, accumulate, weight, unpremultiply, fillColor, background,
                output);
}

void RsImageCreatorA::createImage(RsAFragment* const* lists, const GeRectangle<int>& region,
                                  const RsFilterKernel& kernel, bool accumulate, float weight, bool unpremultiply,
                                  const Rgba& fillColor, const IxReadGuard& background, const IxWriteGuard& output) {
    const int support = kernel.getKernelSupport();
    const int width = region.x1 - region.x0;

    const Util::BackgroundWindow window(background, region);
    Util::RowFunctions functions;
    Util::selectRowReader(functions, background._pixelFormat);
    Util::selectRowWriter(functions, output._pixelFormat, accumulate);
    if (width <= 0) return;

    const RsFilterTable table(kernel);
    const Resolve resolve{lists, region, accumulate, weight, unpremultiply, fillColor, background, output, window,
                          functions, table};
    switch (support) {
    case 0: return resolveRows<0>(resolve);
    case 1: return resolveRows<1>(resolve);
    case 2: return resolveRows<2>(resolve);
    default: Assertions::throwProgramAborted(kSourceFile, __LINE__, "filter kernel of unknown support");
    }
}

}  // namespace Zr
