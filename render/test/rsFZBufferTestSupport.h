#pragma once
// Helpers of the fragment Z-buffer tests: a material whose colour a test decides from the shading
// context, and spans fed straight to a buffer's span methods with pixel data made by hand.
//
// A hand-made span tells the material which fragment it is shading through the eye position,
// which runs (x, id, 0) along the span (x the region-relative pixel, id the span's number); the
// depth starts at z0 and changes by slope per pixel. Binary fractions keep every depth exact.
#include <functional>

#include "coRgbaColorTyped.h"
#include "rcShdPtr.h"
#include "rsDrawContext.h"
#include "rsFZBuffer.h"
#include "rsMaterialShader.h"
#include "rsPixelData.h"
#include "sdMaterial.h"

namespace Zr::RsFZBufferTest {

using Rgba = CoRgbaColorTyped<float>;

class ScriptedMaterial : public RsMaterialShader {
public:
    using Script = std::function<Rgba(const RsShadingContext&)>;

    explicit ScriptedMaterial(Script script, unsigned int needed = 0)
        : RsMaterialShader(makeShared<SdMaterial>()), _script(std::move(script)), _needed(needed) {}

    Rgba shade(RsShadingContext& context) override {
        ++_calls;
        return _script(context);
    }
    unsigned int getNeededContext() const override { return _needed; }

    int _calls = 0;

protected:
    void lockMemoryImpl() override {}
    void unlockMemoryImpl() override {}

private:
    Script _script;
    unsigned int _needed;
};

// The fragment that a hand-made span shades, as the material sees it.
inline int spanIdOf(const RsShadingContext& c) { return static_cast<int>(c._eyeCoord.y); }
inline int pixelOf(const RsShadingContext& c) { return static_cast<int>(c._eyeCoord.x); }

// Feeds the pixels [x1, x2) of region-relative row `row` to the buffer's span method of its mode.
inline void feedSpan(RsFZBuffer& buffer, const RsDrawContext& context, int row, int x1, int x2, int id, double z0,
                     double slope) {
    RsPixelData<RsPlainVertex> data{};
    data._w._q = 1.0;
    data._z._q = z0;
    data._z._dq_dx = slope;
    data._eyeCoord._q = GePoint3<float>(static_cast<float>(x1), static_cast<float>(id), 0.0f);
    data._eyeCoord._dq_dx = GePoint3<float>(1.0f, 0.0f, 0.0f);
    const RsFZBuffer::Span span{x1, x2};
    if (buffer.hasZBuffer()) buffer.drawSpanZ(context, row, span, data);
    else buffer.drawSpanNoZ(context, row, span, data);
}

inline RsDrawContext makeContext(RsMaterialShader& material, RsTransferFunc::Function transfer, bool canBeOpaque) {
    RsDrawContext context;
    context._transfer = transfer;
    context._canBeOpaque = canBeOpaque;
    context._material = &material;
    return context;
}

}  // namespace Zr::RsFZBufferTest
