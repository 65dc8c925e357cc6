#pragma once
// A model file read through Assimp and turned into a scene description, once per frame time.
//
// Reading keeps the file's meshes (triangles only, with their normals and first texture
// coordinates), its materials (mapped onto SdMaterial, diffuse textures read through
// ZrImageFile), cameras and lights. sceneAt(seconds) then places them by the node hierarchy, the
// file's first animation moving the nodes it animates. A file without lights gets a three-light
// rig around its bounds; cameras without a file camera are made by frameBounds.
//
// Every failure is a ZrHostError of one line that names the file: unreadable, refused by the
// importer, or holding no triangles. A texture that cannot be read is left out with a warning.
#include <memory>
#include <string>
#include <vector>

#include "gePoint3.h"
#include "rcShdPtr.h"
#include "sdInstance.h"
#include "sdScene.h"
#include "zrShadowOptions.h"

namespace Zr {

class ZrModelFile {
public:
    // An axis-aligned box in world space; empty while lo > hi.
    struct Bounds {
        GePoint3<double> lo{1e300, 1e300, 1e300};
        GePoint3<double> hi{-1e300, -1e300, -1e300};
        bool isEmpty() const { return lo.x > hi.x; }
        void add(const GePoint3<double>& p);
    };

    // Reads path; throws ZrHostError.
    explicit ZrModelFile(const std::string& path);
    ~ZrModelFile();
    ZrModelFile(const ZrModelFile&) = delete;
    ZrModelFile& operator=(const ZrModelFile&) = delete;

    // The scene at the given time of the file's animation (its first; none: the rest pose), its
    // lights casting shadows as asked. Direct lights' maps cover the model's bounds.
    RCShdPtr<SdScene> sceneAt(double seconds, const ZrShadowOptions& shadows = {}) const;
    // The names of the file's cameras, in the file's order.
    std::vector<std::string> cameraNames() const;
    // The named camera at the given time for pictures of the given aspect; an empty name takes
    // the file's first camera, or one that frames the scene when the file has none. An unknown
    // name throws ZrHostError listing the names there are.
    RCShdPtr<SdInstance> cameraAt(const std::string& name, double seconds, double aspect) const;
    // The middle of the model's bounds at the given time.
    GePoint3<double> centreAt(double seconds) const;
    // What reading noticed and worked around (textures left out, meshes skipped), one line each.
    const std::vector<std::string>& warnings() const;

    // A camera that looks at the box from the front, a little from above and to the right, and
    // sees all of it in a picture of the given aspect.
    static RCShdPtr<SdInstance> frameBounds(const Bounds& bounds, double aspect);

private:
    struct Model;
    std::unique_ptr<Model> _model;
};

}  // namespace Zr
