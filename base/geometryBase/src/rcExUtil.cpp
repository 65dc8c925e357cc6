#include "rcExUtil.h"

#include <string>

#include "exBase.h"

namespace Zr {

void RCExUtil::throwExNullPtr(const char* typeName) {
    throw ExNullPtr(__FILE__, __LINE__,
                    std::string("null pointer dereferenced: ") + (typeName ? typeName : "?"));
}

void RCExUtil::throwExCastFailed(const char* fromType, const char* toType) {
    throw ExCastFailed(__FILE__, __LINE__,
                       std::string("cast failed from ") + (fromType ? fromType : "?") + " to " +
                           (toType ? toType : "?"));
}

}  // namespace Zr
