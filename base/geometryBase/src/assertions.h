#pragma once
// Where broken preconditions and unreachable code end up. Both functions throw; neither returns.

namespace Zr {

class Assertions {
public:
    // Throws ExAssertionFailed carrying the source path, the line and the condition's text.
    [[noreturn]] static void throwAssertionFailed(const char* file, int line, const char* text);
    // Throws ExProgramAborted; text may be null.
    [[noreturn]] static void throwProgramAborted(const char* file, int line, const char* text);
};

}  // namespace Zr

// Checks a condition and reports it with the given source path and line. The text reported is
// the condition exactly as written.
#define ZR_ASSERT_AT(cond, file, line)                                      \
    do {                                                                    \
        if (!(cond)) ::Zr::Assertions::throwAssertionFailed(file, line, #cond); \
    } while (0)
