#pragma once
// One hold on a tile's pixels: keeps them alive and locked in memory while it lives. Guards share
// one hold through a reference-counted pointer, so copies of a guard are cheap and the pixels are
// released when the last copy goes.
#include "ixTileStorage.h"
#include "rcShdPtr.h"

namespace Zr {

class IxTileLock : public RCObject {
public:
    explicit IxTileLock(const RCShdPtr<IxTileStorage>& storage) : _storage(storage) {
        _storage->lockMemory();
    }
    ~IxTileLock() override { _storage->unlockMemory(); }
    IxTileLock(const IxTileLock&) = delete;
    IxTileLock& operator=(const IxTileLock&) = delete;

    const RCShdPtr<IxTileStorage>& getStorage() const { return _storage; }

private:
    RCShdPtr<IxTileStorage> _storage;
};

}  // namespace Zr
