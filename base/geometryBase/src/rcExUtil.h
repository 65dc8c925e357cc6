#pragma once
// Failure reporting of the smart pointers.

namespace Zr {

class RCExUtil {
public:
    // Throws ExNullPtr naming the type an empty pointer pointed to.
    [[noreturn]] static void throwExNullPtr(const char* typeName);
    // Throws ExCastFailed naming both types.
    [[noreturn]] static void throwExCastFailed(const char* fromType, const char* toType);
};

}  // namespace Zr
