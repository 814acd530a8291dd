#include "keltext/host/members.h"

#include "keltext/host/conversions.h"
#include "keltext/host/errors.h"

namespace kel {
namespace {

template <class List>
auto find_named(const List& list, std::string_view name) -> decltype(&list.front()) {
    for (const auto& m : list)
        if (same_name(m.name, name)) return &m;
    return nullptr;
}

}  // namespace

std::vector<ArgInfo> key_event_args() { return {{"KeyCode", "Integer"}, {"Shift", "Integer"}}; }

std::vector<ArgInfo> mouse_event_args() {
    return {{"Button", "Integer"}, {"Shift", "Integer"}, {"X", "Single"}, {"Y", "Single"}};
}

const PropertyInfo* ClassInfo::find_property(std::string_view name) const { return find_named(properties, name); }
const MethodInfo* ClassInfo::find_method(std::string_view name) const { return find_named(methods, name); }
const EventInfo* ClassInfo::find_event(std::string_view name) const { return find_named(events, name); }

namespace {

// Runs an access to a member; a run-time error leaving it names the class and the member.
template <class F>
auto naming_member(const ClassInfo& info, std::string_view spelled, F&& access) -> decltype(access()) {
    try {
        return access();
    } catch (RuntimeError& e) {
        e.set_source(info.name + "." + std::string(spelled));
        throw;
    }
}

}  // namespace

Variant BoundControl::get(std::string_view name, const Variant* index) {
    const PropertyInfo* p = info_.find_property(name);
    return naming_member(info_, p ? std::string_view(p->name) : name, [&] {
        if (!p) raise_error(kNoSuchMember);
        if (p->indexed != (index != nullptr)) raise_error(kInvalidPropertyIndex);
        return p->get(control_, index);
    });
}

void BoundControl::set(std::string_view name, const Variant& value, const Variant* index) {
    const PropertyInfo* p = info_.find_property(name);
    naming_member(info_, p ? std::string_view(p->name) : name, [&] {
        if (!p) raise_error(kNoSuchMember);
        if (p->read_only()) raise_error(kNoSuchMember);
        if (p->indexed != (index != nullptr)) raise_error(kInvalidPropertyIndex);
        p->set(control_, index, value);
    });
}

Variant BoundControl::call(std::string_view name, std::span<const Variant> args) {
    const MethodInfo* m = info_.find_method(name);
    return naming_member(info_, m ? std::string_view(m->name) : name, [&] {
        if (!m) raise_error(kNoSuchMember);
        std::size_t required = 0;
        for (const auto& a : m->args)
            if (!a.optional) ++required;
        if (args.size() < required || args.size() > m->args.size()) raise_error(kInvalidProcedureCall);
        return m->call(control_, args);
    });
}

}  // namespace kel
