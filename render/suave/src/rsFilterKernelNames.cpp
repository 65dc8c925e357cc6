#include "rsFilterKernelNames.h"

namespace Zr {

const char* const RsFilterKernelNames::names[RsFilterKernel::nbKernelTypes] = {
    "box",      "cone",      "bell",          "quadratic-bspline",  "gaussian",
    "pow2-narrow", "pow2-wide", "cubic-bspline", "truncated-gaussian", "parabolic-pair"};

const char* RsFilterKernelNames::nameOf(RsFilterKernel::KernelType type) {
    if (type < 0 || type >= RsFilterKernel::nbKernelTypes) return nullptr;
    return names[type];
}

std::optional<RsFilterKernel::KernelType> RsFilterKernelNames::typeOf(std::string_view name) {
    for (int t = 0; t < RsFilterKernel::nbKernelTypes; ++t)
        if (name == names[t]) return static_cast<RsFilterKernel::KernelType>(t);
    return std::nullopt;
}

}  // namespace Zr
