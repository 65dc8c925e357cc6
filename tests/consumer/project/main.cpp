// A host outside the source tree: it includes the renderer's headers by bare name, links the
// installed library and checks a little of each layer.
#include <cstdio>

#include "exBase.h"
#include "rcBase.h"
#include "rcShdPtr.h"
#include "renderInit.h"
#include "rsFilterKernel.h"

namespace {
class Counted : public Zr::RCObject {};

int fail(const char* what) {
    std::printf("consumer failed: %s\n", what);
    return 1;
}
}  // namespace

int main() {
    Zr::RCShdPtr<Counted> a = Zr::makeShared<Counted>();
    Zr::RCShdPtr<Counted> b = a;
    if (a->getReferenceCount() != 2) return fail("reference count");

    Zr::RCShdPtr<Counted> empty;
    try {
        (void)*empty;
        return fail("null dereference did not throw");
    } catch (const Zr::ExBase&) {
    }

    if (Zr::RsFilterKernel(Zr::RsFilterKernel::KernelCone).evaluateKernel(0.5f, 0.5f) != 1.0f)
        return fail("cone kernel at the centre");

    if (Zr::RenderInit::getPackageRecords().size() != 4) return fail("package records");
    if (Zr::RenderInit::getBuildInfo().getLibraryName() != "libZrrender") return fail("build record");

    std::puts("consumer ok");
    return 0;
}
