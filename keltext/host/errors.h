#pragma once
// Run-time errors that reach a caller: the host's numbered errors.
#include <exception>
#include <string>

namespace kel {

enum ErrorNumber : int {
    kInvalidProcedureCall = 5,   // "Invalid procedure call or argument"
    kOverflow = 6,
    kTypeMismatch = 13,
    kInvalidPropertyValue = 380,
    kInvalidPropertyIndex = 381,
    kNoSuchMember = 438,         // late-bound access to a member the object lacks
};

class RuntimeError : public std::exception {
public:
    explicit RuntimeError(int number);
    int number() const noexcept { return number_; }
    const char* what() const noexcept override { return message_.c_str(); }

private:
    int number_;
    std::string message_;
};

// The host's description of an error number ("Overflow", "Type mismatch", ...).
std::string error_description(int number);

[[noreturn]] void raise_error(int number);

}  // namespace kel
