#include "ixGuardBase.h"

namespace Zr {

IxGuardBase::IxGuardBase()
    : _pixelFormat(), _rectangle{0, 0, 0, 0}, _tileHandle(nullptr), _rowStride(0) {}

IxGuardBase::IxGuardBase(const RCShdPtr<IxTileStorage>& storage)
    : _pixelFormat(storage->getPixelFormat()),
      _rectangle(storage->getRectangle()),
      _tileHandle(storage.get()),
      _rowStride(storage->getRowStride()),
      _lock(makeShared<IxTileLock>(storage)) {}

void IxGuardBase::dump(std::ostream& os) const {
    os << " _pixelFormat:";
    _pixelFormat.dump(os);
    os << " _rectangle:";
    _rectangle.dump(os);
    os << " _tileHandle: " << static_cast<const void*>(_tileHandle) << " _rowStride: " << _rowStride;
}

}  // namespace Zr
