#pragma once
// The per-face records of a mesh. They are stored in contiguous arrays, one record per face, and
// read by the renderer in its inner loops, so they are plain structures of 32-bit indices.
#include <cstdint>

namespace Zr {

struct SdMeshTypes {
    using Index = std::uint32_t;

    // A triangle: indices into the vertex array. Seen from the side the face's normal points to,
    // the corners run counter-clockwise.
    struct FaceImp {
        Index _vertexIndices[3];
    };

    // The corners of a face in one texture channel: indices into that channel's coordinates.
    struct TextureFaceImp {
        Index _textureIndices[3];
    };

    // A run of consecutive faces drawn with one material.
    struct FaceGroup {
        Index _firstFace;
        Index _faceCount;
    };
};

}  // namespace Zr
