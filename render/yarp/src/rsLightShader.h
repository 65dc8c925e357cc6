#pragma once
// The base of the renderer's light shaders: for one fragment, how much light arrives from one
// light, from which direction, and in which colour once shadows are counted. A scene owns its light
// shaders through RCShdPtr, and material shaders refer to the lights that reach them; neither
// refers back.
//
// Every render call first runs setupRender and then initializeMaps on each light of the scene, in
// the scene's order, before any pixel is touched: a light places itself in camera space and
// rebuilds its shadow maps for that call. illuminate and shadow then run per fragment, between
// lockMemory and unlockMemory, which a material shader calls from within its own lock.
//
// Hosts derive their own lights from this class. The order of the virtual operations is fixed,
// for lights compiled against earlier builds.
#include <cstdint>
#include <set>

#include "coRgbColorTyped.h"
#include "geAffineMatrix3.h"
#include "geVector3.h"
#include "rcBase.h"
#include "rcShdPtr.h"
#include "sdLight.h"

namespace Zr {

class RsScene;
struct RsShadingContext;

class RsLightShader : public RCObject {
public:
    // What one light gives one fragment.
    struct Illumination {
        // Unit vector from the surface towards the light.
        GeVector3<float> _direction{0.0f, 0.0f, 1.0f};
        // Colour x intensity x falloff, without shadow: what a material's ambient term adds.
        CoRgbColorTyped<float> _ambient{0.0f, 0.0f, 0.0f};
        // Colour with projected map and shadow, x intensity x falloff.
        CoRgbColorTyped<float> _color{0.0f, 0.0f, 0.0f};
        // _direction . the fragment's normal.
        float _cosine = 0.0f;
    };

    ~RsLightShader() override = default;

    // Called once after the scene that owns the light is built. Nothing to do here.
    virtual void initialize(const RCShdPtr<RsScene>& scene);
    // Places the light for one render call seen through worldToCamera.
    virtual void setupRender(const GeAffineMatrix3<float>& worldToCamera) = 0;
    // Rebuilds the light's shadow maps for one render call of scene.
    virtual void initializeMaps(const RCShdPtr<RsScene>& scene) = 0;
    // Fills illumination for the fragment of context. True when _color and _cosine are valid;
    // false when the light does not reach the fragment, in which case _ambient may still be.
    // Writes nothing into the light.
    virtual bool illuminate(const RsShadingContext& context, Illumination& illumination) const = 0;
    // How much of the light's colour passes the shadows at the fragment, per channel: white where
    // nothing shadows.
    virtual CoRgbColorTyped<float> shadow(const RsShadingContext& context) = 0;

protected:
    // Called on the first lockMemory and on the last unlockMemory.
    virtual void lockMemoryImpl() = 0;
    virtual void unlockMemoryImpl() = 0;

public:
    // Whether the light shines on an instance whose light table is lights: with the include mode
    // when its number is listed, with the exclude mode when it is not.
    bool includes(const std::set<unsigned int>& lights) const;

    // Counted locking, without a lock of its own: a light is locked only from within the lock of
    // a material shader, which guards it. An unbalanced unlockMemory is an assertion failure.
    void lockMemory();
    void unlockMemory();

    unsigned int _lightId = 0;
    SdLight::LinkMode _linkMode = SdLight::LinkMode::exclude;
    bool _emitAmbient = false;
    bool _emitDiffuse = true;
    bool _emitSpecular = true;
    std::int32_t _lockCount = 0;

protected:
    RsLightShader() = default;
    // Takes its number from the light's instance and the linking and emission flags from light.
    RsLightShader(unsigned int lightId, const SdLight& light);
    RsLightShader(const RsLightShader&) = default;
    RsLightShader& operator=(const RsLightShader&) = default;
};

}  // namespace Zr
