#pragma once
// Meshes of simple shapes for the sample scene and the benchmarks. Each is centred on the origin
// of its object space, carries outward normals of its own (so the mesh builder computes none),
// and is wound counter-clockwise seen from outside.
//
// The vertices come from trigonometry in double precision rounded to float, so that the meshes
// are the same bit for bit whatever the optimiser folds at compile time: the golden pictures
// depend on it.
#include "rcShdPtr.h"
#include "sdMesh.h"

namespace Zr {

class ZrShapes {
public:
    // A square of side size in the plane y = 0, normal +y, cut into cells by cells squares of two
    // triangles each. With checker, the faces form two face groups, the "white" cells first and
    // then the "black" ones, so an instance with two materials shows a chess board; without, one
    // group of all faces. Texture coordinates run from 0 to cells along x and z.
    static RCShdPtr<const SdMesh> makeGrid(float size, unsigned int cells, bool checker);

    // A sphere of the given radius with slices meridians and stacks parallels (at least 3 and 2);
    // the faces at the poles are fans, the others quads of two triangles.
    static RCShdPtr<const SdMesh> makeSphere(float radius, unsigned int slices, unsigned int stacks);

    // A ring about the y axis: the tube of radius minorRadius follows the circle of radius
    // majorRadius in the plane y = 0. rings cuts round the y axis, sides round the tube (at least
    // 3 each).
    static RCShdPtr<const SdMesh> makeTorus(float majorRadius, float minorRadius, unsigned int rings,
                                            unsigned int sides);

    // A cube of edge 2 * halfSize with sharp edges: four vertices of its own per face, each with
    // the face's normal.
    static RCShdPtr<const SdMesh> makeCube(float halfSize);
};

}  // namespace Zr
