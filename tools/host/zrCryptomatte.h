#pragma once
// ID mattes that compositors pick by name: per pixel, the IDs of largest coverage with their
// coverage, in the open layout of three RGBA layers per matte type.
//
//   ZrCryptomatte objects("CryptoObject", "object", outputs.getObjectNames(), &RsDeepSample::_objectId);
//   header.channelnames += objects.channelNames();   // CryptoObject00.R ... CryptoObject02.A
//   objects.describe(header);                         // the cryptomatte/<key>/... attributes
//   objects.pixel(samples, count, values);          // 12 floats per pixel from its deep samples
//
// Layer k holds ranks 2k and 2k + 1 as (id, coverage, id, coverage), ranks ordered by decreasing
// coverage; unused ranks are 0, 0. An ID is the 32-bit MurmurHash3 (x86_32, seed 0) of the
// name's bytes, stored as the float with those bits, made finite and normal first (idOf). The
// coverage of an ID is what its fragments add to the pixel's alpha when the deep samples are laid
// front to back. The manifest maps each name to the 8 hex digits of its ID's bits.
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include <OpenImageIO/imagebuf.h>

#include "rsAuxOutputs.h"

namespace Zr {

class ZrCryptomatte {
public:
    static constexpr int kLayers = 3;
    static constexpr int kRanks = 2 * kLayers;
    static constexpr int kChannels = 4 * kLayers;

    // The 32-bit hash of the bytes of text.
    static std::uint32_t hashOf(const std::string& text);
    // The float with the bits of hash, except that a hash whose exponent bits are all 0 or all 1
    // first has bit 23 flipped, so that no ID is zero, denormal, infinite or NaN.
    static float idOf(std::uint32_t hash);

    // The matte type of layer (CryptoObject, CryptoMaterial) whose deep samples carry their
    // renderer ID (from 1) in the member idOfSample; names gives the name of each renderer ID from
    // 1 on, and an empty or missing name becomes prefix and the ID (object3).
    ZrCryptomatte(std::string layer, const std::string& prefix, const std::vector<std::string>& names,
                  float RsDeepSample::*idOfSample);

    // <layer>00.R, .G, .B, .A, <layer>01.R, ... <layer>02.A.
    std::vector<std::string> channelNames() const;
    // Adds the attributes cryptomatte/<key>/name, hash, conversion and manifest, where key is
    // the first 7 hex digits of the layer name's hash.
    void describe(OIIO::ImageSpec& header) const;
    // The kChannels values of a pixel from its deep samples, nearest first.
    void pixel(const RsDeepSample* samples, std::size_t count, float* values);

private:
    struct Rank {
        float id;
        double coverage;
    };
    std::string _layer;
    float RsDeepSample::*_idOfSample;
    std::vector<std::string> _names;  // by renderer ID, entry 0 unused
    std::vector<float> _ids;          // the stored ID of each renderer ID's name
    std::vector<Rank> _ranks;         // a pixel's IDs, reused from pixel to pixel
};

}  // namespace Zr
