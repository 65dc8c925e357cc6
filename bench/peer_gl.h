#pragma once
// The peer of the render benchmarks: renderer scenes drawn through OpenGL on Mesa's CPU rasterizer
// (OSMesa), so that a frame of ours can be timed and compared side by side with what a user
// could pick instead.
//
// PeerContext is the OSMesa context with its RGBA8 colour buffer and the one shader program;
// PeerScene is one renderer scene in GL form for one camera, drawn as the renderer draws it:
// - the same geometry: each RsGeomInstance's mesh (positions, corner normals, faces, face
//   groups) placed by the same object-to-camera matrix and projected by the same projection; GL's
//   viewport transform is the renderer's pixel matrix, pixel centres at +0.5, row 0 at the bottom;
// - the same shading per pixel: the host's diffuse shader in GLSL, normals interpolated and
//   normalised per pixel, turned towards the eye on back faces;
// - opaque faces first with the depth test and depth writes; then the transparent ones (opacity
//   below 1, or a mode that never is opaque), blended over with depth writes off, instance by
//   instance from far to near and, within a face group, face by face from far to near. The order
//   is fixed when the scene is made: the camera does not move between frames.
// - wire faces as the renderer draws screen-space wires: a band of the wire width inside each
//   edge of every face, the rest of the face discarded.
// Only the normal and screen transfer modes are drawn; others make the constructor throw.
//
// The pictures are compared, not required to be equal: the two rasterizers round edges, depths
// and blends differently.
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "coRgbaColorTyped.h"
#include "rsScene.h"
#include "sdInstance.h"

namespace Zr {

class PeerContext {
public:
    // A context of at least GL 3.0 in the compatibility profile, with a 24-bit depth buffer. Throws
    // std::runtime_error when OSMesa or the shaders fail. The rasterizer's thread count is read
    // from LP_NUM_THREADS when the first context is made.
    PeerContext();
    ~PeerContext();
    PeerContext(const PeerContext&) = delete;
    PeerContext& operator=(const PeerContext&) = delete;

    // Makes the context draw into a colour buffer of width by height pixels.
    void resize(int width, int height);
    int getWidth() const { return _width; }
    int getHeight() const { return _height; }
    // RGBA, 4 bytes a pixel, rows from the bottom of the picture up.
    const std::uint8_t* getPixels() const { return _pixels.data(); }
    // GL's renderer and version strings.
    std::string describe() const;

private:
    friend class PeerScene;
    struct Uniforms {
        int toCamera, projection, normalMatrix, diffuse, opacity, premultiply, wireSize, lightDirection,
            ambientShare;
    };

    void* _context = nullptr;  // OSMesaContext
    std::vector<std::uint8_t> _pixels;
    int _width = 0;
    int _height = 0;
    unsigned int _program = 0;
    Uniforms _uniforms{};
};

class PeerScene {
public:
    // The scene in GL form, seen through camera (an SdCamera instance) for pictures of the
    // context's current size. Throws std::runtime_error for what the peer cannot draw.
    PeerScene(PeerContext& context, const RsScene& scene, const SdInstance& camera);
    ~PeerScene();
    PeerScene(const PeerScene&) = delete;
    PeerScene& operator=(const PeerScene&) = delete;

    // Clears to fill, draws every instance and waits until the picture is complete.
    void draw(const CoRgbaColorTyped<float>& fill);

private:
    struct Group {
        std::size_t firstIndex;  // into the instance's element buffer
        int indexCount;
        float diffuse[3];
        float opacity;
        bool screen;       // the screen mode, otherwise normal
        bool transparent;  // drawn in the blended pass
        float wireSize;    // pixels; 0 for filled faces
    };
    struct Instance {
        unsigned int arrays = 0, vertexBuffer = 0, indexBuffer = 0;
        float toCamera[16];
        float normalMatrix[9];
        float depth;  // camera z of the mesh box's centre: smaller is farther
        bool front, back;
        std::vector<Group> groups;
    };

    void drawGroups(const Instance& instance, bool transparent);

    PeerContext* _context;
    float _projection[16];
    std::vector<Instance> _instances;
    std::vector<std::size_t> _farToNear;  // instance order of the blended pass
};

}  // namespace Zr
