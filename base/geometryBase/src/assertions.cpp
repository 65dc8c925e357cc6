#include "assertions.h"

#include "exBase.h"

namespace Zr {

void Assertions::throwAssertionFailed(const char* file, int line, const char* text) {
    throw ExAssertionFailed(file, line, text ? text : "");
}

void Assertions::throwProgramAborted(const char* file, int line, const char* text) {
    throw ExProgramAborted(file, line, text ? text : "program aborted");
}

}  // namespace Zr
