#include "zrCryptomatte.h"

#include <murmurhash.h>

#include <algorithm>
#include <bit>
#include <cstdio>
#include <map>
#include <utility>

namespace Zr {

namespace {

std::string hex8(std::uint32_t bits) {
    char text[9];
    std::snprintf(text, sizeof text, "%08x", static_cast<unsigned int>(bits));
    return text;
}

// text as a JSON string, quotes included; the bytes of UTF-8 pass as they are.
std::string jsonString(const std::string& text) {
    std::string out = "\"";
    for (const char c : text) {
        if (c == '"' || c == '\\') {
            out += '\\';
            out += c;
        } else if (static_cast<unsigned char>(c) < 0x20) {
            char escaped[7];
            std::snprintf(escaped, sizeof escaped, "\\u%04x", static_cast<unsigned int>(c));
            out += escaped;
        } else {
            out += c;
        }
    }
    return out + '"';
}

}  // namespace

std::uint32_t ZrCryptomatte::hashOf(const std::string& text) {
    std::uint32_t hash = 0;
    lmmh_x86_32(text.data(), static_cast<unsigned int>(text.size()), 0, &hash);
    return hash;
}

float ZrCryptomatte::idOf(std::uint32_t hash) {
    const std::uint32_t exponent = (hash >> 23) & 0xffu;
    if (exponent == 0 || exponent == 0xffu) hash ^= 1u << 23;
    return std::bit_cast<float>(hash);
}

ZrCryptomatte::ZrCryptomatte(std::string layer, const std::string& prefix, const std::vector<std::string>& names,
                             float RsDeepSample::*idOfSample)
    : _layer(std::move(layer)), _idOfSample(idOfSample), _names(names.size() + 1), _ids(names.size() + 1, 0.0f) {
    for (std::size_t id = 1; id < _names.size(); ++id) {
        _names[id] = names[id - 1].empty() ? prefix + std::to_string(id) : names[id - 1];
        _ids[id] = idOf(hashOf(_names[id]));
    }
}

std::vector<std::string> ZrCryptomatte::channelNames() const {
    std::vector<std::string> names;
    for (int layer = 0; layer < kLayers; ++layer)
        for (const char* channel : {".R", ".G", ".B", ".A"})
            names.push_back(_layer + "0" + std::to_string(layer) + channel);
    return names;
}

void ZrCryptomatte::describe(OIIO::ImageSpec& header) const {
    // Names in order, each once, whatever the IDs that share it.
    std::map<std::string, float> entries;
    for (std::size_t id = 1; id < _names.size(); ++id) entries.emplace(_names[id], _ids[id]);
    std::string manifest = "{";
    for (const auto& [name, id] : entries) {
        if (manifest.size() > 1) manifest += ',';
        manifest += jsonString(name) + ":\"" + hex8(std::bit_cast<std::uint32_t>(id)) + '"';
    }
    manifest += '}';
    const std::string prefix = "cryptomatte/" + hex8(hashOf(_layer)).substr(0, 7) + "/";
    header.attribute(prefix + "name", _layer);
    header.attribute(prefix + "hash", "MurmurHash3_32");
    header.attribute(prefix + "conversion", "uint32_to_float32");
    header.attribute(prefix + "manifest", manifest);
}

void ZrCryptomatte::pixel(const RsDeepSample* samples, std::size_t count, float* values) {
    // Each sample's share of the pixel: its alpha over what the nearer ones leave uncovered.
    _ranks.clear();
    double covered = 0.0;
    for (std::size_t s = 0; s < count; ++s) {
        const double share = samples[s]._a * (1.0 - covered);
        covered += share;
        const float rendererId = samples[s].*_idOfSample;
        if (!(rendererId >= 1.0f && rendererId < static_cast<float>(_ids.size()))) continue;
        const float id = _ids[static_cast<std::size_t>(rendererId)];
        const auto same = std::find_if(_ranks.begin(), _ranks.end(), [id](const Rank& r) { return r.id == id; });
        if (same == _ranks.end()) _ranks.push_back({id, share});
        else same->coverage += share;
    }
    // Largest coverage first; equal ones by their bits, so that every run orders them alike.
    std::sort(_ranks.begin(), _ranks.end(), [](const Rank& a, const Rank& b) {
        if (a.coverage != b.coverage) return a.coverage > b.coverage;
        return std::bit_cast<std::uint32_t>(a.id) < std::bit_cast<std::uint32_t>(b.id);
    });
    for (std::size_t r = 0; r < std::size_t(kRanks); ++r) {
        const bool used = r < _ranks.size();
        values[2 * r] = used ? _ranks[r].id : 0.0f;
        values[2 * r + 1] = used ? static_cast<float>(_ranks[r].coverage) : 0.0f;
    }
}

}  // namespace Zr
