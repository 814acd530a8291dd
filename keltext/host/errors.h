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

// what(): "run-time error 381: Invalid property array index", and once the member it came from
// is known, "KelCombo.ListIndex: run-time error 381: Invalid property array index".
class RuntimeError : public std::exception {
public:
    explicit RuntimeError(int number);
    int number() const noexcept { return number_; }
    const char* what() const noexcept override { return message_.c_str(); }
    // The member the error came from ("KelCombo.ListIndex"), or "" when it is not known.
    const std::string& source() const noexcept { return source_; }
    // Names the member, unless an inner call already did.
    void set_source(std::string source);

private:
    int number_;
    std::string source_;
    std::string message_;
};

// The host's description of an error number ("Overflow", "Type mismatch", ...).
std::string error_description(int number);

[[noreturn]] void raise_error(int number);

}  // namespace kel
