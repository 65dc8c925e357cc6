#include "exBase.h"

#include <utility>

namespace Zr {

ExBase::ExBase(const char* file, int line, std::string message)
    : _file(file ? file : ""), _line(line), _message(std::move(message)) {
    _what = _file + "(" + std::to_string(_line) + "): " + _message;
}

ExBase::~ExBase() = default;

}  // namespace Zr
