#include "rsImageCreatorA.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

#include "rsABuffer.h"
#include "rsFilterTable.h"
#include "rsImageCreatorUtil.h"
#include "rsTolerance.h"

namespace Zr {

namespace {

using Rgba = RsImageCreatorA::Rgba;
using Util = RsImageCreatorUtil;

// A group of samples whose colour waits while another group goes on through the list: its mask,
// its colour so far and the fragment where it goes on.
struct PendingGroup {
    std::uint16_t _mask = 0;
    const RsAFragment* _next = nullptr;
    Rgba _color{0.0f, 0.0f, 0.0f, 1.0f};
};

// The scatter of sample groups into the ring of output rows that a source row reaches.
class FilterRing {
public:
    // Room for 256 waiting groups: more than the 16 samples can ever need.
    static constexpr std::size_t kStackSize = 256;

    FilterRing(const RsFilterTable& table, int width)
        : _table(table), _n(table.getKernelSize()), _rowLength(width + 2 * table.getSupport()), _stack(kStackSize) {
        _rows.reserve(std::size_t(_n));
        for (int j = 0; j < _n; ++j) _rows.push_back(std::make_unique<Rgba[]>(std::size_t(_rowLength)));
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
        for (int j = 0, t = 0; j < _n; ++j) {
            Rgba* row = _rows[std::size_t(j)].get() + x;
            for (int k = 0; k < _n; ++k, ++t) {
                const float w = low[t] + high[t];
                row[k].r += colour.r * w;
                row[k].g += colour.g * w;
                row[k].b += colour.b * w;
                row[k].a += colour.a * w;
            }
        }
    }

    const RsFilterTable& _table;
    int _n;
    int _rowLength;
    std::vector<std::unique_ptr<Rgba[]>> _rows;
    std::vector<PendingGroup> _stack;
};

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
    const int y0 = region.y0, y1 = region.y1;
    const int width = region.x1 - region.x0;

    const Util::BackgroundWindow window(background, region);
    Util::RowFunctions functions;
    Util::selectRowReader(functions, background._pixelFormat);
    Util::selectRowWriter(functions, output._pixelFormat, accumulate);
    if (width <= 0) return;

    const RsFilterTable table(kernel);
    const bool scale = !RsTolerance::isEqual(weight, 1.0f);
    Util::AlignedRow backgroundRow(width);
    Rgba* const row = backgroundRow.get();
    Util::fill(row, row + width, fillColor);
    bool rowHoldsBackground = false;
    FilterRing ring(table, width);
    for (int y = y0; y < y1; ++y) {
        if (window.holdsRow(y)) {
            Util::readBackground(functions, background, window, y, row, width);
            rowHoldsBackground = true;
        } else if (rowHoldsBackground) {
            Util::fill(row + window.leftPad, row + width - window.rightPad, fillColor);
            rowHoldsBackground = false;
        }
        ring.compositeRow(row, lists + std::ptrdiff_t(y - y0) * width, width);

        // The oldest ring row is output row y - support, complete once 2 * support rows are in.
        if (y - y0 >= 2 * support && width > 2 * support) {
            Rgba* const out = ring.oldestRow();
            for (int e = 2 * support; e < width; ++e) {
                if (unpremultiply) Util::unpremultiply(out[e]);
                if (scale) out[e] *= weight;
            }
            Util::writeOutput(functions, output, region.x0 + support, y - support, out + 2 * support,
                              width - 2 * support);
        }
        ring.rotate();
    }
}

}  // namespace Zr
