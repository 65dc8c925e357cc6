#include "rsImageCreatorUtil.h"

#include "assertions.h"

namespace Zr {

namespace {

constexpr const char* kSourceFile = "render\\suave\\src\\rsImageCreatorUtil";

bool isRendererDepth(int depth) {
    return depth == IxPixelFormat::UINT8 || depth == IxPixelFormat::FLOAT16 || depth == IxPixelFormat::FLOAT32;
}

bool isKnownComps(int comps) {
    return comps == IxPixelFormat::ALPHA || comps == IxPixelFormat::RGB || comps == IxPixelFormat::RGBA;
}

}  // namespace

void RsImageCreatorUtil::selectRowReader(RowFunctions& table, const IxPixelFormat& format) {
    if (!isRendererDepth(format._depth)) return;  // an unknown depth leaves the table as it is
    if (!isKnownComps(format._comps)) Assertions::throwProgramAborted(kSourceFile, __LINE__, nullptr);
    table._reader = IxRowCodec::selectReader(format);
}

void RsImageCreatorUtil::selectRowWriter(RowFunctions& table, const IxPixelFormat& format, bool accumulate) {
    if (!isRendererDepth(format._depth) || !isKnownComps(format._comps))
        Assertions::throwProgramAborted(kSourceFile, __LINE__, nullptr);
    table._writer = accumulate ? IxRowCodec::selectAddingWriter(format) : IxRowCodec::selectWriter(format);
}

}  // namespace Zr
