#include "ixRowCodec.h"

#include <cstdint>
#include <cstring>

#include "assertions.h"
#include "ixPixelConvert.h"

namespace Zr {

namespace {


// One channel type each: its size in memory and its conversions. Loads and stores go through
// memcpy, which compiles to plain moves and keeps the code free of alignment assumptions.
struct ByteChannel {
    static constexpr int SIZE = 1;
    static float load(const unsigned char* p) { return IxPixelConvert::byteToFloat(*p); }
    static void store(unsigned char* p, float v) { *p = IxPixelConvert::floatToByte(v); }
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
};

struct FloatChannel {
    static constexpr int SIZE = 4;
    static float load(const unsigned char* p) {
        float v;
        std::memcpy(&v, p, sizeof v);
        return v;
    }
    static void store(unsigned char* p, float v) { std::memcpy(p, &v, sizeof v); }
};

// A pair of floats, real part first.
struct ComplexChannel {
    static constexpr int SIZE = 8;
    static float load(const unsigned char* p) { return FloatChannel::load(p); }
    static void store(unsigned char* p, float v) {
        FloatChannel::store(p, v);
        FloatChannel::store(p + 4, 0.0f);
    }
};

template <class Channel, int COMPS>
void readRow(const unsigned char* src, Rgba* dst, int count) {
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

template <class Channel, int COMPS>
void writeRow(unsigned char* dst, const Rgba* src, int count) {
    constexpr int C = Channel::SIZE;
    for (int i = 0; i < count; ++i, dst += COMPS * C) {
        const Rgba& in = src[i];
        if constexpr (COMPS == 1) {
            Channel::store(dst, in.a);
        } else {
            Channel::store(dst, in.r);
            Channel::store(dst + C, in.g);
            Channel::store(dst + 2 * C, in.b);
            if constexpr (COMPS == 4) Channel::store(dst + 3 * C, in.a);
        }
    }
}

// The table entry for one channel type, by channel count; null for an unknown count.
template <class Channel>
IxRowCodec::Reader readerFor(int comps) {
    switch (comps) {
    case IxPixelFormat::ALPHA: return &readRow<Channel, 1>;
    case IxPixelFormat::RGB: return &readRow<Channel, 3>;
    case IxPixelFormat::RGBA: return &readRow<Channel, 4>;
    }
    return nullptr;
}

template <class Channel>
IxRowCodec::Writer writerFor(int comps) {
    switch (comps) {
    case IxPixelFormat::ALPHA: return &writeRow<Channel, 1>;
    case IxPixelFormat::RGB: return &writeRow<Channel, 3>;
    case IxPixelFormat::RGBA: return &writeRow<Channel, 4>;
    }
    return nullptr;
}

constexpr const char* sourceFile = ".\\pluginAPI/imageAPI/src/ixRowCodec.cpp";

}  // namespace

IxRowCodec::Reader IxRowCodec::selectReader(const IxPixelFormat& format) {
    Reader reader = nullptr;
    switch (format._depth) {
    case IxPixelFormat::UINT8: reader = readerFor<ByteChannel>(format._comps); break;
    case IxPixelFormat::FLOAT16: reader = readerFor<HalfChannel>(format._comps); break;
    case IxPixelFormat::FLOAT32: reader = readerFor<FloatChannel>(format._comps); break;
    case IxPixelFormat::COMPLEX: reader = readerFor<ComplexChannel>(format._comps); break;
    }
    if (reader == nullptr) Assertions::throwProgramAborted(sourceFile, __LINE__, "unknown pixel format");
    return reader;
}

IxRowCodec::Writer IxRowCodec::selectWriter(const IxPixelFormat& format) {
    Writer writer = nullptr;
    switch (format._depth) {
    case IxPixelFormat::UINT8: writer = writerFor<ByteChannel>(format._comps); break;
    case IxPixelFormat::FLOAT16: writer = writerFor<HalfChannel>(format._comps); break;
    case IxPixelFormat::FLOAT32: writer = writerFor<FloatChannel>(format._comps); break;
    case IxPixelFormat::COMPLEX: writer = writerFor<ComplexChannel>(format._comps); break;
    }
    if (writer == nullptr) Assertions::throwProgramAborted(sourceFile, __LINE__, "unknown pixel format");
    return writer;
}

}  // namespace Zr
