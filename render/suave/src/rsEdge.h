#pragma once
// One edge of a triangle as the scan converter walks it down the rows: the x at the current row
// and the change of x from one row to the next.
#include <ostream>
#include <type_traits>

namespace Zr {

// T is float for whole-pixel scan conversion and double for sub-pixel scan conversion.
template <class T>
struct RsEdge {
    T _dx_dy;     // x per row
    T _currentX;  // x at the current row

    RsEdge() = default;

    // The edge from A to B positioned at integer row y. The arithmetic runs in the wider of the
    // coordinate type and T, and the result is stored as T. A horizontal edge divides by zero;
    // its values are then meaningless but never read, because it covers no row.
    template <class C>
    RsEdge(C ax, C ay, C bx, C by, int y) {
        using Wide = std::common_type_t<C, T>;
        const Wide slope = (Wide(bx) - Wide(ax)) / (Wide(by) - Wide(ay));
        _dx_dy = static_cast<T>(slope);
        _currentX = static_cast<T>(Wide(ax) + slope * (Wide(y) - Wide(ay)));
    }

    // Moves the edge down to the next row.
    void step() { _currentX += _dx_dy; }

    void dump(std::ostream& os) const { os << " _currentX: " << _currentX << " _dx_dy: " << _dx_dy; }
};

}  // namespace Zr
