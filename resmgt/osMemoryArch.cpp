#include "osMemoryArch.h"

#include <new>
#include <string>

#include "exOutOfMemory.h"
#include "lkSingleton.h"

namespace Zr {

namespace {
constexpr const char* kSourceFile = ".\\resmgt/osMemoryArch.cpp";
}

OsMemoryArch::~OsMemoryArch() = default;

OsMemoryArch* OsMemoryArch::getInstance() { return LkSingleton<OsMemoryArch>::getInstance(); }

int OsMemoryArch::getAlignment() const { return DEFAULT_ALIGNMENT; }

void* OsMemoryArch::allocate(std::size_t bytes) {
    void* block = ::operator new(bytes == 0 ? 1 : bytes,
                                 std::align_val_t(static_cast<std::size_t>(DEFAULT_ALIGNMENT)),
                                 std::nothrow);
    if (block == nullptr) {
        throw ExOutOfMemory(kSourceFile, __LINE__, "cannot allocate " + std::to_string(bytes) + " bytes");
    }
    return block;
}

void OsMemoryArch::release(void* block) {
    if (block == nullptr) return;
    ::operator delete(block, std::align_val_t(static_cast<std::size_t>(DEFAULT_ALIGNMENT)));
}

}  // namespace Zr
