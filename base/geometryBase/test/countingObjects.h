#pragma once
// Test objects that count how many of them exist and how many were deleted, so that tests can see
// exactly when a pointer deletes what it holds.
#include "rcBase.h"

namespace Zr::Testing {

struct LifeCounts {
    int made = 0;
    int deleted = 0;
    int alive() const { return made - deleted; }
};

// A shared object of the intrusive family.
class CountedShared : public RCObject {
public:
    explicit CountedShared(LifeCounts& counts, int id = 0) : _counts(counts), _id(id) { ++_counts.made; }
    ~CountedShared() override { ++_counts.deleted; }
    int getId() const { return _id; }

private:
    LifeCounts& _counts;
    int _id;
};

class DerivedShared : public CountedShared {
public:
    using CountedShared::CountedShared;
};

// A plain object without a virtual destructor, for the non-intrusive pointers: deleting it as
// the wrong type would skip the counting destructor of the derived class.
class PlainBase {
public:
    explicit PlainBase(int id = 0) : _id(id) {}
    int getId() const { return _id; }

private:
    int _id;
};

class CountedPlain : public PlainBase {
public:
    CountedPlain(LifeCounts& counts, int id = 0) : PlainBase(id), _counts(counts) { ++_counts.made; }
    ~CountedPlain() { ++_counts.deleted; }

private:
    LifeCounts& _counts;
};

}  // namespace Zr::Testing
