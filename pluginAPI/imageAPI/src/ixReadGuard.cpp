#include "ixReadGuard.h"

namespace Zr {

IxReadGuard::IxReadGuard() : IxGuardBase(), _basePointer(nullptr) {}

IxReadGuard::IxReadGuard(const IxTile& tile) : IxReadGuard(tile.getStorage()) {}

IxReadGuard::IxReadGuard(const RCShdPtr<IxTileStorage>& storage)
    : IxGuardBase(storage), _basePointer(storage->getBasePointer()) {}

IxReadGuard::IxReadGuard(const IxWriteGuard& writer)
    : IxGuardBase(writer), _basePointer(writer._basePointer) {}

}  // namespace Zr
