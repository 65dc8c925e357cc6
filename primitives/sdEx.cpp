#include "sdEx.h"

#include <utility>

namespace Zr {

// Defined here so that the exception types have one home for their type information, and a host
// catching them across library boundaries sees one type.
SdEx::ExCantResolveBuilder::ExCantResolveBuilder(const char* file, int line, std::string message)
    : ExBase(file, line, std::move(message)) {}
SdEx::ExCantResolveBuilder::~ExCantResolveBuilder() = default;

SdEx::ExDoubleRegistration::ExDoubleRegistration(const char* file, int line, std::string message)
    : ExBase(file, line, std::move(message)) {}
SdEx::ExDoubleRegistration::~ExDoubleRegistration() = default;

}  // namespace Zr
