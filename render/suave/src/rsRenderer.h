#pragma once
// The host's way into the renderer: configure once, then render a scene into an image tile.
//
//   RCShdPtr<RsRenderer> renderer = makeShared<RsRenderer>();
//   renderer->setFillColor({0, 0, 0, 0});
//   renderer->render(cameraInstance, scene, rectangle, IxWriteGuard(tile));
//
// A call draws the complete picture of its rectangle into the output guard's region and keeps
// nothing afterwards: the buffer factory, the scene renderer and the list of visible instances
// live on the call's stack. Settings take effect at the next call.
#include <memory>
#include <ostream>

#include "coRgbaColorTyped.h"
#include "geAffineMatrix3.h"
#include "geProjectiveMatrix3.h"
#include "geRectangle.h"
#include "ixReadGuard.h"
#include "ixTileManip.h"
#include "ixWriteGuard.h"
#include "rcBase.h"
#include "rcShdPtr.h"
#include "rsFilterKernel.h"
#include "rsScene.h"
#include "sdInstance.h"

namespace Zr {

class RsAuxOutputs;
struct RsFZBufferMemory;

class RsRenderer : public RCBase<LkCounter<int>>, public IxTileManip {
public:
    RsRenderer();
    ~RsRenderer() override;

    RsRenderer(const RsRenderer&) = delete;
    RsRenderer& operator=(const RsRenderer&) = delete;

    // false: whole-pixel fragments (fragment Z-buffer); true: sub-pixel coverage (A-buffer).
    void setAntialiasing(bool antialiasing) { _antialiasing = antialiasing; }
    bool getAntialiasing() const { return _antialiasing; }
    // Whether fragments are depth tested; without it the drawing order decides.
    void setZBuffer(bool zBuffer) { _zBuffer = zBuffer; }
    bool getZBuffer() const { return _zBuffer; }
    // The reconstruction filter of the antialiased path.
    void setFilterKernel(RsFilterKernel::KernelType type) { _filterKernel.setKernelType(type); }
    const RsFilterKernel& getFilterKernel() const { return _filterKernel; }
    RsFilterKernel::KernelType getFilterKernelType() const { return _filterKernel.getKernelType(); }
    // Straight colour of the pixels that no background supplies.
    void setFillColor(const CoRgbaColorTyped<float>& color) { _fillColor = color; }
    const CoRgbaColorTyped<float>& getFillColor() const { return _fillColor; }
    // An image that the scene is laid over; an empty guard for none.
    void setBackground(const IxReadGuard& background) { _background = ReadGuardNoCheck(background); }
    // Surface channels and deep samples that renders without antialiasing gather beside the
    // picture; not owned, null (the default) for none. Its region is to be the output's.
    void setAuxOutputs(RsAuxOutputs* aux) { _auxOutputs = aux; }
    RsAuxOutputs* getAuxOutputs() const { return _auxOutputs; }

    // Draws scene as seen through worldToCamera and projection (camera space to -1..1) into
    // output. rectangle is the picture that the projection's -1..1 spans, in pixels; the pixels
    // drawn are those of the output guard's region.
    void render(const GeAffineMatrix3<float>& worldToCamera, const GeProjectiveMatrix3<double>& projection,
                const RCShdPtr<RsScene>& scene, const GeRectangle<int>& rectangle, const IxWriteGuard& output);
    // The same through a camera instance: its matrix places the camera, its SdCamera gives the
    // projection. An instance of anything but a camera draws nothing.
    void render(const RCShdPtr<SdInstance>& camera, const RCShdPtr<RsScene>& scene,
                const GeRectangle<int>& rectangle, const IxWriteGuard& output);

    // Not available: both abort.
    unsigned int getMemUsageMb() const;
    unsigned int getTileMemUsageMb() const;

    void dump(std::ostream& os) const;

protected:
    // The core of every render: accumulate and weight go to the output of the buffers (add the
    // weighted picture to what the output holds), unpremultiply to their resolve.
    void renderCommon(const RCShdPtr<RsScene>& scene, const GeAffineMatrix3<float>& worldToCamera,
                      const GeProjectiveMatrix3<double>& projection, bool accumulate, float weight,
                      const GeRectangle<int>& rectangle, const IxWriteGuard& output, bool unpremultiply);

    bool _antialiasing = false;
    bool _zBuffer = true;
    RsFilterKernel _filterKernel{static_cast<RsFilterKernel::KernelType>(0)};
    CoRgbaColorTyped<float> _fillColor{0.0f, 0.0f, 0.0f, 0.0f};
    ReadGuardNoCheck _background;
    // The fragment buffers' memory, kept from one render call to the next.
    std::unique_ptr<RsFZBufferMemory> _bufferMemory;
    RsAuxOutputs* _auxOutputs = nullptr;
};

}  // namespace Zr
