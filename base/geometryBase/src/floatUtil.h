#pragma once
// Float comparisons with a relative tolerance, and the assertion that reports a failed float test.
// Exact comparison is wrong for values that went through arithmetic; the tolerance is the float
// epsilon scaled by the larger magnitude of the two values compared, so it adapts to their size.
#include <cmath>

namespace Zr {

class FloatUtil {
public:
    // The float epsilon: the distance from 1 to the next larger float.
    static constexpr float kEpsilon = 1.1920929e-07F;

    // True when a and b differ by at most kEpsilon times the larger of |a| and |b|. A value is
    // therefore equal to 0 only when it is exactly 0.
    template <class T>
    static bool isEqual(T a, T b) {
        return isEqual(a, b, static_cast<T>(kEpsilon));
    }

    // The same test with a caller-chosen relative tolerance.
    template <class T>
    static bool isEqual(T a, T b, T relativeTolerance) {
        const T magA = std::fabs(a);
        const T magB = std::fabs(b);
        const T larger = magA > magB ? magA : magB;
        return std::fabs(a - b) <= relativeTolerance * larger;
    }

    // a is greater than b by more than the tolerance.
    template <class T>
    static bool isGreater(T a, T b) {
        return a > b && !isEqual(a, b);
    }

    // a is less than b by more than the tolerance.
    template <class T>
    static bool isLess(T a, T b) {
        return a < b && !isEqual(a, b);
    }

    // The failure of a float test. The message is the three texts joined, for example
    // "aspectRatio.getFloat()" " is greater than " "0.F"; the values are carried along for
    // whoever reads the exception in a debugger but are not part of the message. Variant
    // distinguishes families of checks that share a value type; 0 is the plain one.
    template <class T, int Variant>
    struct ThrowAssertionFailed {
        [[noreturn]] static void throwAssertionFailed(const char* file, int line, const char* exprText,
                                                      const char* relationText, const char* otherText,
                                                      T value, T other) {
            static_cast<void>(value);
            static_cast<void>(other);
            throwJoined(file, line, exprText, relationText, otherText);
        }
    };

private:
    // Builds the message and throws ExAssertionFailed; kept out of line so that this header
    // needs no exception headers.
    [[noreturn]] static void throwJoined(const char* file, int line, const char* exprText,
                                         const char* relationText, const char* otherText);
};

}  // namespace Zr

// Asserts that value is greater than other by the tolerance test, reporting the texts of both
// expressions at the given source position.
#define ZR_ASSERT_FLOAT_GREATER_AT(value, other, file, line)                                   \
    do {                                                                                       \
        const float zrValue_ = static_cast<float>(value);                                     \
        const float zrOther_ = static_cast<float>(other);                                     \
        if (!::Zr::FloatUtil::isGreater(zrValue_, zrOther_))                                   \
            ::Zr::FloatUtil::ThrowAssertionFailed<float, 0>::throwAssertionFailed(            \
                file, line, #value, " is greater than ", #other, zrValue_, zrOther_);          \
    } while (0)
