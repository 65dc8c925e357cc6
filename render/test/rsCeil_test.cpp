// The branch-free ceiling against the library's own, where ceilings go wrong: integers and their
// neighbours one unit in the last place away, zeros, tiny, large and negative values.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <random>
#include <vector>

#include "rsCeil.h"

namespace Zr {
namespace {

template <class T>
class RsCeil : public ::testing::Test {};
using Floats = ::testing::Types<float, double>;
TYPED_TEST_SUITE(RsCeil, Floats);

TYPED_TEST(RsCeil, AgreesWithCeilEverywhere) {
    using T = TypeParam;
    using L = std::numeric_limits<T>;
    std::vector<T> values = {T(0),   -T(0),   L::denorm_min(), -L::denorm_min(), L::min(),
                             T(0.5), T(-0.5), T(1e-30),        T(-1e-30)};
    for (int i = -2000; i <= 2000; ++i)
        values.insert(values.end(), {T(i), std::nextafter(T(i), T(1e9)), std::nextafter(T(i), T(-1e9)), T(i) + T(0.5)});
    // Up to the magnitude where the unit in the last place reaches 1 (2^24 in float), and to the
    // range of int in double.
    std::vector<T> bigs = {T(8388607), T(8388608), T(16777215), T(16777216), T(-16777216)};
    if constexpr (sizeof(T) == 8) bigs.insert(bigs.end(), {T(1e9) + T(0.25), T(-1e9), T(2147483646.5)});
    for (const T big : bigs) values.insert(values.end(), {big, std::nextafter(big, T(0))});
    std::mt19937 rng(5);
    std::uniform_real_distribution<T> any(T(-1e5), T(1e5));
    for (int i = 0; i < 100000; ++i) values.push_back(any(rng));
    for (const T v : values) ASSERT_EQ(rsCeil(v), static_cast<int>(std::ceil(v))) << v;
}

}  // namespace
}  // namespace Zr
