#pragma once
// The host's own failures: one line for the user, naming the file or option and the reason.
#include <stdexcept>
#include <string>

namespace Zr {

class ZrHostError : public std::runtime_error {
public:
    explicit ZrHostError(const std::string& message) : std::runtime_error(message) {}
};

}  // namespace Zr
