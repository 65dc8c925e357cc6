#pragma once
// Seeded random values and well-conditioned transforms shared by the geometry tests.
#include <random>

#include "geAffineMatrix3.h"
#include "gePoint3.h"
#include "geVector3.h"

namespace Zr::GeTest {

class Random {
public:
    explicit Random(unsigned seed) : _engine(seed) {}

    double uniform(double lo, double hi) { return std::uniform_real_distribution<double>(lo, hi)(_engine); }
    int uniformInt(int lo, int hi) { return std::uniform_int_distribution<int>(lo, hi)(_engine); }

    template <class T>
    GeVector3<T> vector(double lo, double hi) {
        return {static_cast<T>(uniform(lo, hi)), static_cast<T>(uniform(lo, hi)), static_cast<T>(uniform(lo, hi))};
    }
    template <class T>
    GePoint3<T> point(double lo, double hi) {
        return GePoint3<T>(vector<T>(lo, hi));
    }
    // A vector away from 0, so that it has a direction.
    template <class T>
    GeVector3<T> direction() {
        GeVector3<T> v;
        do {
            v = vector<T>(-1, 1);
        } while (v.length() < T(0.2));
        return v;
    }
    // Rotation, then scales between 0.5 and 2 along rotated axes, then translation: singular
    // values stay within [0.5, 2], so inverses are accurate.
    template <class T>
    GeAffineMatrix3<T> wellConditionedAffine() {
        const auto r1 = GeAffineMatrix3<T>::makeRotation(direction<T>(), static_cast<T>(uniform(-3.1, 3.1)));
        const auto r2 = GeAffineMatrix3<T>::makeRotation(direction<T>(), static_cast<T>(uniform(-3.1, 3.1)));
        const auto s = GeAffineMatrix3<T>::makeScale(static_cast<T>(uniform(0.5, 2)), static_cast<T>(uniform(0.5, 2)),
                                                     static_cast<T>(uniform(0.5, 2)));
        const auto t = GeAffineMatrix3<T>::makeTranslation(vector<T>(-10, 10));
        return t * r2 * s * r1;
    }

private:
    std::mt19937 _engine;
};

}  // namespace Zr::GeTest
