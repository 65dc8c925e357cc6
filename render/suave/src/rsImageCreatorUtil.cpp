#include "rsImageCreatorUtil.h"

#include <cstddef>

#include "assertions.h"
#include "osMemoryArch.h"

namespace Zr {

namespace {

constexpr const char* kSourceFile = "render\\suave\\src\\rsImageCreatorUtil";

bool isRendererDepth(int depth) {
    return depth == IxPixelFormat::UINT8 || depth == IxPixelFormat::FLOAT16 || depth == IxPixelFormat::FLOAT32;
}

bool isKnownComps(int comps) {
    return comps == IxPixelFormat::ALPHA || comps == IxPixelFormat::RGB || comps == IxPixelFormat::RGBA;
}

int clampTo(int v, int lo, int hi) { return v < lo ? lo : (v > hi ? hi : v); }

std::ptrdiff_t pixelBytes(const IxPixelFormat& format) {
    return std::ptrdiff_t(format._comps) * (format._depth / 8);
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

RsImageCreatorUtil::AlignedRow::AlignedRow(int width) {
    const OsMemoryArch* arch = OsMemoryArch::getInstance();
    const std::size_t alignment =
        static_cast<std::size_t>(arch != nullptr ? arch->getAlignment() : OsMemoryArch::DEFAULT_ALIGNMENT);
    const std::size_t bytes = static_cast<std::size_t>(width) * sizeof(Rgba) + alignment;
    _block = std::make_unique_for_overwrite<unsigned char[]>(bytes);
    const std::uintptr_t start = reinterpret_cast<std::uintptr_t>(_block.get());
    const std::uintptr_t aligned = (start + alignment - 1) & ~(std::uintptr_t(alignment) - 1);
    _row = reinterpret_cast<Rgba*>(_block.get() + (aligned - start));
}

RsImageCreatorUtil::BackgroundWindow::BackgroundWindow(const IxReadGuard& background, const GeRectangle<int>& region)
    : left(region.x0), right(region.x1), top(region.y0), bottom(region.y0) {
    if (background.holdsTile()) {
        const GeRectangle<int>& b = background._rectangle;
        left = clampTo(b.x0, region.x0, region.x1);
        right = clampTo(b.x1, region.x0, region.x1);
        top = clampTo(b.y0, region.y0, region.y1);
        bottom = clampTo(b.y1, region.y0, region.y1);
    }
    leftPad = left - region.x0;
    rightPad = region.x1 - right;
}

void RsImageCreatorUtil::readBackground(const RowFunctions& table, const IxReadGuard& background,
                                        const BackgroundWindow& window, int y, Rgba* row, int width) {
    if (window.leftPad + window.rightPad >= width) return;
    const unsigned char* pixels = background._basePointer + std::ptrdiff_t(y) * background._rowStride +
                                  std::ptrdiff_t(window.left) * pixelBytes(background._pixelFormat);
    table._reader(pixels, row + window.leftPad, width - window.leftPad - window.rightPad);
}

void RsImageCreatorUtil::writeOutput(const RowFunctions& table, const IxWriteGuard& output, int x, int y,
                                     const Rgba* row, int count) {
    unsigned char* pixels = output._basePointer + std::ptrdiff_t(y) * output._rowStride +
                            std::ptrdiff_t(x) * pixelBytes(output._pixelFormat);
    table._writer(pixels, row, count);
}

}  // namespace Zr
