#pragma once
// Gathers the tiles that an object (a texture, say) will read during a render, so that the
// renderer can take all their guards together before the work starts and drop them together
// after it. The tiles must outlive the proxy's registration of them; once taken, the guards keep
// the pixels alive by themselves.
#include <vector>

#include "ixReadGuard.h"
#include "ixTile.h"

namespace Zr {

class IxGuardProxy {
public:
    IxGuardProxy() = default;

    // Registers a tile to be read; a tile registered twice is guarded once.
    void addTile(const IxTile& tile);
    int getTileCount() const { return static_cast<int>(_tiles.size()); }

    // Takes a read guard on every registered tile; taking again is harmless.
    void takeGuards();
    // Drops every guard; the registrations stay.
    void releaseGuards();
    bool holdsGuards() const { return _taken; }

    // The guard of the index-th registered tile. Asserts that the guards are taken and that the
    // index is in range.
    const IxReadGuard& getGuard(int index) const;

private:
    std::vector<const IxTile*> _tiles;
    std::vector<IxReadGuard> _guards;  // parallel to _tiles while taken
    bool _taken = false;
};

}  // namespace Zr
