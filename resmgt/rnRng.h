#pragma once
// The common face of the random generators: a source of values uniform on [0, 1). Code that
// consumes randomness (histogram sampling, lens and time samples) takes one of these by pointer
// so that the source can be swapped, for instance for a fixed sequence in a test.

namespace Zr {

template <class T>
class RnRng {
public:
    virtual ~RnRng();

    // The next value, at least 0 and less than 1.
    virtual T eval() = 0;
    T operator()() { return eval(); }

protected:
    RnRng() = default;
    // Copies only through a concrete generator, which then repeats the original's sequence.
    RnRng(const RnRng&) = default;
    RnRng& operator=(const RnRng&) = default;
};

extern template class RnRng<float>;
extern template class RnRng<double>;

}  // namespace Zr
