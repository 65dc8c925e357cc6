#include "sdScene.h"

#include <utility>

#include "assertions.h"
#include "sdCamera.h"
#include "sdGeometry.h"
#include "sdLight.h"

namespace Zr {

namespace {
constexpr const char* kSourceFile = ".\\primitives/sdScene.cpp";
}

SdScene::~SdScene() = default;

void SdScene::addGeometry(RCShdPtr<SdInstance> instance) { _geometry.push_back(std::move(instance)); }

void SdScene::addCamera(RCShdPtr<SdInstance> instance) { _cameras.push_back(std::move(instance)); }

void SdScene::addLight(RCShdPtr<SdInstance> instance) { _lights.push_back(std::move(instance)); }

void SdScene::add(RCShdPtr<SdInstance> instance) {
    const SdObject* object = instance->getObject().get();
    ZR_ASSERT_AT(object != nullptr, kSourceFile, __LINE__);
    if (dynamic_cast<const SdLight*>(object)) {
        addLight(std::move(instance));
    } else if (dynamic_cast<const SdCamera*>(object)) {
        addCamera(std::move(instance));
    } else {
        const bool isGeometry = dynamic_cast<const SdGeometry*>(object) != nullptr;
        ZR_ASSERT_AT(isGeometry, kSourceFile, __LINE__);
        addGeometry(std::move(instance));
    }
}

void SdScene::clear() {
    _geometry.clear();
    _cameras.clear();
    _lights.clear();
}

}  // namespace Zr
