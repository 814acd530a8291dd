#include "keltext/host/errors.h"

namespace kel {

std::string error_description(int number) {
    switch (number) {
    case kInvalidProcedureCall: return "Invalid procedure call or argument";
    case kOverflow: return "Overflow";
    case kTypeMismatch: return "Type mismatch";
    case kInvalidPropertyValue: return "Invalid property value";
    case kInvalidPropertyIndex: return "Invalid property array index";
    case kNoSuchMember: return "Object doesn't support this property or method";
    default: return "Application-defined or object-defined error";
    }
}

RuntimeError::RuntimeError(int number)
    : number_(number), message_("run-time error " + std::to_string(number) + ": " + error_description(number)) {}

void RuntimeError::set_source(std::string source) {
    if (!source_.empty() || source.empty()) return;
    source_ = std::move(source);
    message_ = source_ + ": " + message_;
}

void raise_error(int number) { throw RuntimeError(number); }

}  // namespace kel
