#pragma once
// What a compositor reads besides the picture: per-pixel surface channels and deep samples,
// gathered by the fragment Z-buffer path when a renderer is given an RsAuxOutputs.
//
//   RsAuxOutputs aux(rectangle, true, true);
//   renderer.setAuxOutputs(&aux);
//   renderer.render(camera, scene, rectangle, output);   // the output guard's region is rectangle
//   aux.getZ()[pixel], aux.getNormal()[3 * pixel + 1], aux.getDeepSamples() ...
//
// Surface channels come from the front-most fragment of a pixel whose alpha is at least the
// opacity threshold (the nearest by depth with the Z-buffer, the first drawn without it), taken
// at the pixel centre and unfiltered:
//   Z          eye depth: the distance in front of the camera along its view axis;
//   N, P       the interpolated normal (unit length) and the position, both in world space;
//   UV         the first texture channel's coordinates, 0 for a mesh without them;
//   object ID  1 + the instance's index in the scene; material ID 1 + the index of its scene
//              material among the scene's distinct materials in order of first use. Both are
//              exact integers in floats.
// A pixel without such a fragment holds 0 in every channel.
//
// Deep samples are every fragment of a pixel, nearest first: front and back depth (equal, as a
// fragment is a surface point), the colour that the fragment's transfer function lays over
// transparent black, which for the normal mode is its premultiplied colour, and the object and
// material IDs of the fragment, numbered as in the surface channels.
//
// Motion vectors, when a motion target is given (setMotionTarget): for the fragment that the
// surface channels describe, where its surface point lands in the picture at the target's time minus
// where it is now (the pixel centre), in pixels: x to the right, y along the rows as they count
// here, which is upwards with the camera's y. The point goes from its instance's place now to the
// same instance's place then, and through the camera of then; so the vectors are exact for rigid
// motions of objects and camera. 0 where nothing opaque enough was drawn, and where the point
// lies on or behind the plane of the later camera (a perspective one).
//
// Only the path without antialiasing gathers them; a render on the antialiased path leaves them
// as begin made them. The channels cost nothing to a renderer that has no RsAuxOutputs: its
// buffers draw with the span methods of a plain render.
#include <cstddef>
#include <cstdint>
#include <limits>
#include <string>
#include <unordered_map>
#include <vector>

#include "geAffineMatrix3.h"
#include "geProjectiveMatrix3.h"
#include "geRectangle.h"
#include "rsDrawContext.h"
#include "rsPixelData.h"
#include "rsScene.h"

namespace Zr {

class RsFZBuffer;
struct RsFragment;

struct RsDeepSample {
    float _zFront;
    float _zBack;
    float _r, _g, _b, _a;  // premultiplied
    float _objectId;
    float _materialId;
};

class RsAuxOutputs {
public:
    // The pixels of region, with the surface channels, the deep samples, or both.
    RsAuxOutputs(const GeRectangle<int>& region, bool surface, bool deep);

    // The alpha from which a fragment stops a ray for the surface channels; 1 by default, within
    // the float tolerance of the opaque test.
    void setOpacityThreshold(float threshold) { _threshold = threshold; }
    float getOpacityThreshold() const { return _threshold; }

    const GeRectangle<int>& getRegion() const { return _region; }
    bool hasSurface() const { return _surface; }
    bool hasDeep() const { return _deep; }

    // Motion vectors towards later, the scene of the render at another time (instances match by
    // their index in _geomInstances; one beyond later's count stays where it is), seen through
    // laterWorldToCamera and laterProjection. Turns the surface channels on: the vectors are made
    // from them. Holds until clearMotionTarget; later is not kept.
    void setMotionTarget(const RsScene& later, const GeAffineMatrix3<float>& laterWorldToCamera,
                         const GeProjectiveMatrix3<double>& laterProjection);
    void clearMotionTarget() { _hasTarget = false; }

    // Row-major over the region; one, three, three, two, one and one floats per pixel.
    const std::vector<float>& getZ() const { return _z; }
    const std::vector<float>& getNormal() const { return _normal; }
    const std::vector<float>& getPosition() const { return _position; }
    const std::vector<float>& getTexCoord() const { return _texCoord; }
    const std::vector<float>& getObjectId() const { return _objectId; }
    const std::vector<float>& getMaterialId() const { return _materialId; }
    // Two floats per pixel (x, y) with a motion target, else empty.
    const std::vector<float>& getMotion() const { return _motion; }

    // Per pixel the index of its first sample and their count; the samples of a pixel follow
    // each other, nearest first.
    const std::vector<std::uint32_t>& getDeepOffsets() const { return _deepOffsets; }
    const std::vector<std::uint32_t>& getDeepCounts() const { return _deepCounts; }
    const std::vector<RsDeepSample>& getDeepSamples() const { return _deepSamples; }

    // The IDs of this scene, as the channels hold them; 0 for what the scene does not hold.
    float getObjectIdOf(const RsGeomInstance& instance) const;
    float getMaterialIdOf(const RsMaterialShader& material) const;
    // The name of each ID, from 1 on (entry 0 names ID 1): the instances' and the materials'
    // names, empty where the scene gives none. Set by begin.
    const std::vector<std::string>& getObjectNames() const { return _objectNames; }
    const std::vector<std::string>& getMaterialNames() const { return _materialNames; }

    // ---- For the renderer ----
    // Clears every channel for a render of scene through the view.
    void begin(const RsScene& scene, const GeAffineMatrix3<float>& worldToCamera,
               const GeProjectiveMatrix3<double>& projection);
    // Readies the motion vectors of a render of scene whose projection spans rectangle (in
    // pixels); after begin. Without a motion target, clears them to nothing.
    void beginMotion(const RsScene& scene, const GeRectangle<int>& rectangle);
    // The index of image pixel (x, y), which must lie in the region.
    std::size_t indexOf(int x, int y) const {
        return std::size_t(y - _region.y0) * std::size_t(_region.x1 - _region.x0) + std::size_t(x - _region.x0);
    }
    // Keeps what the pixel data says at pixel index when the fragment of depth and alpha is the
    // front-most one opaque enough so far: nearer than the one kept with byDepth, else the first.
    template <class Vertex>
    void record(std::size_t index, double depth, float alpha, bool byDepth, const RsPixelData<Vertex>& data,
                const RsDrawContext& context) {
        if (!_surface || alpha < _minAlpha) return;
        double& kept = _nearest[index];
        if (byDepth ? !(depth < kept) : kept != kNone) return;
        kept = depth;
        const double inv = 1.0 / data._w._q;
        const GePoint3<float>& e = data._eyeCoord._q;
        float* p = &_position[3 * index];
        p[0] = static_cast<float>(e.x * inv);
        p[1] = static_cast<float>(e.y * inv);
        p[2] = static_cast<float>(e.z * inv);
        float* n = &_normal[3 * index];
        if constexpr (RsPixelData<Vertex>::kHasNormal) {
            n[0] = data._normal._q.x;
            n[1] = data._normal._q.y;
            n[2] = data._normal._q.z;
        } else {
            n[0] = n[1] = n[2] = 0.0f;
        }
        // A mesh without texture coordinates has none to give, whatever its faces are drawn with.
        _texCoord[2 * index] = context._hasTexCoords ? static_cast<float>(data._texCoord._q.x * inv) : 0.0f;
        _texCoord[2 * index + 1] = context._hasTexCoords ? static_cast<float>(data._texCoord._q.y * inv) : 0.0f;
        _objectId[index] = context._objectId;
        _materialId[index] = context._materialId;
    }
    // Keeps the IDs of a fragment just made in the buffer being drawn, for its deep sample.
    void recordIds(const RsFragment* fragment, const RsDrawContext& context) {
        if (_deep) _fragmentIds.push_back({fragment, context._objectId, context._materialId});
    }
    // Finishes the pixels of a drawn buffer: the surface channels from eye to world space, and
    // the deep samples of its fragment lists.
    void finishRegion(const RsFZBuffer& buffer);

private:
    static constexpr double kNone = std::numeric_limits<double>::max();
    // The eye depth (positive in front) of a pixel depth.
    float eyeDepthOf(double pixelDepth) const;
    // The motion of pixel index, whose front-most surface point lies at world and is seen at the
    // pixel centre (pixelX, pixelY): where the point lands later minus the centre.
    void recordMotion(std::size_t index, const GePoint3<float>& world, double pixelX, double pixelY);

    GeRectangle<int> _region;
    bool _surface;
    bool _deep;
    float _threshold = 1.0f;
    float _minAlpha = 1.0f;
    std::vector<double> _nearest;
    std::vector<float> _z, _normal, _position, _texCoord, _objectId, _materialId;
    std::vector<std::uint32_t> _deepOffsets, _deepCounts;
    std::vector<RsDeepSample> _deepSamples;
    GeAffineMatrix3<float> _worldToCamera;
    GeAffineMatrix3<float> _cameraToWorld;
    // Pixel depth d from eye z: d = 0.5 * (a * z + b) / (c * z + e) + 0.5.
    double _a = 0.0, _b = 0.0, _c = 0.0, _e = 1.0;
    std::unordered_map<const RsGeomInstance*, float> _objectIds;
    std::unordered_map<const SdMaterial*, float> _materialIds;
    std::vector<std::string> _objectNames, _materialNames;
    // The IDs of the fragments that the buffer being drawn has made, in the order made; a
    // fragment's record stands for it until the next buffer's pool hands the record out again,
    // so finishRegion empties the list.
    struct FragmentIds {
        const RsFragment* fragment;
        float objectId;
        float materialId;
    };
    std::vector<FragmentIds> _fragmentIds;
    // The motion target: the later instances' matrices and the later view.
    bool _hasTarget = false;
    std::vector<GeAffineMatrix3<float>> _laterMatrices;
    GeAffineMatrix3<float> _laterWorldToCamera;
    GeProjectiveMatrix3<double> _laterProjection;
    // Per instance of the render, world space now to later pixels; two floats per pixel.
    std::vector<GeProjectiveMatrix3<double>> _toLaterPixels;
    std::vector<float> _motion;
};

}  // namespace Zr
