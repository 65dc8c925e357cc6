#pragma once
// The failures of the scene description library. Both concern the registries that map the
// run-time type of a scene object to the code that handles it.
#include <string>

#include "exBase.h"

namespace Zr {

class SdEx {
public:
    SdEx() = delete;

    // No handler is registered for a type nor for any of its ancestors.
    class ExCantResolveBuilder : public ExBase {
    public:
        ExCantResolveBuilder(const char* file, int line, std::string message);
        ~ExCantResolveBuilder() override;
    };

    // A handler was registered a second time for the same type in the same registry.
    class ExDoubleRegistration : public ExBase {
    public:
        ExDoubleRegistration(const char* file, int line, std::string message);
        ~ExDoubleRegistration() override;
    };
};

}  // namespace Zr
