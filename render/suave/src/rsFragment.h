#pragma once
// One shaded sample of one pixel of the fragment Z-buffer, kept in a singly linked list per pixel
// from far to near: the head is the farthest fragment, the tail the nearest.
//
// The record begins with its colour, so that the fragment itself can be handed to a transfer
// function as its source. Fragments are never freed one by one: they live in an RsFragmentPool
// until the buffer that made them dies.
#include <ostream>

#include "coRgbaColorTyped.h"
#include "rsTransferFunc.h"

namespace Zr {

struct RsFragment {
    // The colour that the material's shade returned: r, g, b, then the alpha that the opaque
    // test reads. Straight, except for the modes whose transfer function expects otherwise.
    CoRgbaColorTyped<float> _color;
    // Pixel depth; smaller is nearer.
    double _depth;
    // How this fragment is laid over what lies behind it; each fragment carries its material's.
    RsTransferFunc::Function _transfer;
    // The next fragment of the pixel, nearer to the eye; null at the end.
    RsFragment* _next;

    void dump(std::ostream& os) const {
        os << " _color: ";
        _color.dump(os);
        os << " _depth: " << _depth << " _next: " << static_cast<const void*>(_next);
    }
};

static_assert(sizeof(RsFragment) == 4 * sizeof(float) + sizeof(double) + 2 * sizeof(void*),
              "fragments are packed: colour, depth, transfer, next");

}  // namespace Zr
