#include "inVariableBase.h"

namespace Zr {

InVariableBase::InVariableBase(const char* name) : _name(name ? name : "") {}

InVariableBase::~InVariableBase() = default;

}  // namespace Zr
