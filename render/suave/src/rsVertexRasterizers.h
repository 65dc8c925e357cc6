#pragma once
// The rasterizers of a region buffer, one per vertex kind (plain, with normals, with a tangent
// frame), each calling the buffer's span method for its kind over the buffer's pixels.
#include <type_traits>

#include "geRectangle.h"
#include "rsRasterizer.h"
#include "rsVertices.h"

namespace Zr {

template <class Buffer, class Span>
class RsVertexRasterizers {
public:
    template <class Vertex>
    using Rasterizer = RsRasterizer<Buffer, Vertex, Span>;

    RsVertexRasterizers(Buffer& buffer, typename Rasterizer<RsPlainVertex>::DrawSpan plain,
                        typename Rasterizer<RsNormalVertex>::DrawSpan normal,
                        typename Rasterizer<RsTangentVertex>::DrawSpan tangent, const GeRectangle<int>& region)
        : _plain(buffer, plain, region), _normal(buffer, normal, region), _tangent(buffer, tangent, region) {}

    // The rasterizer of a vertex kind: RsPlainVertex, RsNormalVertex or RsTangentVertex.
    template <class Vertex>
    const Rasterizer<Vertex>& get() const {
        if constexpr (std::is_same_v<Vertex, RsPlainVertex>) return _plain;
        else if constexpr (std::is_same_v<Vertex, RsNormalVertex>) return _normal;
        else {
            static_assert(std::is_same_v<Vertex, RsTangentVertex>, "no rasterizer for this vertex kind");
            return _tangent;
        }
    }

private:
    Rasterizer<RsPlainVertex> _plain;
    Rasterizer<RsNormalVertex> _normal;
    Rasterizer<RsTangentVertex> _tangent;
};

}  // namespace Zr
