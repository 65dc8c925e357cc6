#pragma once
// The vertex data of one instance for one render call: its vertices in camera space and in
// homogeneous pixel space, its normals in camera space, on demand its tangent frames, and the
// pixel-space bounds of its faces in blocks.
//
// The pixel matrix is the same for every region of a call, so this is made once per instance and
// render and shared by all regions; a region drawer then does only per-face work. The block
// bounds let a region skip, before any per-face work, the runs of faces that lie wholly beside it:
// blocks of 32 faces, and groups of 16 blocks, so that a large mesh costs a region little.
#include <vector>

#include "geAffineMatrix3.h"
#include "geHomogeneousCoord3.h"
#include "gePoint3.h"
#include "geProjectiveMatrix3.h"
#include "geRectangle.h"
#include "geVector3.h"
#include "rcShdPtr.h"
#include "sdMesh.h"

namespace Zr {

class RsGeomInstance;

class RsInstanceVertices {
public:
    // Faces are bounded in runs of this many, in mesh order, and blocks in groups.
    static constexpr unsigned int kFacesPerBlock = 32;
    static constexpr unsigned int kBlocksPerGroup = 16;

    // Transforms the vertices of the instance with its camera matrix and then pixelMatrix, and
    // its normals when withNormals is set; the tangent frames follow when withTangents is set or
    // on the first call of prepareTangents. The mesh must carry its derived data.
    RsInstanceVertices(const RsGeomInstance& instance, const GeProjectiveMatrix3<float>& pixelMatrix,
                       bool withNormals, bool withTangents);

    const SdMesh& getMesh() const { return *_mesh; }
    bool hasTexCoords() const { return _hasTexCoords; }
    const std::vector<GePoint3<float>>& getCameraPositions() const { return _cameraPositions; }
    const std::vector<GeHomogeneousCoord3<float>>& getPixelPositions() const { return _pixelPositions; }
    const std::vector<GeVector3<float>>& getCameraNormals() const { return _cameraNormals; }
    const std::vector<GeVector3<float>>& getTangentsU() const { return _tangentsU; }
    const std::vector<GeVector3<float>>& getTangentsV() const { return _tangentsV; }

    // Computes the tangent frames unless they are there.
    void prepareTangents();

    // The first face from face on, before end, whose block may reach region; end when there is
    // none. Every face passed over lies beside the region by a safe margin: all three of its
    // vertices are strictly outside one side of the region, so the clipper's outside test would
    // drop it. A block with a vertex at or behind the eye, or one that is not finite, is never
    // passed over: its faces go to the per-face test.
    unsigned int nextFaceNear(unsigned int face, unsigned int end, const GeRectangle<int>& region) const;

private:
    // The pixel-space box of a block after the division by w: x0, x1, y0, y1; empty (x0 > x1)
    // when the box cannot stand for its faces.
    struct Box {
        double x0, x1, y0, y1;
    };

    static bool misses(const Box& box, const GeRectangle<int>& region);

    void computeTangents();
    void computeBlockBoxes();

    RCShdPtr<const SdMesh> _mesh;
    bool _hasTexCoords;
    bool _tangentsReady = false;
    std::vector<GePoint3<float>> _cameraPositions;
    std::vector<GeHomogeneousCoord3<float>> _pixelPositions;
    std::vector<GeVector3<float>> _cameraNormals;
    std::vector<GeVector3<float>> _tangentsU;
    std::vector<GeVector3<float>> _tangentsV;
    std::vector<Box> _blockBoxes;
    std::vector<Box> _groupBoxes;  // each the union of its blocks' boxes, empty if one is
};

}  // namespace Zr
