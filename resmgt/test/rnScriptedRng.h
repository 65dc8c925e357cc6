#pragma once
// A generator that replays a fixed list of values, cycling, so that tests can steer the code
// that consumes randomness onto exact values such as 0 and the largest value below 1.
#include <cstddef>
#include <utility>
#include <vector>

#include "rnRng.h"

namespace Zr::RnTest {

template <class T>
class ScriptedRng : public RnRng<T> {
public:
    explicit ScriptedRng(std::vector<T> values) : _values(std::move(values)) {}
    T eval() override {
        const T v = _values[_next];
        _next = (_next + 1) % _values.size();
        ++_nbDrawn;
        return v;
    }
    std::size_t getNbDrawn() const { return _nbDrawn; }

private:
    std::vector<T> _values;
    std::size_t _next = 0;
    std::size_t _nbDrawn = 0;
};

}  // namespace Zr::RnTest
