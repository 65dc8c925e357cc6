#include "ixGuardProxy.h"

#include <algorithm>

#include "assertions.h"

namespace Zr {

void IxGuardProxy::addTile(const IxTile& tile) {
    if (std::find(_tiles.begin(), _tiles.end(), &tile) != _tiles.end()) return;
    _tiles.push_back(&tile);
    // A tile registered while the others are held is taken at once, so all stay held together.
    if (_taken) _guards.emplace_back(tile);
}

void IxGuardProxy::takeGuards() {
    if (_taken) return;
    std::vector<IxReadGuard> guards;
    guards.reserve(_tiles.size());
    for (const IxTile* tile : _tiles) guards.emplace_back(*tile);
    _guards.swap(guards);
    _taken = true;
}

void IxGuardProxy::releaseGuards() {
    _guards.clear();
    _taken = false;
}

const IxReadGuard& IxGuardProxy::getGuard(int index) const {
    constexpr const char* kSourceFile = ".\\pluginAPI/imageAPI/src/ixGuardProxy.cpp";
    ZR_ASSERT_AT(index >= 0 && index < getTileCount(), kSourceFile, __LINE__);
    ZR_ASSERT_AT(_taken, kSourceFile, __LINE__);
    return _guards[static_cast<std::size_t>(index)];
}

}  // namespace Zr
