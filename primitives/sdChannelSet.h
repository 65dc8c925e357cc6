#pragma once
// Which kinds of data a mesh carries, one bit per kind. A renderer that needs certain data masks a
// mesh's set with the set it needs and compares:
//
//   if ((mesh.getChannelSet() & SdMesh::DERIVED_DATA) != SdMesh::DERIVED_DATA) ...
#include <cstdint>

namespace Zr {

class SdChannelSet {
public:
    enum Channel : std::uint32_t {
        vertices = 0x01,       // vertex positions
        faces = 0x02,          // triangles of three vertex indices
        normals = 0x04,        // an array of normals
        faceNormals = 0x08,    // each face has a normal, an index into the normal array
        cornerNormals = 0x10,  // each corner of each face has a normal index
        firstTextureChannel = 0x20,  // texture channel i is the bit firstTextureChannel << i
    };
    static constexpr int maxTextureChannels = 27;

    constexpr SdChannelSet() = default;
    constexpr SdChannelSet(Channel channel) : _bits(channel) {}
    constexpr explicit SdChannelSet(std::uint32_t bits) : _bits(bits) {}

    // The bit of texture channel index, which is below maxTextureChannels.
    static constexpr SdChannelSet textureChannel(int index) {
        return SdChannelSet(static_cast<std::uint32_t>(firstTextureChannel) << index);
    }

    constexpr std::uint32_t getBits() const { return _bits; }
    constexpr bool isEmpty() const { return _bits == 0; }
    // True when every channel of other is in this set.
    constexpr bool contains(SdChannelSet other) const { return (_bits & other._bits) == other._bits; }

    constexpr SdChannelSet& operator|=(SdChannelSet other) {
        _bits |= other._bits;
        return *this;
    }
    constexpr SdChannelSet& operator&=(SdChannelSet other) {
        _bits &= other._bits;
        return *this;
    }
    friend constexpr SdChannelSet operator|(SdChannelSet a, SdChannelSet b) {
        return SdChannelSet(a._bits | b._bits);
    }
    friend constexpr SdChannelSet operator&(SdChannelSet a, SdChannelSet b) {
        return SdChannelSet(a._bits & b._bits);
    }
    friend constexpr bool operator==(SdChannelSet a, SdChannelSet b) { return a._bits == b._bits; }
    friend constexpr bool operator!=(SdChannelSet a, SdChannelSet b) { return a._bits != b._bits; }

private:
    std::uint32_t _bits = 0;
};

}  // namespace Zr
