#include "ixRowCodec.h"

#include <cstdint>
#include <cstring>

#include "assertions.h"
#include "ixPixelConvert.h"

namespace Zr {

namespace {

constexpr const char* kSourceFile = ".\\pluginAPI/imageAPI/src/ixRowCodec.cpp";

using Rgba = IxRowCodec::Rgba;

// One channel type each: its size in memory, its conversions, and how a value is added to a
// stored channel. Loads and stores go through memcpy, which compiles to plain moves and keeps the
// code free of alignment assumptions.
struct ByteChannel {
    static constexpr int SIZE = 1;
    static float load(const unsigned char* p) { return IxPixelConvert::byteToFloat(*p); }
    static void store(unsigned char* p, float v) { *p = IxPixelConvert::floatToByte(v); }
    // The value is rounded to a byte first; the sum saturates in integers.
    static void add(unsigned char* p, float v) {
        const unsigned sum = unsigned{*p} + unsigned{IxPixelConvert::floatToByte(v)};
        *p = static_cast<unsigned char>(sum < 255u ? sum : 255u);
    }
};

struct HalfChannel {
    static constexpr int SIZE = 2;
    static float load(const unsigned char* p) {
        std::uint16_t h;
        std::memcpy(&h, p, sizeof h);
        return IxPixelConvert::halfToFloat(h);
    }
    static void store(unsigned char* p, float v) {
        const std::uint16_t h = IxPixelConvert::floatToHalf(v);
        std::memcpy(p, &h, sizeof h);
    }
    // The value is rounded to a half first, so that each pass rounds on its own.
    static void add(unsigned char* p, float v) {
        store(p, load(p) + IxPixelConvert::halfToFloat(IxPixelConvert::floatToHalf(v)));
    }
};

struct FloatChannel {
    static constexpr int SIZE = 4;
    static float load(const unsigned char* p) {
        float v;
        std::memcpy(&v, p, sizeof v);
        return v;
    }
    static void store(unsigned char* p, float v) { std::memcpy(p, &v, sizeof v); }
    static void add(unsigned char* p, float v) { store(p, load(p) + v); }
};

// A pair of floats, real part first.
struct ComplexChannel {
    static constexpr int SIZE = 8;
    static float load(const unsigned char* p) { return FloatChannel::load(p); }
    static void store(unsigned char* p, float v) {
        FloatChannel::store(p, v);
        FloatChannel::store(p + 4, 0.0f);
    }
    static void add(unsigned char* p, float v) { FloatChannel::add(p, v); }
};

template <class Channel, int COMPS>
struct ReadRow {
    static void run(const unsigned char* src, Rgba* dst, int count) {
        constexpr int C = Channel::SIZE;
        for (int i = 0; i < count; ++i, src += COMPS * C) {
            Rgba& out = dst[i];
            if constexpr (COMPS == 1) {
                out.r = out.g = out.b = 0.0f;
                out.a = Channel::load(src);
            } else {
                out.r = Channel::load(src);
                out.g = Channel::load(src + C);
                out.b = Channel::load(src + 2 * C);
                out.a = COMPS == 4 ? Channel::load(src + 3 * C) : 1.0f;
            }
        }
    }
};

// Stores (ADD false) or adds (ADD true) the channels that the format has.
template <class Channel, int COMPS, bool ADD>
struct WriteRow {
    static void put(unsigned char* p, float v) {
        if constexpr (ADD)
            Channel::add(p, v);
        else
            Channel::store(p, v);
    }
    static void run(unsigned char* dst, const Rgba* src, int count) {
        constexpr int C = Channel::SIZE;
        for (int i = 0; i < count; ++i, dst += COMPS * C) {
            const Rgba& in = src[i];
            // A colour without coverage adds nothing; alpha gates even where it is not stored.
            if constexpr (ADD) {
                if (in.a == 0.0f) continue;
            }
            if constexpr (COMPS == 1) {
                put(dst, in.a);
            } else {
                put(dst, in.r);
                put(dst + C, in.g);
                put(dst + 2 * C, in.b);
                if constexpr (COMPS == 4) put(dst + 3 * C, in.a);
            }
        }
    }
};

template <class Channel, int COMPS>
using StoreRow = WriteRow<Channel, COMPS, false>;
template <class Channel, int COMPS>
using AddRow = WriteRow<Channel, COMPS, true>;

// Row<Channel, comps>::run; null for an unknown channel count.
template <template <class, int> class Row, class Channel>
auto rowFunctionOf(int comps) -> decltype(&Row<Channel, 1>::run) {
    switch (comps) {
    case IxPixelFormat::ALPHA: return &Row<Channel, 1>::run;
    case IxPixelFormat::RGB: return &Row<Channel, 3>::run;
    case IxPixelFormat::RGBA: return &Row<Channel, 4>::run;
    }
    return nullptr;
}

// Row<Channel, comps>::run for the format's channel type and count.
template <template <class, int> class Row>
auto rowFunctionOf(const IxPixelFormat& format) -> decltype(&Row<ByteChannel, 1>::run) {
    decltype(&Row<ByteChannel, 1>::run) function = nullptr;
    switch (format._depth) {
    case IxPixelFormat::UINT8: function = rowFunctionOf<Row, ByteChannel>(format._comps); break;
    case IxPixelFormat::FLOAT16: function = rowFunctionOf<Row, HalfChannel>(format._comps); break;
    case IxPixelFormat::FLOAT32: function = rowFunctionOf<Row, FloatChannel>(format._comps); break;
    case IxPixelFormat::COMPLEX: function = rowFunctionOf<Row, ComplexChannel>(format._comps); break;
    }
    if (function == nullptr) Assertions::throwProgramAborted(kSourceFile, __LINE__, "unknown pixel format");
    return function;
}

}  // namespace

IxRowCodec::Reader IxRowCodec::selectReader(const IxPixelFormat& format) { return rowFunctionOf<ReadRow>(format); }

IxRowCodec::Writer IxRowCodec::selectWriter(const IxPixelFormat& format) { return rowFunctionOf<StoreRow>(format); }

IxRowCodec::Writer IxRowCodec::selectAddingWriter(const IxPixelFormat& format) {
    return rowFunctionOf<AddRow>(format);
}

}  // namespace Zr
