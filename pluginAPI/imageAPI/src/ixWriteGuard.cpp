#include "ixWriteGuard.h"

namespace Zr {

IxWriteGuard::IxWriteGuard() : IxGuardBase(), _basePointer(nullptr) {}

IxWriteGuard::IxWriteGuard(IxTile& tile) : IxWriteGuard(tile.getStorage()) {}

IxWriteGuard::IxWriteGuard(const RCShdPtr<IxTileStorage>& storage)
    : IxGuardBase(storage), _basePointer(storage->getBasePointer()) {}

}  // namespace Zr
