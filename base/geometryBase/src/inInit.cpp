#include "inInit.h"

#include <iterator>

namespace Zr {

const char* InInitTags::getPackageName(const std::type_info& tag) {
    struct Entry {
        const std::type_info& type;
        const char* name;
    };
    static const Entry entries[] = {
        {typeid(ZrInit::render), "render"},
        {typeid(ZrInit::suave), "suave"},
        {typeid(ZrInit::shaders), "shaders"},
        {typeid(ZrInit::yarp), "yarp"},
        {typeid(ZrInit::base), "base"},
        {typeid(ZrInit::media), "media"},
        {typeid(ZrInit::internalAPI), "internalAPI"},
        {typeid(ZrInit::primitives), "primitives"},
        {typeid(ZrInit::pluginAPI), "pluginAPI"},
        {typeid(ZrInit::resmgt), "resmgt"},
    };
    for (const Entry& e : entries) {
        if (e.type == tag) return e.name;
    }
    return nullptr;
}

}  // namespace Zr
