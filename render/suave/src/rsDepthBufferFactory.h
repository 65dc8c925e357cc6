#pragma once
// What the factories of the two depth buffers (RsZBufferFactory, RsMZBufferFactory) share: the
// shape of the region renderer's factories, over a caller's array of depths.
//
// A depth map is drawn as one region: getMaxArea is the whole map, so that the region renderer
// never cuts it, and createBuffer refuses any region but the whole map, testing its four sides in
// the order x start, y start, x end, y end.
#include <ostream>

#include "assertions.h"
#include "geRectangle.h"

namespace Zr {

template <class BufferType>
class RsDepthBufferFactory {
public:
    using Buffer = BufferType;

    RsDepthBufferFactory(const RsDepthBufferFactory&) = delete;
    RsDepthBufferFactory& operator=(const RsDepthBufferFactory&) = delete;

    // The map: width x height doubles, row by row, which the buffer fills.
    void setOutput(int width, int height, double* depth) {
        _width = width;
        _height = height;
        _depth = depth;
    }

    int getKernelSize() const { return 0; }
    int getMaxArea() const { return _width * _height; }
    GeRectangle<int> getPixelRegion() const { return {0, _width, 0, _height}; }

    // A new buffer over the whole map; the caller takes it over.
    Buffer* createBuffer(const GeRectangle<int>& region) const {
        if (!(region.x0 == 0)) Assertions::throwAssertionFailed(_sourceFile, __LINE__, "region.x1() == 0");
        if (!(region.y0 == 0)) Assertions::throwAssertionFailed(_sourceFile, __LINE__, "region.y1() == 0");
        if (!(region.x1 == _width)) Assertions::throwAssertionFailed(_sourceFile, __LINE__, "region.x2() == _width");
        if (!(region.y1 == _height))
            Assertions::throwAssertionFailed(_sourceFile, __LINE__, "region.y2() == _height");
        return new Buffer(_width, _height, _depth);
    }

    void dump(std::ostream& os) const {
        os << " _width: " << _width << " _height: " << _height << " _depth: " << static_cast<const void*>(_depth);
    }

protected:
    explicit RsDepthBufferFactory(const char* sourceFile) : _sourceFile(sourceFile) {}

private:
    int _width = 0;
    int _height = 0;
    double* _depth = nullptr;
    const char* _sourceFile;
};

}  // namespace Zr
