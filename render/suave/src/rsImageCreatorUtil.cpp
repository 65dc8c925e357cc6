#include "rsImageCreatorUtil.h"

#include <cstdint>
#include <cstring>

#include "assertions.h"
#include "ixPixelConvert.h"
#include "rsTolerance.h"

namespace Zr {

namespace {

constexpr const char* kSourceFile = "render\\suave\\src\\rsImageCreatorUtil";

using Rgba = RsImageCreatorUtil::Rgba;

// One channel type each: its bytes in memory, its conversions, and how a value is added to a
// stored channel. Loads and stores go through memcpy, which makes no alignment assumption and
// compiles to plain moves.
struct ByteChannel {
    static constexpr int kBytes = 1;
    static float load(const unsigned char* p) { return IxPixelConvert::byteToFloat(*p); }
    static void store(unsigned char* p, float v) { *p = IxPixelConvert::floatToByte(v); }
    // The value is rounded to a byte first; the sum saturates in integers.
    static void add(unsigned char* p, float v) {
        const unsigned sum = unsigned{*p} + unsigned{IxPixelConvert::floatToByte(v)};
        *p = static_cast<unsigned char>(sum < 255u ? sum : 255u);
    }
};

struct HalfChannel {
    static constexpr int kBytes = 2;
    static std::uint16_t loadBits(const unsigned char* p) {
        std::uint16_t h;
        std::memcpy(&h, p, sizeof h);
        return h;
    }
    static void storeBits(unsigned char* p, std::uint16_t h) { std::memcpy(p, &h, sizeof h); }
    static float load(const unsigned char* p) { return IxPixelConvert::halfToFloat(loadBits(p)); }
    static void store(unsigned char* p, float v) { storeBits(p, IxPixelConvert::floatToHalf(v)); }
    // The value is rounded to a half first, so that each pass rounds on its own.
    static void add(unsigned char* p, float v) {
        const float rounded = IxPixelConvert::halfToFloat(IxPixelConvert::floatToHalf(v));
        store(p, load(p) + rounded);
    }
};

struct FloatChannel {
    static constexpr int kBytes = 4;
    static float load(const unsigned char* p) {
        float v;
        std::memcpy(&v, p, sizeof v);
        return v;
    }
    static void store(unsigned char* p, float v) { std::memcpy(p, &v, sizeof v); }
    static void add(unsigned char* p, float v) { store(p, load(p) + v); }
};

template <class Channel, int Comps>
void readRow(Rgba* rowBegin, Rgba* rowEnd, const unsigned char* pixels) {
    constexpr int c = Channel::kBytes;
    for (Rgba* out = rowBegin; out < rowEnd; ++out, pixels += Comps * c) {
        if constexpr (Comps == 1) {
            out->r = 0.0f;
            out->g = 0.0f;
            out->b = 0.0f;
            out->a = Channel::load(pixels);
        } else {
            out->r = Channel::load(pixels);
            out->g = Channel::load(pixels + c);
            out->b = Channel::load(pixels + 2 * c);
            out->a = Comps == 4 ? Channel::load(pixels + 3 * c) : 1.0f;
        }
    }
}

template <class Channel, int Comps>
void replaceRow(const Rgba* rowBegin, const Rgba* rowEnd, unsigned char* pixels) {
    constexpr int c = Channel::kBytes;
    for (const Rgba* in = rowBegin; in < rowEnd; ++in, pixels += Comps * c) {
        if constexpr (Comps == 1) {
            Channel::store(pixels, in->a);
        } else {
            Channel::store(pixels, in->r);
            Channel::store(pixels + c, in->g);
            Channel::store(pixels + 2 * c, in->b);
            if constexpr (Comps == 4) Channel::store(pixels + 3 * c, in->a);
        }
    }
}

template <class Channel, int Comps>
void addRow(const Rgba* rowBegin, const Rgba* rowEnd, unsigned char* pixels) {
    constexpr int c = Channel::kBytes;
    for (const Rgba* in = rowBegin; in < rowEnd; ++in, pixels += Comps * c) {
        // A colour without coverage adds nothing; alpha gates even where it is not stored.
        if (RsTolerance::isZero(in->a)) continue;
        if constexpr (Comps == 1) {
            Channel::add(pixels, in->a);
        } else {
            Channel::add(pixels, in->r);
            Channel::add(pixels + c, in->g);
            Channel::add(pixels + 2 * c, in->b);
            if constexpr (Comps == 4) Channel::add(pixels + 3 * c, in->a);
        }
    }
}

// The functions of one channel type by channel count; null for an unknown count.
template <class Channel>
RsImageCreatorUtil::RowReader readerOf(int comps) {
    switch (comps) {
    case 1: return &readRow<Channel, 1>;
    case 3: return &readRow<Channel, 3>;
    case 4: return &readRow<Channel, 4>;
    default: return nullptr;
    }
}

template <class Channel>
RsImageCreatorUtil::RowWriter writerOf(int comps, bool accumulate) {
    switch (comps) {
    case 1: return accumulate ? &addRow<Channel, 1> : &replaceRow<Channel, 1>;
    case 3: return accumulate ? &addRow<Channel, 3> : &replaceRow<Channel, 3>;
    case 4: return accumulate ? &addRow<Channel, 4> : &replaceRow<Channel, 4>;
    default: return nullptr;
    }
}

RsImageCreatorUtil::RowWriter selectWriter(int comps, int depth, bool accumulate) {
    RsImageCreatorUtil::RowWriter writer = nullptr;
    switch (depth) {
    case 8: writer = writerOf<ByteChannel>(comps, accumulate); break;
    case 16: writer = writerOf<HalfChannel>(comps, accumulate); break;
    case 32: writer = writerOf<FloatChannel>(comps, accumulate); break;
    default: break;
    }
    return writer;
}

}  // namespace

void RsImageCreatorUtil::selectRowReader(RowFunctions& table, int comps, int depth) {
    RowReader reader = nullptr;
    switch (depth) {
    case 8: reader = readerOf<ByteChannel>(comps); break;
    case 16: reader = readerOf<HalfChannel>(comps); break;
    case 32: reader = readerOf<FloatChannel>(comps); break;
    default: return;  // an unknown depth leaves the table as it is
    }
    if (reader == nullptr) Assertions::throwProgramAborted(kSourceFile, __LINE__, nullptr);
    table._reader = reader;
}

void RsImageCreatorUtil::selectRowWriter(RowFunctions& table, int comps, int depth, bool accumulate) {
    RowWriter writer = selectWriter(comps, depth, accumulate);
    if (writer == nullptr) Assertions::throwProgramAborted(kSourceFile, __LINE__, nullptr);
    table._writer = writer;
}

RsImageCreatorUtil::RowWriter RsImageCreatorUtil::getReplacingRowWriter(int comps, int depth) {
    RowWriter writer = selectWriter(comps, depth, false);
    if (writer == nullptr) Assertions::throwProgramAborted(kSourceFile, __LINE__, nullptr);
    return writer;
}

}  // namespace Zr
