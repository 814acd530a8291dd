#pragma once
// A class's members, described as data: how the catalogue, the property page (late-bound
// "FillList", "MaxLength", "Locked"), form files and kelform reach a control by name.
// Each control class describes itself in one short table next to the class (see ClassBuilder).
#include <cstdint>
#include <functional>
#include <initializer_list>
#include <memory>
#include <span>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "keltext/host/container.h"
#include "keltext/host/variant.h"

namespace kel {

enum MemberFlags : unsigned {
    kNoFlags = 0,
    kHidden = 1,         // hidden from the property browser
    kDefaultMember = 2,  // the class's default member (Text)
};

struct PropertyInfo {
    std::string name;  // the library's own spelling
    std::string type;  // as published: "Variant", "Boolean", "KelANTxtType", "OLE_COLOR", ...
    std::string description;
    bool indexed = false;
    unsigned flags = kNoFlags;
    // `index` is null for a property that is not indexed.
    std::function<Variant(Control&, const Variant* index)> get;
    std::function<void(Control&, const Variant* index, const Variant& value)> set;  // empty: read only
    bool read_only() const { return !set; }
    bool hidden() const { return (flags & kHidden) != 0; }
};

struct ArgInfo {
    std::string name;
    std::string type;
    bool optional = false;
};

struct MethodInfo {
    std::string name;
    std::vector<ArgInfo> args;
    std::string description;
    std::function<Variant(Control&, std::span<const Variant> args)> call;
};

struct EventInfo {
    int number = 0;  // position in the event interface, from 1
    std::string name;
    std::vector<ArgInfo> args;  // all by reference
    std::string description;
};

struct EnumInfo {
    std::string name;
    std::vector<std::pair<std::string, int32_t>> members;
};

struct ClassInfo {
    std::string name;
    std::string description;
    bool is_page = false;
    std::function<std::unique_ptr<Control>(Site&)> create;
    std::vector<PropertyInfo> properties;  // in the order of the interface
    std::vector<MethodInfo> methods;
    std::vector<EventInfo> events;
    std::vector<EnumInfo> enums;

    // Lookups match names without regard to case; null when absent.
    const PropertyInfo* find_property(std::string_view name) const;
    const MethodInfo* find_method(std::string_view name) const;
    const EventInfo* find_event(std::string_view name) const;
};

// Late-bound access to an object's members by name. An unknown member, or a set of a
// read-only one, is error 438; a wrong argument count error 5.
class Dispatch {
public:
    virtual ~Dispatch() = default;
    virtual Variant get(std::string_view name, const Variant* index = nullptr) = 0;
    virtual void set(std::string_view name, const Variant& value, const Variant* index = nullptr) = 0;
    virtual Variant call(std::string_view name, std::span<const Variant> args) = 0;
    // The arguments written in place: box.call("AddItem", {"Cash"}).
    Variant call(std::string_view name, std::initializer_list<Variant> args) {
        return call(name, std::span<const Variant>(args.begin(), args.size()));
    }
};

// A control together with its class table. A run-time error that leaves a member names it
// ("KelCombo.ListIndex: run-time error 381: ...").
class BoundControl : public Dispatch {
public:
    using Dispatch::call;
    BoundControl(Control& control, const ClassInfo& info) : control_(control), info_(info) {}
    Variant get(std::string_view name, const Variant* index = nullptr) override;
    void set(std::string_view name, const Variant& value, const Variant* index = nullptr) override;
    Variant call(std::string_view name, std::span<const Variant> args) override;
    Control& control() const { return control_; }
    const ClassInfo& info() const { return info_; }

private:
    Control& control_;
    const ClassInfo& info_;
};

// The by-reference arguments of the key and mouse events the controls raise.
std::vector<ArgInfo> key_event_args();    // KeyCode, Shift
std::vector<ArgInfo> mouse_event_args();  // Button, Shift, X, Y

// Builds a class table with typed accessors:
//   ClassBuilder<KelAlphaNumeric>("KelAlphaNumeric", "...")
//       .property("TextType", "KelANTxtType", &get, &set, "description")
//       .event(1, "Click", {}) ... .build();
template <class T>
class ClassBuilder {
public:
    ClassBuilder(std::string name, std::string description, bool is_page = false) {
        info_.name = std::move(name);
        info_.description = std::move(description);
        info_.is_page = is_page;
        info_.create = [](Site& site) -> std::unique_ptr<Control> { return std::make_unique<T>(site); };
    }

    // A property; pass an empty setter for a read-only one.
    ClassBuilder& property(std::string name, std::string type, std::function<Variant(T&)> get,
                           std::function<void(T&, const Variant&)> set, std::string description,
                           unsigned flags = kNoFlags) {
        PropertyInfo p{std::move(name), std::move(type), std::move(description), false, flags, {}, {}};
        p.get = [get = std::move(get)](Control& c, const Variant*) { return get(static_cast<T&>(c)); };
        if (set) p.set = [set = std::move(set)](Control& c, const Variant*, const Variant& v) { set(static_cast<T&>(c), v); };
        info_.properties.push_back(std::move(p));
        return *this;
    }

    ClassBuilder& indexed_property(std::string name, std::string type, std::function<Variant(T&, const Variant&)> get,
                                   std::function<void(T&, const Variant&, const Variant&)> set,
                                   std::string description, unsigned flags = kNoFlags) {
        PropertyInfo p{std::move(name), std::move(type), std::move(description), true, flags, {}, {}};
        p.get = [get = std::move(get)](Control& c, const Variant* i) { return get(static_cast<T&>(c), i ? *i : Variant()); };
        if (set)
            p.set = [set = std::move(set)](Control& c, const Variant* i, const Variant& v) {
                set(static_cast<T&>(c), i ? *i : Variant(), v);
            };
        info_.properties.push_back(std::move(p));
        return *this;
    }

    ClassBuilder& method(std::string name, std::vector<ArgInfo> args,
                         std::function<Variant(T&, std::span<const Variant>)> call, std::string description) {
        MethodInfo m{std::move(name), std::move(args), std::move(description), {}};
        m.call = [call = std::move(call)](Control& c, std::span<const Variant> a) { return call(static_cast<T&>(c), a); };
        info_.methods.push_back(std::move(m));
        return *this;
    }

    ClassBuilder& event(int number, std::string name, std::vector<ArgInfo> args = {}, std::string description = {}) {
        info_.events.push_back({number, std::move(name), std::move(args), std::move(description)});
        return *this;
    }

    ClassBuilder& enumeration(std::string name, std::vector<std::pair<std::string, int32_t>> members) {
        info_.enums.push_back({std::move(name), std::move(members)});
        return *this;
    }

    ClassInfo build() { return std::move(info_); }

private:
    ClassInfo info_;
};

}  // namespace kel
