#pragma once
// The system's exceptions. Every failure the libraries raise derives from ExBase, so a host can
// catch one type; the derived types tell what kind of failure it was.
#include <exception>
#include <string>

namespace Zr {

class ExBase : public std::exception {
public:
    ExBase(const char* file, int line, std::string message);
    ExBase(const ExBase&) = default;
    ExBase& operator=(const ExBase&) = default;
    ~ExBase() override;

    const char* what() const noexcept override { return _what.c_str(); }
    const std::string& getFile() const { return _file; }
    int getLine() const { return _line; }
    const std::string& getMessage() const { return _message; }

private:
    std::string _file;
    int _line;
    std::string _message;
    std::string _what;  // "file(line): message", built once so what() cannot fail
};

// A broken precondition: the text is the failed condition as written at the check.
class ExAssertionFailed : public ExBase {
public:
    using ExBase::ExBase;
};

// Code that must be unreachable was reached.
class ExProgramAborted : public ExBase {
public:
    using ExBase::ExBase;
};

// An empty smart pointer was dereferenced; the message names the pointed-to type.
class ExNullPtr : public ExBase {
public:
    using ExBase::ExBase;
};

// A checked down-cast between reference-counted types failed.
class ExCastFailed : public ExBase {
public:
    using ExBase::ExBase;
};

}  // namespace Zr
