#pragma once
// The base of all material shaders: what colour a fragment of a material has.
//
// Before it draws a group of faces, the drawing code asks the shader three things: which members
// of the shading context it reads (getNeededContext, a mask of RsShadingContext::needs... bits,
// so that the rasterizer interpolates only those), whether the material is drawn as wires, and
// how it is composited (getTransferMode). It locks the shader around the drawing; shade is then
// called once per fragment.
//
// Locking keeps texture memory resident while a shader is in use. lockMemory and unlockMemory
// count, under a lock of their own, and call lockMemoryImpl on the first lock and
// unlockMemoryImpl on the last unlock. A subclass makes its samplers with createSampler in
// lockMemoryImpl when they don't exist yet (they live as long as the shader) and lets their
// cached tiles go with releaseTiles in unlockMemoryImpl. Since the samplers stand ready before
// any fragment, shade allocates nothing and takes no lock.
//
// Hosts derive their own material shaders from this class exactly as the library's do.
// The order of the virtual operations is fixed, for shaders compiled against earlier builds.
#include <cstdint>
#include <ostream>

#include "coRgbColorTyped.h"
#include "coRgbaColorTyped.h"
#include "lkLock.h"
#include "oPtr.h"
#include "rcBase.h"
#include "rcShdPtr.h"
#include "rsShadingContext.h"
#include "sdMaterial.h"
#include "sdTextureParams.h"
#include "sdTextureSampler.h"

namespace Zr {

class RsScene;
class RsGeomInstance;

class RsMaterialShader : public RCObject {
public:
    // Takes the transfer mode and the wire settings from the material; the lock count starts at
    // 0. A null material is reported as a null pointer failure.
    explicit RsMaterialShader(const RCShdPtr<const SdMaterial>& material);
    ~RsMaterialShader() override;

    RsMaterialShader(const RsMaterialShader&) = delete;
    RsMaterialShader& operator=(const RsMaterialShader&) = delete;

    // Called once after the scene is built, with the scene and the instance that the shader
    // serves, e.g. to pick the lights that reach the instance. Nothing here.
    virtual void initialize(RCShdPtr<RsScene>& scene, RCShdPtr<const RsGeomInstance>& instance);
    // The colour of the fragment that the context describes; alpha is straight. Unclamped.
    virtual CoRgbaColorTyped<float> shade(RsShadingContext& context) = 0;
    // The members of the context that shade reads, as RsShadingContext::needs... bits.
    virtual unsigned int getNeededContext() const = 0;
    // Whether each triangle is drawn as a ring of edges of width getWireSize, measured in pixels
    // when isScreenSpace holds and in eye-space units otherwise.
    virtual bool isWireframe() const;
    virtual bool isScreenSpace() const;
    virtual float getWireSize() const;

protected:
    // Called under the shader's lock on the first lockMemory and on the last unlockMemory.
    virtual void lockMemoryImpl() = 0;
    virtual void unlockMemoryImpl() = 0;

public:
    // Counted locking; safe from several threads at once. Every unlockMemory must follow a
    // lockMemory: an unbalanced one is an assertion failure.
    void lockMemory();
    void unlockMemory();

    const RCShdPtr<const SdMaterial>& getMaterial() const { return _material; }
    // How the shader's fragments are laid over what is behind them.
    SdMaterial::TransferMode getTransferMode() const { return _transferMode; }
    // The number of outstanding lockMemory calls; for diagnostics.
    std::int32_t getLockCount() const;

    void dump(std::ostream& os) const;

protected:
    // A sampler for a map, owned by the caller: the map's own one, or a NullTextureSampler, which
    // answers (1, 1, 1, 1), when there is no map (or the map hands out none). Shaders can thus
    // sample every map slot without asking whether it is filled.
    static OPtr<SdTextureSampler> createSampler(const RCShdPtr<const SdTextureParams>& params);

    // Fold a map's weight into a constant colour: the three channels times the weight of params,
    // or unchanged when there is no map. The second form also sets alpha; the last multiplies by
    // the weights of two maps in turn, each only if that map exists.
    static CoRgbColorTyped<float> scaleByTexture(const CoRgbColorTyped<float>& colour,
                                                 const RCShdPtr<const SdTextureParams>& params);
    static CoRgbaColorTyped<float> scaleByTexture(const CoRgbColorTyped<float>& colour, float alpha,
                                                  const RCShdPtr<const SdTextureParams>& params);
    static CoRgbColorTyped<float> scaleByTextures(const CoRgbColorTyped<float>& colour,
                                                  const RCShdPtr<const SdTextureParams>& params1,
                                                  const RCShdPtr<const SdTextureParams>& params2);

    // Compose the needed-context mask from the maps: the bits that a map requires when it
    // exists (by default the texture coordinates), and the bits of a bump map, which count only
    // when its weight is not zero, since a zero weight leaves the normal alone.
    static unsigned int neededContextOfMap(const RCShdPtr<const SdTextureParams>& map,
                                           unsigned int bits = RsShadingContext::needsTexCoord);
    static unsigned int neededContextOfBumpMap(const RCShdPtr<const SdTextureParams>& map,
                                               unsigned int bits);

    RCShdPtr<const SdMaterial> _material;
    SdMaterial::TransferMode _transferMode;
    std::int32_t _lockCount = 0;  // guarded by _lock
    mutable LkLock _lock{"RsMaterialShader lock"};
    bool _wireframe = false;
    bool _screenSpace = true;
    float _wireSize = 1.0f;
};

}  // namespace Zr
