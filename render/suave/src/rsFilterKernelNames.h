#pragma once
// Readable names of the ten filter kernels, for hosts that let a user choose one by name: one
// lower-case word or hyphenated pair per kernel type, and the lookups both ways.
#include <optional>
#include <string_view>

#include "rsFilterKernel.h"

namespace Zr {

class RsFilterKernelNames {
public:
    // The name of each kernel type, indexed by its value: "box", "cone", "bell", ...
    static const char* const names[RsFilterKernel::nbKernelTypes];

    // The name of a type; null for a type outside the ten.
    static const char* nameOf(RsFilterKernel::KernelType type);
    // The type of a name, exactly as spelt in the table; none for any other text.
    static std::optional<RsFilterKernel::KernelType> typeOf(std::string_view name);

    RsFilterKernelNames() = delete;
};

}  // namespace Zr
