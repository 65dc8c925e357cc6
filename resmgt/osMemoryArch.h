#pragma once
// What the library needs to know about the machine's memory: the alignment that whole-colour
// vector moves want, and aligned blocks of that alignment. A process-wide singleton.
#include <cstddef>

namespace Zr {

class OsMemoryArch {
public:
    // The alignment of blocks handed out by allocate, in bytes: a cache line, which also covers
    // the widest vector registers.
    static constexpr int DEFAULT_ALIGNMENT = 64;

    OsMemoryArch() = default;
    virtual ~OsMemoryArch();
    OsMemoryArch(const OsMemoryArch&) = delete;
    OsMemoryArch& operator=(const OsMemoryArch&) = delete;

    // The one instance; null only after the end of the library's life.
    static OsMemoryArch* getInstance();

    // The alignment for row buffers and pixel blocks, a power of two.
    virtual int getAlignment() const;

    // A block of at least bytes bytes aligned to DEFAULT_ALIGNMENT; give it back with release().
    // A request of 0 bytes still gives a distinct block. Throws ExOutOfMemory on failure.
    // Static, so that blocks can be released even while the singleton itself is gone at exit.
    static void* allocate(std::size_t bytes);
    // Gives back a block of allocate(); null does nothing.
    static void release(void* block);
};

}  // namespace Zr
