#pragma once
// One shaded fragment of one pixel of the A-buffer: the colour of a triangle at the pixel's centre,
// the samples of the pixel that it owns, and the plane of its depth across the pixel.
//
// A pixel has 16 samples on a 16 x 16 grid of sub-cells: sample i lies on sub-scanline i, at
// sub-column kSamplePattern[i], so that no two samples share a row or a column. Bit i of a coverage
// mask stands for sample i. The samples are the centres of their sub-cells, at
// ((kSamplePattern[i] + 0.5) / 16, (i + 0.5) / 16) from the pixel's corner.
//
// Lists run from far to near, head farthest. The record begins with its colour, so that the
// fragment itself can be handed to a transfer function as its source; fragments live in an
// RsFragmentPool until the buffer that made them dies.
#include <cstdint>
#include <ostream>

#include "coRgbaColorTyped.h"
#include "rsTransferFunc.h"

namespace Zr {

struct RsAFragment {
    static constexpr int kSamples = 16;
    static constexpr std::uint16_t kFullCoverage = 0xffff;
    // The sub-column of the sample on each sub-scanline.
    static constexpr int kSamplePattern[kSamples] = {13, 8, 1, 4, 9, 12, 5, 0, 15, 10, 3, 6, 11, 14, 7, 2};

    // The colour that the material's shade returned at the pixel's centre: r, g, b, alpha.
    CoRgbaColorTyped<float> _color;
    // Pixel depth at the pixel's centre; smaller is nearer.
    double _z;
    // The far and near ends of the depth over the pixel: the centre's depth plus and minus half
    // the change of the plane across the pixel's diagonal.
    double _zMax;
    double _zMin;
    // The plane's change per pixel to the right and downward.
    double _dz_dx;
    double _dz_dy;
    // The samples that this fragment owns; never empty in a list.
    std::uint16_t _coverage;
    // How this fragment is laid over what lies behind it.
    RsTransferFunc::Function _transfer;
    // The next fragment of the pixel, nearer to the eye; null at the end.
    RsAFragment* _next;

    // The depth of the plane at sample i: the centre's depth moved by the sample's offset from the
    // centre, (kSamplePattern[i] / 16 - 15 / 32, i / 16 - 15 / 32).
    double depthAt(int i) const {
        return _z + (-_dz_dx - _dz_dy) * 0.46875 + _dz_dx * 0.0625 * kSamplePattern[i] + _dz_dy * 0.0625 * i;
    }

    void dump(std::ostream& os) const {
        os << " _color: ";
        _color.dump(os);
        os << " _z: " << _z << " _zMax: " << _zMax << " _zMin: " << _zMin << " _dz_dx: " << _dz_dx
           << " _dz_dy: " << _dz_dy << " _coverage: " << _coverage << " _next: " << static_cast<const void*>(_next);
    }
};

}  // namespace Zr
