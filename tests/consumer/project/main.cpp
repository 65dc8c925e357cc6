// A host outside the source tree: it includes the renderer's headers by bare name, links the
// installed library and uses a little of it.
#include <cstdio>

#include "exBase.h"
#include "rcShdPtr.h"

namespace {
class Counted : public Zr::RCObject {};
}  // namespace

int main() {
    Zr::RCShdPtr<Counted> a = Zr::makeShared<Counted>();
    Zr::RCShdPtr<Counted> b = a;
    if (a->getReferenceCount() != 2) return 1;
    Zr::RCShdPtr<Counted> empty;
    try {
        (void)*empty;
        return 2;
    } catch (const Zr::ExBase&) {
    }
    std::puts("consumer ok");
    return 0;
}
