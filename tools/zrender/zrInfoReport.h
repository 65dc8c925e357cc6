#pragma once
// Prints what libZRrender announced when it loaded: its packages with their dependencies, and the
// build records kept in the process.
#include <ostream>

namespace Zr {

class ZrInfoReport {
public:
    static void print(std::ostream& os);
};

}  // namespace Zr
