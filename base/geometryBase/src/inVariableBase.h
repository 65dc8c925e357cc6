#pragma once
// Something with a name that a package can state it needs before it is up: another package, or
// a piece of a package's static state. Packages themselves are variables, so one package can name
// another directly as its dependency.
namespace Zr {

class InVariableBase {
public:
    // name must outlive the object (a literal).
    explicit InVariableBase(const char* name);
    virtual ~InVariableBase();
    InVariableBase(const InVariableBase&) = delete;
    InVariableBase& operator=(const InVariableBase&) = delete;

    const char* getName() const { return _name; }

private:
    const char* _name;
};

}  // namespace Zr
