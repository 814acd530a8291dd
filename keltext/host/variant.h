#pragma once
// The host's variant: a value that keeps its kind. Several rules depend on the kind
// (a 16-bit index is not a 32-bit one), so no constructor guesses: each C++ type maps to one kind.
#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <variant>

#include "keltext/host/date.h"

namespace kel {

// Base of every object a variant can hold (fonts, controls reached late-bound).
class Object {
public:
    virtual ~Object() = default;
};

enum class VarKind : uint8_t { Empty, Byte, Int16, Int32, Single, Double, Date, String, Boolean, Object };

class Variant {
public:
    Variant() = default;
    Variant(uint8_t v) : v_(v) {}
    Variant(int16_t v) : v_(v) {}
    Variant(int32_t v) : v_(v) {}
    Variant(float v) : v_(v) {}
    Variant(double v) : v_(v) {}
    Variant(Date v) : v_(v) {}
    Variant(std::string v) : v_(std::move(v)) {}
    Variant(std::string_view v) : v_(std::string(v)) {}
    Variant(const char* v) : v_(std::string(v)) {}
    Variant(bool v) : v_(v) {}
    Variant(std::shared_ptr<Object> v) : v_(std::move(v)) {}
    template <class T, class = std::enable_if_t<std::is_base_of_v<Object, T>>>
    Variant(std::shared_ptr<T> v) : v_(std::shared_ptr<Object>(std::move(v))) {}
    // No silent kinds for the remaining integer types.
    Variant(int64_t) = delete;
    Variant(uint16_t) = delete;
    Variant(uint32_t) = delete;
    Variant(uint64_t) = delete;
    Variant(char) = delete;

    VarKind kind() const { return static_cast<VarKind>(v_.index()); }
    bool is_empty() const { return kind() == VarKind::Empty; }
    bool is_string() const { return kind() == VarKind::String; }
    bool is_object() const { return kind() == VarKind::Object; }
    // Byte, 16-bit, 32-bit, single or double (not boolean, not date).
    bool is_number() const;

    template <class T> const T* get_if() const { return std::get_if<T>(&v_); }
    template <class T> bool holds() const { return std::holds_alternative<T>(v_); }

    // The value of a number, a boolean (-1 / 0), a date (its day count) or empty (0).
    // Anything else, a text included, gives 0: to read a value as a number the way the host
    // does, with error 13 for a text that is no number, use to_double (host/conversions.h).
    double number() const;
    const std::string& str() const;  // the string, or an empty one for other kinds
    std::shared_ptr<Object> object() const;

    // Same kind and same value.
    friend bool operator==(const Variant& a, const Variant& b) { return a.v_ == b.v_; }

private:
    std::variant<std::monostate, uint8_t, int16_t, int32_t, float, double, Date, std::string, bool,
                 std::shared_ptr<Object>>
        v_;
};

// The kind's name as the host's TypeName gives it ("Integer", "Long", "String", ...).
std::string_view kind_name(VarKind k);

}  // namespace kel
