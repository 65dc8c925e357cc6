#pragma once
// The percentage-closer filter that the shadow maps share: the mean of the cells of a square map
// over an axis-aligned square of half side halfRange around the map position (u, v), in cells,
// each cell counting with the area it shares with the square. The part of the square outside the
// map neither lights nor shades: the sum is divided by the area of the part inside.
//
// What a cell contributes is the caller's: 0 or 1 from a depth test in plain maps, a
// transmittance per channel in deep maps. cell(index) answers for the cell at index
// row * cells + column. Sums run row by row in address order, in single precision.
//
// The map is cells x cells; a map whose size was not whole answers with its whole cells only, so
// that no position reaches past the end of a row. A square that meets the map in no area at all
// (a line along the map's edge) is a point sample: the cell under (u, v), or `outside` where
// (u, v) lies off the map, as the single-sample query answers, rather than 0 / 0.
#include <algorithm>

namespace Zr {

// The right and bottom ends of the filter square stop this far short of the map's edge, so that
// their truncation is the last cell.
inline constexpr float kRsAreaFilterEdgeInset = 0.001f;

template <class Value, class Cell>
inline Value rsAreaFilter(float u, float v, float halfRange, int cells, const Value& outside, Cell&& cell) {
    const float extent = static_cast<float>(cells);
    // The filter square, cut to the map.
    const float left = std::max(0.0f, u - halfRange);
    const float top = std::max(0.0f, v - halfRange);
    float right = u + halfRange;
    if (right >= extent) right = extent - kRsAreaFilterEdgeInset;
    float bottom = v + halfRange;
    if (bottom >= extent) bottom = extent - kRsAreaFilterEdgeInset;
    // Wholly outside the map (or not a number).
    if (!(left <= right && top <= bottom)) return outside;

    const int i0 = static_cast<int>(left);
    const int i1 = static_cast<int>(right);
    const int j0 = static_cast<int>(top);
    const int j1 = static_cast<int>(bottom);
    int row = j0 * cells + i0;
    if (i0 == i1 && j0 == j1) return cell(row);

    const float area = (right - left) * (bottom - top);
    if (!(area > 0.0f)) {
        const bool inside = u >= 0.0f && u < extent && v >= 0.0f && v < extent;
        return inside ? cell(static_cast<int>(v) * cells + static_cast<int>(u)) : outside;
    }

    // The part of the first and last column and row that the square covers.
    const float fl = 1.0f - left + static_cast<float>(i0);
    const float fr = right - static_cast<float>(i1);
    const float ft = 1.0f - top + static_cast<float>(j0);
    const float fb = bottom - static_cast<float>(j1);

    Value sum(0.0f);
    if (i0 == i1) {
        const float wx = fl - 1.0f + fr;
        sum += cell(row) * (ft * wx);
        for (int j = j0 + 1; j < j1; ++j) sum += cell(row += cells) * wx;
        sum += cell(row + cells) * (fb * wx);
    } else if (j0 == j1) {
        const float wy = ft - 1.0f + fb;
        const int last = i1 - i0;
        sum += cell(row) * (fl * wy);
        for (int i = 1; i < last; ++i) sum += cell(row + i) * wy;
        sum += cell(row + last) * (fr * wy);
    } else {
        const int last = i1 - i0;
        const auto addRow = [&](int start, float first, float middle, float end) {
            sum += cell(start) * first;
            for (int i = 1; i < last; ++i) sum += cell(start + i) * middle;
            sum += cell(start + last) * end;
        };
        addRow(row, fl * ft, ft, fr * ft);
        for (int j = j0 + 1; j < j1; ++j) addRow(row += cells, fl, 1.0f, fr);
        addRow(row + cells, fl * fb, fb, fr * fb);
    }
    return sum / area;
}

}  // namespace Zr
