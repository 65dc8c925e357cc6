#include "zrShapes.h"

#include <cmath>
#include <cstdint>
#include <numbers>
#include <vector>

#include "assertions.h"
#include "sdMeshBuilder.h"

namespace Zr {

namespace {

constexpr const char* kSourceFile = "tools\\sample\\zrShapes";

struct MeshArrays {
    std::vector<GePoint3<float>> vertices;
    std::vector<GeVector3<float>> normals;
    std::vector<std::uint32_t> triangles;

    std::uint32_t addVertex(double x, double y, double z, double nx, double ny, double nz) {
        vertices.push_back({static_cast<float>(x), static_cast<float>(y), static_cast<float>(z)});
        normals.push_back({static_cast<float>(nx), static_cast<float>(ny), static_cast<float>(nz)});
        return static_cast<std::uint32_t>(vertices.size() - 1);
    }
    void addTriangle(std::uint32_t a, std::uint32_t b, std::uint32_t c) {
        triangles.insert(triangles.end(), {a, b, c});
    }
    // a, b, c, d counter-clockwise seen from outside.
    void addQuad(std::uint32_t a, std::uint32_t b, std::uint32_t c, std::uint32_t d) {
        addTriangle(a, b, c);
        addTriangle(a, c, d);
    }
    SdMeshBuilder& fill(SdMeshBuilder& builder) {
        return builder.setVertices(std::move(vertices)).setTriangles(std::move(triangles)).setNormals(std::move(normals));
    }
};

constexpr double twoPi = 2.0 * std::numbers::pi;

}  // namespace

RCShdPtr<const SdMesh> ZrShapes::makeGrid(float size, unsigned int cells, bool checker) {
    ZR_ASSERT_AT(cells > 0, kSourceFile, __LINE__);
    MeshArrays mesh;
    const double step = static_cast<double>(size) / cells;
    const double origin = -0.5 * static_cast<double>(size);
    for (unsigned int j = 0; j <= cells; ++j)
        for (unsigned int i = 0; i <= cells; ++i) mesh.addVertex(origin + i * step, 0.0, origin + j * step, 0, 1, 0);

    // Seen from +y, increasing z then increasing x turns counter-clockwise.
    const std::uint32_t row = cells + 1;
    for (int colour = 0; colour < (checker ? 2 : 1); ++colour) {
        for (unsigned int j = 0; j < cells; ++j) {
            for (unsigned int i = 0; i < cells; ++i) {
                if (checker && static_cast<int>((i + j) % 2) != colour) continue;
                const std::uint32_t corner = j * row + i;
                mesh.addQuad(corner, corner + row, corner + row + 1, corner + 1);
            }
        }
    }
    // Texture coordinates count cells, so that a repeating map covers each cell once.
    std::vector<GePoint3<float>> texCoords;
    for (unsigned int j = 0; j <= cells; ++j)
        for (unsigned int i = 0; i <= cells; ++i) texCoords.push_back({float(i), float(j), 0.0f});
    SdMeshBuilder builder;
    mesh.fill(builder).addTextureChannel(std::move(texCoords));
    if (checker && cells > 1) {
        const unsigned int faces = 2 * cells * cells;
        const unsigned int white = 2 * ((cells * cells + 1) / 2);
        builder.addFaceGroup(white).addFaceGroup(faces - white);
    }
    return builder.build();
}

RCShdPtr<const SdMesh> ZrShapes::makeSphere(float radius, unsigned int slices, unsigned int stacks) {
    ZR_ASSERT_AT(slices >= 3 && stacks >= 2, kSourceFile, __LINE__);
    MeshArrays mesh;
    const double r = radius;
    const std::uint32_t top = mesh.addVertex(0, r, 0, 0, 1, 0);
    // Rings of the parallels between the poles, each with slices vertices.
    for (unsigned int k = 1; k < stacks; ++k) {
        const double polar = std::numbers::pi * k / stacks;
        for (unsigned int s = 0; s < slices; ++s) {
            const double azimuth = twoPi * s / slices;
            const double nx = std::sin(polar) * std::cos(azimuth);
            const double ny = std::cos(polar);
            const double nz = -std::sin(polar) * std::sin(azimuth);
            mesh.addVertex(r * nx, r * ny, r * nz, nx, ny, nz);
        }
    }
    const std::uint32_t bottom = mesh.addVertex(0, -r, 0, 0, -1, 0);

    // With z = -sin(azimuth), the azimuth turns counter-clockwise seen from +y.
    auto ringVertex = [&](unsigned int k, unsigned int s) { return 1 + (k - 1) * slices + s % slices; };
    for (unsigned int s = 0; s < slices; ++s) {
        mesh.addTriangle(top, ringVertex(1, s), ringVertex(1, s + 1));
        for (unsigned int k = 1; k + 1 < stacks; ++k)
            mesh.addQuad(ringVertex(k, s), ringVertex(k + 1, s), ringVertex(k + 1, s + 1), ringVertex(k, s + 1));
        mesh.addTriangle(bottom, ringVertex(stacks - 1, s + 1), ringVertex(stacks - 1, s));
    }
    SdMeshBuilder builder;
    return mesh.fill(builder).build();
}

RCShdPtr<const SdMesh> ZrShapes::makeTorus(float majorRadius, float minorRadius, unsigned int rings,
                                           unsigned int sides) {
    ZR_ASSERT_AT(rings >= 3 && sides >= 3, kSourceFile, __LINE__);
    MeshArrays mesh;
    for (unsigned int i = 0; i < rings; ++i) {
        const double u = twoPi * i / rings;
        const double cu = std::cos(u), su = -std::sin(u);
        for (unsigned int j = 0; j < sides; ++j) {
            const double v = twoPi * j / sides;
            const double cv = std::cos(v), sv = std::sin(v);
            const double reach = majorRadius + minorRadius * cv;
            mesh.addVertex(reach * cu, minorRadius * sv, reach * su, cv * cu, sv, cv * su);
        }
    }
    auto vertex = [&](unsigned int i, unsigned int j) { return (i % rings) * sides + j % sides; };
    for (unsigned int i = 0; i < rings; ++i)
        for (unsigned int j = 0; j < sides; ++j)
            mesh.addQuad(vertex(i, j), vertex(i + 1, j), vertex(i + 1, j + 1), vertex(i, j + 1));
    SdMeshBuilder builder;
    return mesh.fill(builder).build();
}

RCShdPtr<const SdMesh> ZrShapes::makeCube(float halfSize) {
    MeshArrays mesh;
    const double h = halfSize;
    // Per face: the normal n and two edge directions a, b with a x b = n, so that the corners
    // n + (-a - b), n + (a - b), n + (a + b), n + (-a + b) run counter-clockwise seen from outside.
    const int faces[6][3][3] = {
        {{1, 0, 0}, {0, 1, 0}, {0, 0, 1}},  {{-1, 0, 0}, {0, 0, 1}, {0, 1, 0}},
        {{0, 1, 0}, {0, 0, 1}, {1, 0, 0}},  {{0, -1, 0}, {1, 0, 0}, {0, 0, 1}},
        {{0, 0, 1}, {1, 0, 0}, {0, 1, 0}},  {{0, 0, -1}, {0, 1, 0}, {1, 0, 0}},
    };
    for (const auto& f : faces) {
        const int(&n)[3] = f[0];
        const int(&a)[3] = f[1];
        const int(&b)[3] = f[2];
        std::uint32_t corner[4];
        const int signs[4][2] = {{-1, -1}, {1, -1}, {1, 1}, {-1, 1}};
        for (int c = 0; c < 4; ++c) {
            const int sa = signs[c][0], sb = signs[c][1];
            corner[c] = mesh.addVertex(h * (n[0] + sa * a[0] + sb * b[0]), h * (n[1] + sa * a[1] + sb * b[1]),
                                       h * (n[2] + sa * a[2] + sb * b[2]), n[0], n[1], n[2]);
        }
        mesh.addQuad(corner[0], corner[1], corner[2], corner[3]);
    }
    SdMeshBuilder builder;
    return mesh.fill(builder).build();
}

}  // namespace Zr
