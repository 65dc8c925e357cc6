#pragma once
// Looks colours up in a texture. A material or light shader makes one sampler per map, when it is
// first locked, from the map's SdTextureParams, and keeps it for its life; between locks it lets
// the sampler release what it cached (releaseTiles).
//
// Texture coordinates are (s, t) over [0, 1] x [0, 1] (SdTexture). Derivatives are the footprint
// of one pixel in texture space, as a GeLinearMatrix2 whose column 0 is (ds/dx, ds/dy) and column 1
// (dt/dx, dt/dy): element (0, 0) is ds/dx, (1, 0) ds/dy, (0, 1) dt/dx, (1, 1) dt/dy.
//
// Texel coordinates (x, y) are integers in the texture's own pixel grid; what a sampler does with
// texels outside the image is its wrap rule.
//
// The virtual operations keep this order, which subclasses in other libraries rely on.
#include "coRgbaColorTyped.h"
#include "geLinearMatrix2.h"
#include "gePoint2.h"

namespace Zr {

class IxGuardProxy;

class SdTextureSampler {
public:
    SdTextureSampler() = default;
    SdTextureSampler(const SdTextureSampler&) = delete;
    SdTextureSampler& operator=(const SdTextureSampler&) = delete;
    virtual ~SdTextureSampler();

    // Gives up a guard on texture memory that the sampler holds; nothing here.
    virtual void releaseGuard() const;
    // Bilinear lookup between texel (x, y) and its neighbours (x + 1, y), (x, y + 1),
    // (x + 1, y + 1), with weights given by the fractions fx and fy in [0, 1]: (0, 0) is texel
    // (x, y) itself.
    virtual CoRgbaColorTyped<float> sample(int x, int y, float fx, float fy) const;
    // Average over the axis-aligned box of widthS by widthT (texture units) centred on texCoord.
    virtual CoRgbaColorTyped<float> sample(const GePoint2<double>& texCoord, double widthS,
                                           double widthT) const = 0;
    // One texel.
    virtual CoRgbaColorTyped<float> sample(int x, int y) const = 0;
    // One texel for a pixel whose footprint the derivatives give; this base ignores the
    // footprint and answers the texel.
    virtual CoRgbaColorTyped<float> sample(int x, int y,
                                           const GeLinearMatrix2<float>& derivatives) const;
    // The lookup of the shaders: the colour at texCoord, filtered over the pixel's footprint as
    // far as the sampler filters at all.
    virtual CoRgbaColorTyped<float> sample(const GePoint2<double>& texCoord,
                                           const GeLinearMatrix2<double>& derivatives) const = 0;
    // As the former with float derivatives, which this base widens.
    virtual CoRgbaColorTyped<float> sample(const GePoint2<double>& texCoord,
                                           const GeLinearMatrix2<float>& derivatives) const;
    // Makes the texture memory resident ahead of lookups.
    virtual void lockTiles() const = 0;
    // The size of the blocks in which the sampler caches texels; 64 here.
    virtual int getCacheBlockingSizeX() const;
    virtual int getCacheBlockingSizeY() const;
    // Lets cached texture memory go; lookups stay possible and bring it back. Nothing here.
    virtual void releaseTiles() const;
    // Lets the guards of a render take the sampler's memory lock along; nothing here.
    virtual void registerGuardProxy(const IxGuardProxy& proxy) const;
};

}  // namespace Zr
