#include "floatUtil.h"

#include <string>

#include "exBase.h"

namespace Zr {

void FloatUtil::throwJoined(const char* file, int line, const char* exprText, const char* relationText,
                            const char* otherText) {
    std::string message;
    message += exprText ? exprText : "";
    message += relationText ? relationText : "";
    message += otherText ? otherText : "";
    throw ExAssertionFailed(file, line, std::move(message));
}

}  // namespace Zr
