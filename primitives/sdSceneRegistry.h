#pragma once
// A registry of builders for one class hierarchy of the scene description: it maps the run-time
// type of a described object to the builder that makes the code handling objects of that type
// (a renderer's shader builders, for instance). Key is the root of the hierarchy; only types of
// that hierarchy can be given, so a light type cannot be looked up among materials by mistake.
//
// A type without a builder of its own falls back to the builder of its nearest registered
// ancestor, so that a class derived by a host needs no registration unless it wants other code.
//
// Registering keeps the builder; resolving hands out a clone of it, never the stored object, so
// callers cannot change what the next caller gets. Builder is a reference-counted class with
//
//   RCShdPtr<Builder> clone() const;
//
// The registry has no lock: builders are registered when packages start, before any lookup, and
// lookups only read.
#include <map>

#include "rcShdPtr.h"
#include "rttiType.h"

namespace Zr {

template <class Key, class Builder>
class SdSceneRegistry {
public:
    using BuilderPtr = RCShdPtr<Builder>;

    SdSceneRegistry() = default;
    SdSceneRegistry(const SdSceneRegistry&) = delete;
    SdSceneRegistry& operator=(const SdSceneRegistry&) = delete;

    // Stores builder under the number of type. A null builder fails with ExAssertionFailed; a
    // type that has a builder already fails with SdEx::ExDoubleRegistration, and the first
    // builder stays.
    void registerBuilder(const RttiType<Key>& type, const BuilderPtr& builder);

    // A fresh clone of the builder of type, or, when type has none, of its first ancestor that
    // has one, in the order of getAncestors (nearest first). SdEx::ExCantResolveBuilder when
    // neither the type nor any ancestor has a builder.
    BuilderPtr resolveBuilder(const RttiType<Key>& type) const;

private:
    // Ordered by type number.
    std::map<int, BuilderPtr> _builders;
};

}  // namespace Zr

#include "sdSceneRegistry.imp"
