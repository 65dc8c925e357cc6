#include "zrModelFile.h"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cmath>
#include <filesystem>
#include <map>

#include <assimp/Importer.hpp>
#include <assimp/postprocess.h>
#include <assimp/scene.h>

#include "sdCamera.h"
#include "sdMaterial.h"
#include "sdMeshBuilder.h"
#include "sdMeshGeometry.h"
#include "sdStdLight.h"
#include "sdTextureParams.h"
#include "zrHostError.h"
#include "zrImageFile.h"
#include "zrSceneKit.h"

namespace Zr {

namespace {

using Colour = CoRgbColorTyped<float>;

std::string oneLine(std::string text) {
    std::replace(text.begin(), text.end(), '\n', ' ');
    while (!text.empty() && (text.back() == ' ' || text.back() == '\r')) text.pop_back();
    return text;
}

bool isFinite(const aiVector3D& v) { return std::isfinite(v.x) && std::isfinite(v.y) && std::isfinite(v.z); }

GeAffineMatrix3<double> toAffine(const aiMatrix4x4& m) {
    return GeAffineMatrix3<double>(m.a1, m.a2, m.a3, m.a4, m.b1, m.b2, m.b3, m.b4, m.c1, m.c2, m.c3, m.c4);
}

GePoint3<double> toPoint(const aiVector3D& v) { return {v.x, v.y, v.z}; }

// The value of a key track at time t (in ticks), held constant before the first and after the
// last key.
template <typename Key, typename Value, typename Blend>
Value sampleTrack(const Key* keys, unsigned int count, double t, Blend blend) {
    if (t <= keys[0].mTime || count == 1) return keys[0].mValue;
    for (unsigned int i = 1; i < count; ++i) {
        if (t <= keys[i].mTime) {
            const double span = keys[i].mTime - keys[i - 1].mTime;
            const float f = span > 0.0 ? static_cast<float>((t - keys[i - 1].mTime) / span) : 1.0f;
            return blend(keys[i - 1].mValue, keys[i].mValue, f);
        }
    }
    return keys[count - 1].mValue;
}

// The node's transform relative to its parent at time t (in ticks) of the animation channel,
// or its rest transform without one.
aiMatrix4x4 localTransform(const aiNode& node, const aiNodeAnim* channel, double t) {
    if (channel == nullptr) return node.mTransformation;
    aiVector3D restScale, restPosition;
    aiQuaternion restRotation;
    node.mTransformation.Decompose(restScale, restRotation, restPosition);
    const auto lerp = [](const aiVector3D& a, const aiVector3D& b, float f) { return a + (b - a) * f; };
    const auto slerp = [](const aiQuaternion& a, const aiQuaternion& b, float f) {
        aiQuaternion out;
        aiQuaternion::Interpolate(out, a, b, f);
        return out.Normalize();
    };
    const aiVector3D position = channel->mNumPositionKeys
        ? sampleTrack<aiVectorKey, aiVector3D>(channel->mPositionKeys, channel->mNumPositionKeys, t, lerp)
        : restPosition;
    const aiQuaternion rotation = channel->mNumRotationKeys
        ? sampleTrack<aiQuatKey, aiQuaternion>(channel->mRotationKeys, channel->mNumRotationKeys, t, slerp)
        : restRotation;
    const aiVector3D scale = channel->mNumScalingKeys
        ? sampleTrack<aiVectorKey, aiVector3D>(channel->mScalingKeys, channel->mNumScalingKeys, t, lerp)
        : restScale;
    return aiMatrix4x4(scale, rotation, position);
}

float shininessOfExponent(float exponent) {
    // The lighting model's exponent is 2^(10 s).
    if (!(exponent > 1.0f)) return 0.0f;
    return std::clamp(std::log2(exponent) / 10.0f, 0.0f, 1.0f);
}

Colour colourOf(const aiMaterial& material, const char* key, unsigned int type, unsigned int index,
                const Colour& fallback) {
    aiColor3D c;
    if (material.Get(key, type, index, c) != AI_SUCCESS || !std::isfinite(c.r + c.g + c.b)) return fallback;
    return {c.r, c.g, c.b};
}

// Some of the importer's parsers print their complaints to the standard streams on their own;
// the reason a file is refused comes back through the importer's error string, so while it reads,
// what it prints goes nowhere and the user sees one line.
class QuietStandardStreams {
public:
    QuietStandardStreams() {
        std::fflush(stdout);
        std::fflush(stderr);
        const int null = ::open("/dev/null", O_WRONLY | O_CLOEXEC);
        if (null < 0) return;
        _saved[0] = ::dup(STDOUT_FILENO);
        _saved[1] = ::dup(STDERR_FILENO);
        ::dup2(null, STDOUT_FILENO);
        ::dup2(null, STDERR_FILENO);
        ::close(null);
    }
    ~QuietStandardStreams() {
        std::fflush(stdout);
        std::fflush(stderr);
        for (int i = 0; i < 2; ++i) {
            if (_saved[i] < 0) continue;
            ::dup2(_saved[i], i == 0 ? STDOUT_FILENO : STDERR_FILENO);
            ::close(_saved[i]);
        }
    }
    QuietStandardStreams(const QuietStandardStreams&) = delete;
    QuietStandardStreams& operator=(const QuietStandardStreams&) = delete;

private:
    int _saved[2] = {-1, -1};
};

}  // namespace

void ZrModelFile::Bounds::add(const GePoint3<double>& p) {
    lo = {std::min(lo.x, p.x), std::min(lo.y, p.y), std::min(lo.z, p.z)};
    hi = {std::max(hi.x, p.x), std::max(hi.y, p.y), std::max(hi.z, p.z)};
}

struct ZrModelFile::Model {
    std::string path;
    Assimp::Importer importer;
    const aiScene* scene = nullptr;
    // Per Assimp mesh: ours (null for one left out) and its material.
    std::vector<RCShdPtr<const SdMesh>> meshes;
    std::vector<RCShdPtr<const SdMaterial>> materials;
    std::map<std::string, const aiNodeAnim*> channels;
    double ticksPerSecond = 25.0;
    std::vector<std::string> warnings;

    void warn(const std::string& what) { warnings.push_back(path + ": " + oneLine(what)); }

    RCShdPtr<const SdMesh> makeMesh(const aiMesh& mesh);
    RCShdPtr<const SdMaterial> makeMaterial(const aiMaterial& material);
    RCShdPtr<const SdTextureParams> readDiffuseMap(const aiMaterial& material);

    // The world transform of every node at time t (in ticks), by node.
    void placeNodes(const aiNode& node, const aiMatrix4x4& parent, double t,
                    std::map<const aiNode*, aiMatrix4x4>& world) const;
    std::map<const aiNode*, aiMatrix4x4> worldAt(double seconds) const {
        std::map<const aiNode*, aiMatrix4x4> world;
        placeNodes(*scene->mRootNode, aiMatrix4x4(), seconds * ticksPerSecond, world);
        return world;
    }
    const aiMatrix4x4& worldOfNamed(const std::map<const aiNode*, aiMatrix4x4>& world, const aiString& name) const {
        static const aiMatrix4x4 identity;
        const aiNode* node = scene->mRootNode->FindNode(name);
        const auto found = world.find(node);
        return found == world.end() ? identity : found->second;
    }
    Bounds boundsAt(const std::map<const aiNode*, aiMatrix4x4>& world) const;
};

RCShdPtr<const SdMesh> ZrModelFile::Model::makeMesh(const aiMesh& mesh) {
    const std::string name = mesh.mName.length ? "mesh \"" + std::string(mesh.mName.C_Str()) + "\"" : "a mesh";
    std::vector<std::uint32_t> indices;
    for (unsigned int f = 0; f < mesh.mNumFaces; ++f) {
        const aiFace& face = mesh.mFaces[f];
        if (face.mNumIndices != 3) continue;
        indices.insert(indices.end(), face.mIndices, face.mIndices + 3);
    }
    if (indices.empty()) return {};
    std::vector<GePoint3<float>> vertices(mesh.mNumVertices);
    for (unsigned int v = 0; v < mesh.mNumVertices; ++v) {
        if (!isFinite(mesh.mVertices[v])) {
            warn(name + " has positions that are not numbers: left out");
            return {};
        }
        vertices[v] = {mesh.mVertices[v].x, mesh.mVertices[v].y, mesh.mVertices[v].z};
    }
    SdMeshBuilder builder;
    builder.setVertices(std::move(vertices)).setTriangles(std::move(indices));
    if (mesh.HasNormals()) {
        std::vector<GeVector3<float>> normals(mesh.mNumVertices);
        bool finite = true;
        for (unsigned int v = 0; v < mesh.mNumVertices && finite; ++v) {
            finite = isFinite(mesh.mNormals[v]);
            normals[v] = {mesh.mNormals[v].x, mesh.mNormals[v].y, mesh.mNormals[v].z};
        }
        if (finite) builder.setNormals(std::move(normals));
    }
    if (mesh.HasTextureCoords(0)) {
        std::vector<GePoint3<float>> coordinates(mesh.mNumVertices);
        for (unsigned int v = 0; v < mesh.mNumVertices; ++v) {
            const aiVector3D& c = mesh.mTextureCoords[0][v];
            coordinates[v] = isFinite(c) ? GePoint3<float>{c.x, c.y, 0.0f} : GePoint3<float>{0.0f, 0.0f, 0.0f};
        }
        builder.addTextureChannel(std::move(coordinates));
    }
    return builder.build();
}

RCShdPtr<const SdTextureParams> ZrModelFile::Model::readDiffuseMap(const aiMaterial& material) {
    aiString file;
    if (material.GetTexture(aiTextureType_DIFFUSE, 0, &file) != AI_SUCCESS &&
        material.GetTexture(aiTextureType_BASE_COLOR, 0, &file) != AI_SUCCESS)
        return {};
    try {
        RCShdPtr<SdTexture> texture;
        if (const aiTexture* embedded = scene->GetEmbeddedTexture(file.C_Str())) {
            if (embedded->mHeight == 0) {
                texture = ZrImageFile::readTexture(std::string("embedded.") + embedded->achFormatHint,
                                                   embedded->pcData, embedded->mWidth);
            } else {
                texture = ZrImageFile::textureOfTexels(embedded->mWidth, embedded->mHeight, &embedded->pcData->b);
            }
        } else {
            std::string name = file.C_Str();
            std::replace(name.begin(), name.end(), '\\', '/');
            const std::filesystem::path where = std::filesystem::path(path).parent_path() / name;
            texture = ZrImageFile::readTexture(where.string());
        }
        return makeShared<SdTextureParams>(texture);
    } catch (const ZrHostError& e) {
        warn(std::string("texture left out: ") + e.what());
        return {};
    }
}

RCShdPtr<const SdMaterial> ZrModelFile::Model::makeMaterial(const aiMaterial& source) {
    RCShdPtr<SdMaterial> material = makeShared<SdMaterial>();
    Colour diffuse = colourOf(source, AI_MATKEY_COLOR_DIFFUSE, Colour{0.8f, 0.8f, 0.8f});
    aiColor4D base;
    if (source.Get(AI_MATKEY_BASE_COLOR, base) == AI_SUCCESS && std::isfinite(base.r + base.g + base.b))
        diffuse = {base.r, base.g, base.b};
    material->_diffuse = diffuse;
    // Files rarely give a useful ambient colour (often black or white): the surface's own colour
    // under ambient light is what a user expects unless one is set.
    material->_ambient = colourOf(source, AI_MATKEY_COLOR_AMBIENT, diffuse);
    if (material->_ambient.r + material->_ambient.g + material->_ambient.b <= 0.0f) material->_ambient = diffuse;
    float strength = 1.0f;
    if (source.Get(AI_MATKEY_SHININESS_STRENGTH, strength) != AI_SUCCESS || !std::isfinite(strength)) strength = 1.0f;
    const Colour specular = colourOf(source, AI_MATKEY_COLOR_SPECULAR, Colour{0.0f, 0.0f, 0.0f});
    material->_specular = {specular.r * strength, specular.g * strength, specular.b * strength};
    material->_emissive = colourOf(source, AI_MATKEY_COLOR_EMISSIVE, Colour{0.0f, 0.0f, 0.0f});
    float opacity = 1.0f;
    if (source.Get(AI_MATKEY_OPACITY, opacity) == AI_SUCCESS && std::isfinite(opacity))
        material->_opacity = std::clamp(opacity, 0.0f, 1.0f);
    float exponent = 0.0f;
    if (source.Get(AI_MATKEY_SHININESS, exponent) == AI_SUCCESS) material->_shininess = shininessOfExponent(exponent);
    material->_diffuseMap = readDiffuseMap(source);
    material->_name = source.GetName().C_Str();
    return material;
}

void ZrModelFile::Model::placeNodes(const aiNode& node, const aiMatrix4x4& parent, double t,
                                    std::map<const aiNode*, aiMatrix4x4>& world) const {
    const auto channel = channels.find(node.mName.C_Str());
    const aiMatrix4x4 here = parent * localTransform(node, channel == channels.end() ? nullptr : channel->second, t);
    world[&node] = here;
    for (unsigned int c = 0; c < node.mNumChildren; ++c) placeNodes(*node.mChildren[c], here, t, world);
}

ZrModelFile::Bounds ZrModelFile::Model::boundsAt(const std::map<const aiNode*, aiMatrix4x4>& world) const {
    Bounds bounds;
    for (const auto& [node, matrix] : world) {
        for (unsigned int i = 0; i < node->mNumMeshes; ++i) {
            const unsigned int m = node->mMeshes[i];
            if (m >= meshes.size() || !meshes[m]) continue;
            const aiMesh& mesh = *scene->mMeshes[m];
            for (unsigned int v = 0; v < mesh.mNumVertices; ++v) bounds.add(toPoint(matrix * mesh.mVertices[v]));
        }
    }
    return bounds;
}

ZrModelFile::ZrModelFile(const std::string& path) : _model(std::make_unique<Model>()) {
    Model& model = *_model;
    model.path = path;
    std::error_code error;
    if (!std::filesystem::is_regular_file(path, error)) throw ZrHostError(path + ": no such file (or not a file)");
    // Points and lines are sorted into meshes of their own and dropped: only triangles are drawn.
    model.importer.SetPropertyInteger(AI_CONFIG_PP_SBP_REMOVE, aiPrimitiveType_POINT | aiPrimitiveType_LINE);
    {
        const QuietStandardStreams quiet;
        model.scene = model.importer.ReadFile(
            path, aiProcess_Triangulate | aiProcess_JoinIdenticalVertices | aiProcess_SortByPType |
                      aiProcess_ValidateDataStructure | aiProcess_FindInvalidData | aiProcess_FindDegenerates);
    }
    if (model.scene == nullptr || model.scene->mRootNode == nullptr)
        throw ZrHostError(path + ": " + oneLine(model.importer.GetErrorString()));
    const aiScene& scene = *model.scene;

    for (unsigned int m = 0; m < scene.mNumMaterials; ++m) model.materials.push_back(model.makeMaterial(*scene.mMaterials[m]));
    bool anyTriangles = false;
    for (unsigned int m = 0; m < scene.mNumMeshes; ++m) {
        model.meshes.push_back(model.makeMesh(*scene.mMeshes[m]));
        anyTriangles = anyTriangles || model.meshes.back();
    }
    if (!anyTriangles) throw ZrHostError(path + ": the file holds no triangles to render");

    if (scene.mNumAnimations > 0) {
        const aiAnimation& animation = *scene.mAnimations[0];
        if (animation.mTicksPerSecond > 0.0) model.ticksPerSecond = animation.mTicksPerSecond;
        for (unsigned int c = 0; c < animation.mNumChannels; ++c) {
            const aiNodeAnim* channel = animation.mChannels[c];
            if (channel->mNumPositionKeys + channel->mNumRotationKeys + channel->mNumScalingKeys > 0)
                model.channels[channel->mNodeName.C_Str()] = channel;
        }
    }
}

ZrModelFile::~ZrModelFile() = default;

GePoint3<double> ZrModelFile::centreAt(double seconds) const {
    const Bounds bounds = _model->boundsAt(_model->worldAt(seconds));
    if (bounds.isEmpty()) return {0.0, 0.0, 0.0};
    return {(bounds.lo.x + bounds.hi.x) / 2, (bounds.lo.y + bounds.hi.y) / 2, (bounds.lo.z + bounds.hi.z) / 2};
}

const std::vector<std::string>& ZrModelFile::warnings() const { return _model->warnings; }

std::vector<std::string> ZrModelFile::cameraNames() const {
    std::vector<std::string> names;
    for (unsigned int c = 0; c < _model->scene->mNumCameras; ++c) names.emplace_back(_model->scene->mCameras[c]->mName.C_Str());
    return names;
}

RCShdPtr<SdScene> ZrModelFile::sceneAt(double seconds, const ZrShadowOptions& shadows) const {
    const Model& model = *_model;
    const aiScene& source = *model.scene;
    const std::map<const aiNode*, aiMatrix4x4> world = model.worldAt(seconds);
    RCShdPtr<SdScene> scene = makeShared<SdScene>();
    RCShdPtr<const SdMaterial> fallbackMaterial = makeShared<SdMaterial>();

    for (const auto& [node, matrix] : world) {
        for (unsigned int i = 0; i < node->mNumMeshes; ++i) {
            const unsigned int m = node->mMeshes[i];
            if (m >= model.meshes.size() || !model.meshes[m]) continue;
            const unsigned int materialIndex = source.mMeshes[m]->mMaterialIndex;
            RCShdPtr<SdInstance> instance = makeShared<SdInstance>(
                makeShared<SdMeshGeometry>(model.meshes[m]), GeAffineMatrix3<float>(toAffine(matrix)));
            instance->setMaterials(
                {materialIndex < model.materials.size() ? model.materials[materialIndex] : fallbackMaterial});
            instance->setName(node->mName.C_Str());
            scene->addGeometry(std::move(instance));
        }
    }

    // A direct light's map reaches this far to either side of its axis: the model's bounding
    // sphere, with a little to spare.
    const Bounds bounds = model.boundsAt(world);
    const double shadowReach = bounds.isEmpty() ? 1.0 : std::max(1e-6, 0.55 * (bounds.hi - bounds.lo).length());
    // Models come in any unit: the depth bias that keeps a surface from shadowing itself scales
    // with the model.
    const double shadowBias = 1e-2 * shadowReach;

    unsigned int lightNumber = 0;
    for (unsigned int l = 0; l < source.mNumLights; ++l) {
        const aiLight& light = *source.mLights[l];
        RCShdPtr<SdStdLight> ours = makeShared<SdStdLight>();
        switch (light.mType) {
            case aiLightSource_POINT: ours->_kind = SdStdLight::Kind::omni; break;
            case aiLightSource_DIRECTIONAL: ours->_kind = SdStdLight::Kind::direct; break;
            case aiLightSource_SPOT: ours->_kind = SdStdLight::Kind::spot; break;
            default: continue;  // ambient and area lights have no counterpart
        }
        const aiColor3D& c = light.mColorDiffuse;
        const float intensity = std::max({c.r, c.g, c.b});
        if (!(intensity > 0.0f) || !std::isfinite(intensity)) continue;
        ours->_color = {c.r / intensity, c.g / intensity, c.b / intensity};
        ours->_intensity = intensity;
        ours->_emitAmbient = false;
        shadows.applyTo(*ours);
        ours->_width = static_cast<float>(shadowReach);
        ours->_shadowBias = static_cast<float>(shadowBias);
        if (light.mType == aiLightSource_SPOT) {
            const float outer = std::clamp(light.mAngleOuterCone, 1e-3f, 3.1f);
            ours->_outerConeAngle = outer;
            ours->_innerConeAngle = std::clamp(light.mAngleInnerCone, 0.0f, outer);
        }
        // Falloff 1 / (c + l d + q d^2) becomes the half-strength distance of the nearest kind.
        const float constant = light.mAttenuationConstant > 0.0f ? light.mAttenuationConstant : 1.0f;
        if (light.mType != aiLightSource_DIRECTIONAL && light.mAttenuationQuadratic > 0.0f) {
            ours->_decayType = SdStdLight::DecayType::quadratic;
            ours->_decayParameter = std::sqrt(constant / light.mAttenuationQuadratic);
        } else if (light.mType != aiLightSource_DIRECTIONAL && light.mAttenuationLinear > 0.0f) {
            ours->_decayType = SdStdLight::DecayType::linear;
            ours->_decayParameter = constant / light.mAttenuationLinear;
        }
        ours->_intensity /= constant;

        const aiMatrix4x4& place = model.worldOfNamed(world, light.mName);
        const GePoint3<double> position = toPoint(place * light.mPosition);
        aiVector3D direction = light.mDirection;
        if (direction.SquareLength() <= 0.0f) direction = aiVector3D(0, 0, -1);
        const GePoint3<double> target = toPoint(place * (light.mPosition + direction));
        aiVector3D up = aiMatrix3x3(place) * (light.mUp.SquareLength() > 0.0f ? light.mUp : aiVector3D(0, 1, 0));
        RCShdPtr<SdInstance> instance =
            makeShared<SdInstance>(ours, ZrSceneKit::makeLookAt(position, target, {up.x, up.y, up.z}));
        instance->setLightNumber(++lightNumber);
        scene->addLight(std::move(instance));
    }

    if (lightNumber == 0) {
        // A key light from the upper left front, a weaker fill from the right and a rim light from
        // behind, all direct so that they light the model alike at any size; the fill also gives
        // the ambient light that keeps the sides turned away from both from going black.
        const GePoint3<double> centre{(bounds.lo.x + bounds.hi.x) / 2, (bounds.lo.y + bounds.hi.y) / 2,
                                      (bounds.lo.z + bounds.hi.z) / 2};
        struct Rig { double x, y, z; float intensity; bool ambient; };
        for (const Rig& rig : {Rig{-1.0, 1.2, 1.5, 0.7f, false}, Rig{1.5, 0.3, 1.0, 0.25f, true},
                               Rig{0.3, 1.0, -1.5, 0.35f, false}}) {
            RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
            light->_kind = SdStdLight::Kind::direct;
            light->_intensity = rig.intensity;
            light->_emitAmbient = rig.ambient;
            shadows.applyTo(*light);
            light->_width = static_cast<float>(shadowReach);
            light->_shadowBias = static_cast<float>(shadowBias);
            const GePoint3<double> from{centre.x + rig.x, centre.y + rig.y, centre.z + rig.z};
            RCShdPtr<SdInstance> instance = makeShared<SdInstance>(light, ZrSceneKit::makeLookAt(from, centre));
            instance->setLightNumber(++lightNumber);
            scene->addLight(std::move(instance));
        }
    }
    return scene;
}

RCShdPtr<SdInstance> ZrModelFile::cameraAt(const std::string& name, double seconds, double aspect) const {
    const Model& model = *_model;
    const aiScene& source = *model.scene;
    const aiCamera* chosen = nullptr;
    for (unsigned int c = 0; c < source.mNumCameras && chosen == nullptr; ++c)
        if (name.empty() || name == source.mCameras[c]->mName.C_Str()) chosen = source.mCameras[c];
    if (chosen == nullptr && !name.empty()) {
        std::string names;
        for (const std::string& n : cameraNames()) names += (names.empty() ? "" : ", ") + ("\"" + n + "\"");
        throw ZrHostError(model.path + ": no camera named \"" + name + "\" (the file has " +
                          (names.empty() ? std::string("none") : names) + ")");
    }
    const std::map<const aiNode*, aiMatrix4x4> world = model.worldAt(seconds);
    if (chosen == nullptr) return frameBounds(model.boundsAt(world), aspect);

    const aiMatrix4x4& place = model.worldOfNamed(world, chosen->mName);
    const GePoint3<double> eye = toPoint(place * chosen->mPosition);
    aiVector3D look = chosen->mLookAt.SquareLength() > 0.0f ? chosen->mLookAt : aiVector3D(0, 0, -1);
    const GePoint3<double> target = toPoint(place * (chosen->mPosition + look));
    const aiVector3D up = aiMatrix3x3(place) * (chosen->mUp.SquareLength() > 0.0f ? chosen->mUp : aiVector3D(0, 1, 0));

    RCShdPtr<SdCamera> camera = makeShared<SdCamera>();
    // The file gives half the horizontal opening; the picture's aspect gives the vertical one.
    const double halfWidth = std::tan(std::clamp(static_cast<double>(chosen->mHorizontalFOV), 1e-3, 1.55));
    camera->_fieldOfView = static_cast<float>(2.0 * std::atan(halfWidth / aspect));
    camera->_aspect = static_cast<float>(aspect);
    camera->_near = chosen->mClipPlaneNear > 0.0f ? chosen->mClipPlaneNear : 0.1f;
    camera->_far = chosen->mClipPlaneFar > camera->_near ? chosen->mClipPlaneFar : camera->_near * 1e4f;
    if (chosen->mOrthographicWidth > 0.0f) {
        camera->_projection = SdCamera::Projection::orthographic;
        camera->_orthographicHeight = static_cast<float>(2.0 * chosen->mOrthographicWidth / aspect);
    }
    return makeShared<SdInstance>(camera, ZrSceneKit::makeLookAt(eye, target, {up.x, up.y, up.z}));
}

RCShdPtr<SdInstance> ZrModelFile::frameBounds(const Bounds& bounds, double aspect) {
    const GePoint3<double> centre = bounds.isEmpty() ? GePoint3<double>{0, 0, 0}
                                                     : GePoint3<double>{(bounds.lo.x + bounds.hi.x) / 2,
                                                                        (bounds.lo.y + bounds.hi.y) / 2,
                                                                        (bounds.lo.z + bounds.hi.z) / 2};
    double radius = bounds.isEmpty() ? 1.0 : (bounds.hi - bounds.lo).length() / 2;
    if (!(radius > 1e-12) || !std::isfinite(radius)) radius = 1.0;
    constexpr double fieldOfView = 0.6981317;  // 40 degrees
    // The sphere around the box just fits the narrower of the two openings.
    const double halfOpening = std::min(fieldOfView / 2, std::atan(std::tan(fieldOfView / 2) * aspect));
    const double distance = radius / std::sin(halfOpening);
    const GeVector3<double> direction = GeVector3<double>(0.35, 0.4, 1.0).getNormalized();
    const GePoint3<double> eye{centre.x + direction.x * distance, centre.y + direction.y * distance,
                               centre.z + direction.z * distance};
    RCShdPtr<SdCamera> camera = makeShared<SdCamera>();
    camera->_fieldOfView = static_cast<float>(fieldOfView);
    camera->_aspect = static_cast<float>(aspect);
    camera->_near = static_cast<float>(std::max(distance - 1.5 * radius, distance * 1e-3));
    camera->_far = static_cast<float>(distance + 1.5 * radius);
    return makeShared<SdInstance>(camera, ZrSceneKit::makeLookAt(eye, centre));
}

}  // namespace Zr
