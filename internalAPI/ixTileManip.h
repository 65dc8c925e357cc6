#pragma once
// Guards for the library's own use, without the access checks of the public guards: a write
// guard may be taken on a tile known only as const (a tile the library made itself, or one a
// caller's guard already opened for writing). Classes that keep tiles as members derive from
// IxTileManip to say that they manage tiles this way; the guards themselves are usable by
// anyone in the library.
//
// Both guards are assignable values sharing one hold on the pixels, so they can be stored as
// members and replaced at will; a default one is empty.
#include "ixReadGuard.h"
#include "ixTile.h"
#include "ixWriteGuard.h"

namespace Zr {

class IxTileManip {
public:
    class ReadGuardNoCheck : public IxReadGuard {
    public:
        ReadGuardNoCheck() = default;
        explicit ReadGuardNoCheck(const IxTile& tile) : IxReadGuard(tile.getStorage()) {}
        // Shares the hold of a guard that a caller opened.
        explicit ReadGuardNoCheck(const IxReadGuard& guard) : IxReadGuard(guard) {}
        explicit ReadGuardNoCheck(const IxWriteGuard& guard) : IxReadGuard(guard) {}
        ReadGuardNoCheck(const ReadGuardNoCheck&) = default;
        ReadGuardNoCheck& operator=(const ReadGuardNoCheck&) = default;
        ReadGuardNoCheck& operator=(const IxReadGuard& guard) {
            IxReadGuard::operator=(guard);
            return *this;
        }
        ~ReadGuardNoCheck() = default;
    };

    class WriteGuardNoCheck : public IxWriteGuard {
    public:
        WriteGuardNoCheck() = default;
        explicit WriteGuardNoCheck(const IxTile& tile) : IxWriteGuard(tile.getStorage()) {}
        // Shares the hold of a guard that a caller opened.
        explicit WriteGuardNoCheck(const IxWriteGuard& guard) : IxWriteGuard(guard) {}
        WriteGuardNoCheck(const WriteGuardNoCheck&) = default;
        WriteGuardNoCheck& operator=(const WriteGuardNoCheck&) = default;
        WriteGuardNoCheck& operator=(const IxWriteGuard& guard) {
            IxWriteGuard::operator=(guard);
            return *this;
        }
        ~WriteGuardNoCheck() = default;
    };

protected:
    IxTileManip() = default;
    ~IxTileManip() = default;
};

}  // namespace Zr
