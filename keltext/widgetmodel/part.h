#pragma once
// A part of a hosted control (a constituent widget, the surface, a page), reached by member
// name: how scripts peek and poke, and how the terminal UI reads what to draw.
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "keltext/host/variant.h"

namespace kel::model {

class Part {
public:
    virtual ~Part() = default;
    // "EditBox", "ComboBox", "MaskedEdit", "SpinButton", "Image", "ListBox", "CheckBox",
    // "PushButton", "Label", "Frame", "Surface", "Page".
    virtual std::string_view widget_type() const = 0;
    // Member names in their own spelling; indexed members (List, ItemData) take an index.
    virtual std::vector<std::string> members() const = 0;
    virtual std::vector<std::string> notifications() const = 0;
    // Read a member with the kind the host gives it (Width single, SelStart 32-bit, ...).
    // Run-time errors of the widget (381 for an index out of range) are thrown.
    virtual Variant peek(std::string_view member, std::optional<int32_t> index = std::nullopt) const = 0;
    // Set a member through the widget's own setter, with the notifications it raises.
    virtual void poke(std::string_view member, const Variant& value, std::optional<int32_t> index = std::nullopt) = 0;
};

// The member's own spelling, or nothing when the part has no such member or notification.
std::optional<std::string> find_member(const Part& part, std::string_view name);
std::optional<std::string> find_notification(const Part& part, std::string_view name);

}  // namespace kel::model
