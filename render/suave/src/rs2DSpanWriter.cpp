#include "rs2DSpanWriter.h"

#include <bit>

#include "assertions.h"
#include "ixPixelConvert.h"

namespace Zr {

namespace {

using Rgba = Rs2DSpanWriter::Rgba;
using AASpan = Rs2DSpanWriter::AASpan;

// One channel type: how a float is stored, and how a premultiplied source is laid over a stored
// value with the weight inv = 1 - alpha of what lies below.
template <class T>
struct ChannelOf;

template <>
struct ChannelOf<std::uint8_t> {
    static std::uint8_t store(float v) { return IxPixelConvert::floatToByte(v); }
    static std::uint8_t over(float source, float inv, std::uint8_t d) {
        const int sum = static_cast<int>(source * 255.0f + static_cast<float>(d) * inv);
        return static_cast<std::uint8_t>(sum < 0 ? 0 : sum > 255 ? 255 : sum);
    }
};

template <>
struct ChannelOf<std::uint16_t> {
    static std::uint16_t store(float v) { return IxPixelConvert::floatToHalf(v); }
    static std::uint16_t over(float source, float inv, std::uint16_t d) {
        return IxPixelConvert::floatToHalf(source + IxPixelConvert::halfToFloat(d) * inv);
    }
};

template <>
struct ChannelOf<float> {
    static float store(float v) { return v; }
    static float over(float source, float inv, float d) { return source + d * inv; }
};

// The writers of channel type T and C channels (1: alpha, 3: r, g, b, 4: r, g, b, a).
template <class T, int C, bool Blending>
struct Writer {
    using Channel = ChannelOf<T>;

    // The colour's channels in the pixel's order, straight.
    static void channels(const Rgba& colour, float alpha, float out[C]) {
        if constexpr (C == 1) {
            out[0] = alpha;
        } else {
            out[0] = colour.r;
            out[1] = colour.g;
            out[2] = colour.b;
            if constexpr (C == 4) out[3] = alpha;
        }
    }
    // The premultiplied source of the blend, alpha in its own channel.
    static void sources(const Rgba& colour, float alpha, float out[C]) {
        if constexpr (C == 1) {
            out[0] = alpha;
        } else {
            out[0] = colour.r * alpha;
            out[1] = colour.g * alpha;
            out[2] = colour.b * alpha;
            if constexpr (C == 4) out[3] = alpha;
        }
    }

    static T* pixelAt(const IxWriteGuard& guard, int x, int y) {
        return reinterpret_cast<T*>(guard._basePointer + static_cast<std::ptrdiff_t>(y) * guard._rowStride) +
               static_cast<std::ptrdiff_t>(x) * C;
    }

    // One pixel at the given alpha (the colour's, or times a coverage).
    static void writePixel(T* p, const Rgba& colour, float alpha) {
        float v[C];
        if constexpr (Blending) {
            sources(colour, alpha, v);
            const float inv = 1.0f - alpha;
            for (int c = 0; c < C; ++c) p[c] = Channel::over(v[c], inv, p[c]);
        } else {
            channels(colour, alpha, v);
            for (int c = 0; c < C; ++c) p[c] = Channel::store(v[c]);
        }
    }

    // What a whole pixel of the colour takes: the stored channels, or the blend's source and the
    // weight of what lies below. Made once per span.
    struct Solid {
        explicit Solid(const Rgba& colour) {
            float v[C];
            if constexpr (Blending) {
                sources(colour, colour.a, _source);
                _inv = 1.0f - colour.a;
            } else {
                channels(colour, colour.a, v);
                for (int c = 0; c < C; ++c) _stored[c] = Channel::store(v[c]);
            }
        }
        void write(T* p) const {
            if constexpr (Blending) {
                for (int c = 0; c < C; ++c) p[c] = Channel::over(_source[c], _inv, p[c]);
            } else {
                for (int c = 0; c < C; ++c) p[c] = _stored[c];
            }
        }
        T _stored[C];
        float _source[C];
        float _inv;
    };

    static void fill(const IxWriteGuard& guard, int y, int x1, int x2, const Rgba& colour) {
        if (x1 >= x2) return;
        const Solid solid(colour);
        T* p = pixelAt(guard, x1, y);
        T* const end = p + static_cast<std::ptrdiff_t>(x2 - x1) * C;
        for (; p < end; p += C) solid.write(p);
    }

    static void maskedPixel(T* row, const AASpan& span, int px, const Rgba& colour) {
        const float coverage =
            static_cast<float>(std::popcount(Rs2DSpanWriter::coverageMask(span, px))) * 0.03125f;
        writePixel(row + static_cast<std::ptrdiff_t>(px >> 3) * C, colour, colour.a * coverage);
    }

    // The fringes pixel by pixel with their masks; between them, on a span that has all its
    // sub-scanlines, the pixels inside every sub-scanline are written whole.
    static void fillAA(const IxWriteGuard& guard, int y, const AASpan& span, const Rgba& colour) {
        T* const row = pixelAt(guard, guard._rectangle.x0, y);
        const int maxX2 = span._maxX2;
        int px = span._minX1 & ~7;
        if (span._x1[0] == AASpan::kMissed || span._x1[AASpan::kSubScanlines - 1] == AASpan::kMissed) {
            for (; px < maxX2; px += 8) maskedPixel(row, span, px, colour);
            return;
        }
        for (; px < span._maxX1; px += 8) maskedPixel(row, span, px, colour);
        const int interiorEnd = span._minX2 & ~7;
        if (px < interiorEnd) {
            const Solid solid(colour);
            for (; px < interiorEnd; px += 8) solid.write(row + static_cast<std::ptrdiff_t>(px >> 3) * C);
        }
        for (; px < maxX2; px += 8) maskedPixel(row, span, px, colour);
    }
};

// The index of the format's channel count and depth in the tables, or -1.
int compsIndex(const IxPixelFormat& format) {
    switch (format._comps) {
        case IxPixelFormat::ALPHA: return 0;
        case IxPixelFormat::RGB: return 1;
        case IxPixelFormat::RGBA: return 2;
    }
    return -1;
}

template <class F>
F select(const IxPixelFormat& format, bool blending, const char* sourcePath, const F (&bytes)[2][3],
         const F (&halves)[2][3], const F (&floats)[2][3]) {
    const int comps = compsIndex(format);
    if (comps < 0) Assertions::throwProgramAborted(sourcePath, __LINE__, "unsupported channel count");
    const int mode = blending ? 1 : 0;
    switch (format._depth) {
        case IxPixelFormat::UINT8: return bytes[mode][comps];
        case IxPixelFormat::FLOAT16: return halves[mode][comps];
        case IxPixelFormat::FLOAT32: return floats[mode][comps];
        default: break;
    }
    Assertions::throwProgramAborted(sourcePath, __LINE__, "unsupported channel depth");
}

// The six writers of each kind for channel type T: replacing, then blending; 1, 3, 4 channels.
template <class T>
struct Table {
    static constexpr Rs2DSpanWriter::FillSpan kFill[2][3] = {
        {&Writer<T, 1, false>::fill, &Writer<T, 3, false>::fill, &Writer<T, 4, false>::fill},
        {&Writer<T, 1, true>::fill, &Writer<T, 3, true>::fill, &Writer<T, 4, true>::fill}};
    static constexpr Rs2DSpanWriter::FillAASpan kFillAA[2][3] = {
        {&Writer<T, 1, false>::fillAA, &Writer<T, 3, false>::fillAA, &Writer<T, 4, false>::fillAA},
        {&Writer<T, 1, true>::fillAA, &Writer<T, 3, true>::fillAA, &Writer<T, 4, true>::fillAA}};
};

}  // namespace

Rs2DSpanWriter::FillSpan Rs2DSpanWriter::selectFillSpan(const IxPixelFormat& format, bool blending,
                                                        const char* sourcePath) {
    return select(format, blending, sourcePath, Table<std::uint8_t>::kFill, Table<std::uint16_t>::kFill,
                  Table<float>::kFill);
}

Rs2DSpanWriter::FillAASpan Rs2DSpanWriter::selectFillAASpan(const IxPixelFormat& format, bool blending,
                                                            const char* sourcePath) {
    return select(format, blending, sourcePath, Table<std::uint8_t>::kFillAA, Table<std::uint16_t>::kFillAA,
                  Table<float>::kFillAA);
}

}  // namespace Zr
