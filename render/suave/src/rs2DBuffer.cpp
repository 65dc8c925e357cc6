#include "rs2DBuffer.h"

#include <algorithm>

namespace Zr {

namespace {

constexpr const char* kSourceFile = "render\\suave\\src\\rs2DBuffer";

// The signed distance of v inside the limit of flag: at least 0 inside.
float distanceTo(const Rs2DVertex& v, int flag, float limit) {
    switch (flag) {
        case 1: return v._x - limit;
        case 2: return limit - v._x;
        case 4: return v._y - limit;
        default: return limit - v._y;
    }
}

}  // namespace

Rs2DBuffer::Rs2DBuffer(IxTile& tile, const Rgba& colour, bool blending)
    : _blending(blending),
      _color(colour),
      _tile(&tile),
      _guard(tile),
      _clip{static_cast<float>(_guard._rectangle.x0), static_cast<float>(_guard._rectangle.x1),
            static_cast<float>(_guard._rectangle.y0), static_cast<float>(_guard._rectangle.y1)},
      _vertices{},
      _polygon{},
      _scratch{},
      _rasterizer(*this, &Rs2DBuffer::drawSpan),
      _aaRasterizer(*this, &Rs2DBuffer::drawAASpan) {
    setBlending(blending);
}

void Rs2DBuffer::setBlending(bool blending) {
    _blending = blending;
    _fillSpan = Rs2DSpanWriter::selectFillSpan(_guard._pixelFormat, blending, kSourceFile);
    _fillAASpan = Rs2DSpanWriter::selectFillAASpan(_guard._pixelFormat, blending, kSourceFile);
}

void Rs2DBuffer::rasterizeUnclippedTriangle(const Rs2DVertex& a, const Rs2DVertex& b, const Rs2DVertex& c) {
    drawFan(_rasterizer, a, b, c);
}

void Rs2DBuffer::rasterizeUnclippedAATriangle(const Rs2DVertex& a, const Rs2DVertex& b, const Rs2DVertex& c) {
    drawFan(_aaRasterizer, a, b, c);
}

template <class R>
void Rs2DBuffer::drawFan(const R& rasterizer, const Rs2DVertex& a, const Rs2DVertex& b, const Rs2DVertex& c) {
    const int count = clipTriangle(a, b, c);
    const Context context;
    for (int i = 1; i + 1 < count; ++i)
        rasterizer.rasterizeTriangle(context, *_polygon[0], *_polygon[i], *_polygon[i + 1]);
}

int Rs2DBuffer::clipTriangle(const Rs2DVertex& a, const Rs2DVertex& b, const Rs2DVertex& c) {
    _vertices[0] = a;
    _vertices[1] = b;
    _vertices[2] = c;
    for (int i = 0; i < 3; ++i) _polygon[i] = &_vertices[i];
    int count = 3;
    if (_clip._flags == 0) return count;
    int made = 3;
    for (int flag = 1; flag <= 8 && count >= 3; flag <<= 1)
        if ((_clip._flags & flag) != 0) count = clipAgainst(flag, count, made);
    return count < 3 ? 0 : count;
}

int Rs2DBuffer::clipAgainst(int flag, int count, int& made) {
    const float limit = flag == 1 ? _clip._xMin : flag == 2 ? _clip._xMax : flag == 4 ? _clip._yMin : _clip._yMax;
    int out = 0;
    const Rs2DVertex* prev = _polygon[count - 1];
    float prevDistance = distanceTo(*prev, flag, limit);
    for (int i = 0; i < count; ++i) {
        const Rs2DVertex* cur = _polygon[i];
        const float curDistance = distanceTo(*cur, flag, limit);
        // A convex polygon crosses a limit twice at most; the bounds only keep rounding in the
        // crossings from ever writing past the arrays.
        if (prevDistance * curDistance < 0.0f && made < kMaxVertices && out < kMaxPolygon) {
            // The crossing, mixed in double and put exactly on the limit, so that rounding cannot
            // leave it outside.
            const double t = static_cast<double>(prevDistance) / (static_cast<double>(prevDistance) - curDistance);
            Rs2DVertex& crossing = _vertices[static_cast<std::size_t>(made++)];
            crossing._x = static_cast<float>(prev->_x + t * (static_cast<double>(cur->_x) - prev->_x));
            crossing._y = static_cast<float>(prev->_y + t * (static_cast<double>(cur->_y) - prev->_y));
            (flag <= 2 ? crossing._x : crossing._y) = limit;
            _scratch[static_cast<std::size_t>(out++)] = &crossing;
        }
        if (curDistance >= 0.0f && out < kMaxPolygon) _scratch[static_cast<std::size_t>(out++)] = cur;
        prev = cur;
        prevDistance = curDistance;
    }
    std::copy_n(_scratch.begin(), out, _polygon.begin());
    return out;
}

void Rs2DBuffer::drawSpan(const Context&, int row, const RsPixelSpan<0, 0>& span, RsPixelData<Rs2DVertex>&) {
    const GeRectangle<int>& r = _guard._rectangle;
    _fillSpan(_guard, row + r.y0, span._x1 + r.x0, span._x2 + r.x0, _color);
}

void Rs2DBuffer::drawAASpan(const Context&, int row, const RsPixelSpan<3, 2>& span, RsPixelData<Rs2DVertex>&) {
    // Rows of sub-pixel spans come out near half their place, and above the tile for a tall
    // triangle: only those inside it are written.
    const int y = row + _guard._rectangle.y0;
    if (y < _guard._rectangle.y0 || y >= _guard._rectangle.y1) return;
    _fillAASpan(_guard, y, span, _color);
}

void Rs2DBuffer::dump(std::ostream& os) const {
    os << " _blending: " << _blending << " _color:";
    _color.dump(os);
    os << " _tile: " << static_cast<const void*>(_tile) << " _clip: " << _clip._xMin << " " << _clip._xMax << " "
       << _clip._yMin << " " << _clip._yMax << " " << _clip._flags;
}

}  // namespace Zr
