#include "peer_gl.h"

#define GL_GLEXT_PROTOTYPES 1
#include <GL/osmesa.h>

#include <algorithm>
#include <cstddef>
#include <numeric>
#include <stdexcept>
#include <unordered_map>

#include "geAffineMatrix3.h"
#include "geProjectiveMatrix3.h"
#include "geVector3.h"
#include "rsMaterialShader.h"
#include "sdCamera.h"
#include "sdMesh.h"

namespace Zr {

namespace {

// The zrender host's ZrDiffuseShader: one light fixed in eye space and a constant ambient share.
// Kept equal to it by hand.
const GeVector3<float> lightDirection = GeVector3<float>(-0.4f, 0.6f, 0.7f).getNormalized();
constexpr float ambientShare = 0.25f;

// Per corner: the object-space position, the object-space normal, and the corner's weight of each
// of the face's three corners (1 for itself), from which wire faces measure their edges.
constexpr int kFloatsPerVertex = 9;

const char* const kVertexShader = R"(#version 130
uniform mat4 toCamera;
uniform mat4 projection;
uniform mat3 normalMatrix;
in vec3 position;
in vec3 normal;
in vec3 corner;
out vec3 eyeNormal;
noperspective out vec3 cornerWeights;
void main() {
    eyeNormal = normalMatrix * normal;
    cornerWeights = corner;
    gl_Position = projection * (toCamera * vec4(position, 1.0));
}
)";

// The colour is straight, as the host's shader returns it; the screen mode takes it premultiplied
// by the opacity, for the blend function to lay it over what is drawn. A wire face keeps only the
// pixels within wireSize pixels of an edge: a corner weight falls linearly to 0 on the opposite
// edge, so the weight over its screen gradient is the distance to that edge in pixels.
const char* const kFragmentShader = R"(#version 130
uniform vec3 diffuse;
uniform float opacity;
uniform bool premultiply;
uniform float wireSize;
uniform vec3 lightDirection;
uniform float ambientShare;
in vec3 eyeNormal;
noperspective in vec3 cornerWeights;
void main() {
    if (wireSize > 0.0) {
        vec3 gradient = sqrt(dFdx(cornerWeights) * dFdx(cornerWeights) + dFdy(cornerWeights) * dFdy(cornerWeights));
        vec3 distance = cornerWeights / max(gradient, vec3(1e-20));
        if (min(distance.x, min(distance.y, distance.z)) >= wireSize) discard;
    }
    vec3 n = normalize(gl_FrontFacing ? eyeNormal : -eyeNormal);
    float light = ambientShare + (1.0 - ambientShare) * max(0.0, dot(n, lightDirection));
    vec3 colour = diffuse * light;
    gl_FragColor = premultiply ? vec4(colour * opacity, opacity) : vec4(colour, opacity);
}
)";

OSMesaContext osmesa(void* context) { return static_cast<OSMesaContext>(context); }

// Throws with GL's log when the status of a shader or program (its query and log functions given)
// is not true.
template <class GetStatus, class GetLog>
void requireSuccess(GLuint object, GLenum status, GetStatus getStatus, GetLog getLog, const char* what) {
    GLint ok = GL_FALSE;
    getStatus(object, status, &ok);
    if (ok == GL_TRUE) return;
    char log[2048] = {};
    getLog(object, sizeof log, nullptr, log);
    throw std::runtime_error(std::string("peer: ") + what + ": " + log);
}

unsigned int compileShader(GLenum kind, const char* source) {
    const GLuint shader = glCreateShader(kind);
    glShaderSource(shader, 1, &source, nullptr);
    glCompileShader(shader);
    requireSuccess(shader, GL_COMPILE_STATUS, glGetShaderiv, glGetShaderInfoLog, "shader does not compile");
    return shader;
}

void checkGl(const char* what) {
    const GLenum error = glGetError();
    if (error != GL_NO_ERROR)
        throw std::runtime_error(std::string("peer: GL error ") + std::to_string(error) + " in " + what);
}

}  // namespace

PeerContext::PeerContext() {
    const int attributes[] = {OSMESA_FORMAT, OSMESA_RGBA,  OSMESA_DEPTH_BITS, 24, OSMESA_STENCIL_BITS, 0,
                              OSMESA_ACCUM_BITS, 0, OSMESA_PROFILE, OSMESA_COMPAT_PROFILE,
                              OSMESA_CONTEXT_MAJOR_VERSION, 3, OSMESA_CONTEXT_MINOR_VERSION, 0, 0};
    _context = OSMesaCreateContextAttribs(attributes, nullptr);
    if (_context == nullptr) throw std::runtime_error("peer: OSMesa cannot make a GL 3.0 context");
    resize(16, 16);

    const GLuint vertex = compileShader(GL_VERTEX_SHADER, kVertexShader);
    const GLuint fragment = compileShader(GL_FRAGMENT_SHADER, kFragmentShader);
    _program = glCreateProgram();
    glAttachShader(_program, vertex);
    glAttachShader(_program, fragment);
    glBindAttribLocation(_program, 0, "position");
    glBindAttribLocation(_program, 1, "normal");
    glBindAttribLocation(_program, 2, "corner");
    glLinkProgram(_program);
    glDeleteShader(vertex);
    glDeleteShader(fragment);
    requireSuccess(_program, GL_LINK_STATUS, glGetProgramiv, glGetProgramInfoLog, "shader program does not link");
    const auto at = [this](const char* name) { return glGetUniformLocation(_program, name); };
    _uniforms = {at("toCamera"), at("projection"),     at("normalMatrix"),   at("diffuse"),    at("opacity"),
                 at("premultiply"), at("wireSize"), at("lightDirection"), at("ambientShare")};
    glUseProgram(_program);
    glUniform3f(_uniforms.lightDirection, lightDirection.x, lightDirection.y, lightDirection.z);
    glUniform1f(_uniforms.ambientShare, ambientShare);
    checkGl("making the shader program");
}

PeerContext::~PeerContext() {
    if (_program != 0) glDeleteProgram(_program);
    OSMesaDestroyContext(osmesa(_context));
}

void PeerContext::resize(int width, int height) {
    _pixels.assign(static_cast<std::size_t>(width) * static_cast<std::size_t>(height) * 4, 0);
    if (!OSMesaMakeCurrent(osmesa(_context), _pixels.data(), GL_UNSIGNED_BYTE, width, height))
        throw std::runtime_error("peer: OSMesa cannot draw into a buffer of that size");
    _width = width;
    _height = height;
    glViewport(0, 0, width, height);
}

std::string PeerContext::describe() const {
    const auto text = [](GLenum name) {
        const GLubyte* s = glGetString(name);
        return s != nullptr ? std::string(reinterpret_cast<const char*>(s)) : std::string("?");
    };
    return text(GL_RENDERER) + ", OpenGL " + text(GL_VERSION);
}

PeerScene::PeerScene(PeerContext& context, const RsScene& scene, const SdInstance& camera) : _context(&context) {
    const SdCamera* sdCamera = dynamic_cast<const SdCamera*>(camera.getObject().get());
    if (sdCamera == nullptr) throw std::runtime_error("peer: the camera instance holds no camera");
    // The render call's view: world to camera from the camera's placement, the projection in
    // double rounded to float, as the renderer's pixel matrix takes it.
    const GeAffineMatrix3<float> worldToCamera = camera.getMatrix().computeInverse();
    GeProjectiveMatrix3<double> projection;
    sdCamera->computeProjection(projection);
    const GeProjectiveMatrix3<float> projectionFloat(projection);
    std::copy(std::begin(projectionFloat._m), std::end(projectionFloat._m), _projection);

    for (const RCShdPtr<RsGeomInstance>& pointer : scene._geomInstances) {
        const RsGeomInstance& geom = *pointer;
        if (!geom._visible) continue;
        const SdMesh& mesh = *geom._mesh;
        if (!mesh.hasDerivedData()) throw std::runtime_error("peer: a mesh without normals");
        const std::size_t materialCount = geom._materials.size();
        if (mesh.getFaceGroupCount() != 0 && materialCount == 0)
            throw std::runtime_error("peer: an instance without materials");

        Instance instance;
        const GeAffineMatrix3<float> toCamera = worldToCamera * geom._matrix;
        std::copy(std::begin(toCamera._m), std::end(toCamera._m), instance.toCamera);
        // The inverse transpose of the linear part, column after column.
        const GeAffineMatrix3<float> inverse = toCamera.computeInverse();
        for (int row = 0; row < 3; ++row)
            for (int col = 0; col < 3; ++col) instance.normalMatrix[col * 3 + row] = inverse(col, row);
        GeAlignedBox3<float> box;
        mesh.getBoundingBox(box);
        instance.depth = toCamera.transformPoint(box.getCenter()).z;
        instance.front = geom._drawFrontFaces;
        instance.back = geom._drawBackFaces;

        // One GL vertex per distinct (position, normal) pair of the faces; per corner as well
        // when some face group is drawn as wires, whose corner weights differ at a shared vertex.
        bool wires = false;
        for (unsigned int g = 0; g < mesh.getFaceGroupCount(); ++g)
            wires = wires || geom._materials[g % materialCount]->isWireframe();
        std::vector<float> vertices;
        std::unordered_map<std::uint64_t, GLuint> vertexOf;
        const auto vertexFor = [&](const SdMesh::Face& face, int corner) {
            const std::uint64_t key = (std::uint64_t{face.getVertexIndex(corner)} << 34) |
                                      (std::uint64_t{face.getNormalIndex(corner)} << 2) |
                                      static_cast<std::uint64_t>(wires ? corner : 0);
            const auto [it, added] = vertexOf.try_emplace(key, static_cast<GLuint>(vertices.size() / kFloatsPerVertex));
            if (added) {
                const GePoint3<float>& p = face.getVertex(corner);
                const GeVector3<float>& n = mesh.getNormal(face.getNormalIndex(corner));
                const float w[3] = {corner == 0 ? 1.0f : 0.0f, corner == 1 ? 1.0f : 0.0f, corner == 2 ? 1.0f : 0.0f};
                vertices.insert(vertices.end(), {p.x, p.y, p.z, n.x, n.y, n.z});
                vertices.insert(vertices.end(), w, w + 3);
            }
            return it->second;
        };

        std::vector<GLuint> indices;
        for (unsigned int g = 0; g < mesh.getFaceGroupCount(); ++g) {
            const SdMeshTypes::FaceGroup& faceGroup = mesh.getFaceGroup(g);
            const RsMaterialShader& shader = *geom._materials[g % materialCount];
            const SdMaterial& material = *shader.getMaterial();
            const SdMaterial::TransferMode mode = shader.getTransferMode();
            if (mode != SdMaterial::TransferMode::normal && mode != SdMaterial::TransferMode::screen)
                throw std::runtime_error("peer: only the normal and screen transfer modes are drawn");
            if (shader.isWireframe() && !shader.isScreenSpace())
                throw std::runtime_error("peer: only screen-space wires are drawn");

            Group group{};
            group.firstIndex = indices.size();
            group.diffuse[0] = material._diffuse.r;
            group.diffuse[1] = material._diffuse.g;
            group.diffuse[2] = material._diffuse.b;
            group.opacity = material._opacity;
            group.screen = mode == SdMaterial::TransferMode::screen;
            group.transparent = group.screen || material._opacity != 1.0f;
            // The renderer draws screen-space wires three quarters of the material's size wide.
            group.wireSize = shader.isWireframe() ? shader.getWireSize() * 0.75f : 0.0f;

            const unsigned int end = std::min(faceGroup._firstFace + faceGroup._faceCount, mesh.getFaceCount());
            std::vector<unsigned int> faces(end - std::min(faceGroup._firstFace, end));
            std::iota(faces.begin(), faces.end(), faceGroup._firstFace);
            if (group.transparent) {
                // Far to near by the camera depth of each face's centroid.
                std::vector<float> depth(faces.size());
                for (std::size_t i = 0; i < faces.size(); ++i) {
                    const SdMesh::Face face = mesh.getFace(faces[i]);
                    float z = 0.0f;
                    for (int c = 0; c < 3; ++c) z += toCamera.transformPoint(face.getVertex(c)).z;
                    depth[i] = z;
                }
                std::vector<std::size_t> order(faces.size());
                std::iota(order.begin(), order.end(), std::size_t{0});
                std::stable_sort(order.begin(), order.end(),
                                 [&](std::size_t a, std::size_t b) { return depth[a] < depth[b]; });
                std::vector<unsigned int> sorted(faces.size());
                for (std::size_t i = 0; i < order.size(); ++i) sorted[i] = faces[order[i]];
                faces.swap(sorted);
            }
            for (const unsigned int f : faces) {
                const SdMesh::Face face = mesh.getFace(f);
                for (int c = 0; c < 3; ++c) indices.push_back(vertexFor(face, c));
            }
            group.indexCount = static_cast<int>(indices.size() - group.firstIndex);
            instance.groups.push_back(group);
        }

        glGenVertexArrays(1, &instance.arrays);
        glBindVertexArray(instance.arrays);
        glGenBuffers(1, &instance.vertexBuffer);
        glBindBuffer(GL_ARRAY_BUFFER, instance.vertexBuffer);
        glBufferData(GL_ARRAY_BUFFER, static_cast<GLsizeiptr>(vertices.size() * sizeof(float)), vertices.data(),
                     GL_STATIC_DRAW);
        const GLsizei stride = kFloatsPerVertex * sizeof(float);
        for (GLuint a = 0; a < 3; ++a) {
            glEnableVertexAttribArray(a);
            glVertexAttribPointer(a, 3, GL_FLOAT, GL_FALSE, stride,
                                  reinterpret_cast<const void*>(static_cast<std::uintptr_t>(a * 3 * sizeof(float))));
        }
        glGenBuffers(1, &instance.indexBuffer);
        glBindBuffer(GL_ELEMENT_ARRAY_BUFFER, instance.indexBuffer);
        glBufferData(GL_ELEMENT_ARRAY_BUFFER, static_cast<GLsizeiptr>(indices.size() * sizeof(GLuint)), indices.data(),
                     GL_STATIC_DRAW);
        glBindVertexArray(0);
        _instances.push_back(std::move(instance));
        checkGl("loading an instance");
    }

    _farToNear.resize(_instances.size());
    std::iota(_farToNear.begin(), _farToNear.end(), std::size_t{0});
    std::stable_sort(_farToNear.begin(), _farToNear.end(),
                     [this](std::size_t a, std::size_t b) { return _instances[a].depth < _instances[b].depth; });
}

PeerScene::~PeerScene() {
    for (Instance& instance : _instances) {
        glDeleteBuffers(1, &instance.indexBuffer);
        glDeleteBuffers(1, &instance.vertexBuffer);
        glDeleteVertexArrays(1, &instance.arrays);
    }
}

void PeerScene::draw(const CoRgbaColorTyped<float>& fill) {
    const PeerContext::Uniforms& u = _context->_uniforms;
    glUseProgram(_context->_program);
    glUniformMatrix4fv(u.projection, 1, GL_FALSE, _projection);
    // Depth writes on before the clear: the blended pass of the last frame left them off.
    glDepthMask(GL_TRUE);
    glClearColor(fill.r, fill.g, fill.b, fill.a);
    glClear(GL_COLOR_BUFFER_BIT | GL_DEPTH_BUFFER_BIT);

    // Opaque faces: the nearest fragment wins; one at the depth of an earlier one loses.
    glEnable(GL_DEPTH_TEST);
    glDepthFunc(GL_LESS);
    glDisable(GL_BLEND);
    for (const Instance& instance : _instances) drawGroups(instance, false);

    // Transparent faces over them, far to near, hidden by the opaque ones but hiding nothing.
    glEnable(GL_BLEND);
    glDepthMask(GL_FALSE);
    for (const std::size_t i : _farToNear) drawGroups(_instances[i], true);
    glFinish();
}

void PeerScene::drawGroups(const Instance& instance, bool transparent) {
    if (!instance.front && !instance.back) return;
    const PeerContext::Uniforms& u = _context->_uniforms;
    bool bound = false;
    for (const Group& group : instance.groups) {
        if (group.transparent != transparent || group.indexCount == 0) continue;
        if (!bound) {
            bound = true;
            glBindVertexArray(instance.arrays);
            glUniformMatrix4fv(u.toCamera, 1, GL_FALSE, instance.toCamera);
            glUniformMatrix3fv(u.normalMatrix, 1, GL_FALSE, instance.normalMatrix);
            if (instance.front && instance.back) {
                glDisable(GL_CULL_FACE);
            } else {
                glEnable(GL_CULL_FACE);
                glCullFace(instance.front ? GL_BACK : GL_FRONT);
            }
        }
        glUniform3fv(u.diffuse, 1, group.diffuse);
        glUniform1f(u.opacity, group.opacity);
        glUniform1i(u.premultiply, group.screen ? 1 : 0);
        glUniform1f(u.wireSize, group.wireSize);
        // normal: s * a + d * (1 - a); screen, with s premultiplied: s + d * (1 - s).
        if (group.screen)
            glBlendFuncSeparate(GL_ONE, GL_ONE_MINUS_SRC_COLOR, GL_ONE, GL_ONE_MINUS_SRC_ALPHA);
        else
            glBlendFuncSeparate(GL_SRC_ALPHA, GL_ONE_MINUS_SRC_ALPHA, GL_ONE, GL_ONE_MINUS_SRC_ALPHA);
        glDrawElements(GL_TRIANGLES, group.indexCount, GL_UNSIGNED_INT,
                       reinterpret_cast<const void*>(static_cast<std::uintptr_t>(group.firstIndex * sizeof(GLuint))));
    }
    if (bound) glBindVertexArray(0);
}

}  // namespace Zr
