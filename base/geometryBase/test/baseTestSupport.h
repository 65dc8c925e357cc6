#pragma once
// Seeded random values and well-conditioned transforms, the largest elementwise difference of two
// matrices, and objects that count their own lives.
#include <algorithm>
#include <cmath>
#include <random>

#include "geAffineMatrix3.h"
#include "gePoint3.h"
#include "rcBase.h"

namespace Zr::BaseTest {

class Random {
public:
    explicit Random(unsigned seed) : _engine(seed) {}
    double uniform(double lo, double hi) { return std::uniform_real_distribution<double>(lo, hi)(_engine); }
    int uniformInt(int lo, int hi) { return std::uniform_int_distribution<int>(lo, hi)(_engine); }
    template <class T>
    GeVector3<T> vector(double lo, double hi) {
        return {T(uniform(lo, hi)), T(uniform(lo, hi)), T(uniform(lo, hi))};
    }
    template <class T>
    GePoint3<T> point(double lo, double hi) {
        return GePoint3<T>(vector<T>(lo, hi));
    }
    // A vector away from 0, so that it has a direction.
    template <class T>
    GeVector3<T> direction() {
        GeVector3<T> v;
        do v = vector<T>(-1, 1);
        while (v.length() < T(0.2));
        return v;
    }
    // Rotation, scales within [0.5, 2] along rotated axes, translation: inverses stay accurate.
    template <class T>
    GeAffineMatrix3<T> wellConditionedAffine() {
        const auto r1 = GeAffineMatrix3<T>::makeRotation(direction<T>(), T(uniform(-3.1, 3.1)));
        const auto r2 = GeAffineMatrix3<T>::makeRotation(direction<T>(), T(uniform(-3.1, 3.1)));
        const auto s = GeAffineMatrix3<T>::makeScale(T(uniform(0.5, 2)), T(uniform(0.5, 2)), T(uniform(0.5, 2)));
        return GeAffineMatrix3<T>::makeTranslation(vector<T>(-10, 10)) * r2 * s * r1;
    }

private:
    std::mt19937 _engine;
};

// Largest elementwise difference of two matrices of rows by cols elements.
template <class M>
double maxDifference(const M& a, const M& b, int rows, int cols) {
    double worst = 0.0;
    for (int r = 0; r < rows; ++r)
        for (int c = 0; c < cols; ++c) worst = std::max(worst, std::fabs(double(a(r, c)) - double(b(r, c))));
    return worst;
}

struct LifeCounts {
    int made = 0;
    int deleted = 0;
    int alive() const { return made - deleted; }
};

// A shared object of the intrusive family, and a class derived from it.
class CountedShared : public RCObject {
public:
    explicit CountedShared(LifeCounts& counts, int id = 0) : _counts(counts), _id(id) { ++_counts.made; }
    ~CountedShared() override { ++_counts.deleted; }
    int getId() const { return _id; }

private:
    LifeCounts& _counts;
    int _id;
};
class DerivedShared : public CountedShared {
public:
    using CountedShared::CountedShared;
};

// For the non-intrusive pointers: a base without a virtual destructor, so that deleting a
// CountedPlain as a PlainBase would skip the counting destructor.
class PlainBase {
public:
    explicit PlainBase(int id = 0) : _id(id) {}
    int getId() const { return _id; }

private:
    int _id;
};
class CountedPlain : public PlainBase {
public:
    CountedPlain(LifeCounts& counts, int id = 0) : PlainBase(id), _counts(counts) { ++_counts.made; }
    ~CountedPlain() { ++_counts.deleted; }

private:
    LifeCounts& _counts;
};

}  // namespace Zr::BaseTest
