#include "keltext/host/variant.h"

#include "keltext/host/errors.h"
#include "keltext/host/font.h"

namespace kel {

bool Variant::is_number() const {
    switch (kind()) {
    case VarKind::Byte:
    case VarKind::Int16:
    case VarKind::Int32:
    case VarKind::Single:
    case VarKind::Double: return true;
    default: return false;
    }
}

double Variant::number() const {
    switch (kind()) {
    case VarKind::Byte: return *get_if<uint8_t>();
    case VarKind::Int16: return *get_if<int16_t>();
    case VarKind::Int32: return *get_if<int32_t>();
    case VarKind::Single: return *get_if<float>();
    case VarKind::Double: return *get_if<double>();
    case VarKind::Boolean: return *get_if<bool>() ? -1.0 : 0.0;
    case VarKind::Date: return get_if<Date>()->serial;
    default: return 0.0;
    }
}

const std::string& Variant::str() const {
    static const std::string kEmpty;
    const auto* s = get_if<std::string>();
    return s ? *s : kEmpty;
}

std::shared_ptr<Object> Variant::object() const {
    const auto* o = get_if<std::shared_ptr<Object>>();
    return o ? *o : nullptr;
}

std::string_view kind_name(VarKind k) {
    switch (k) {
    case VarKind::Empty: return "Empty";
    case VarKind::Byte: return "Byte";
    case VarKind::Int16: return "Integer";
    case VarKind::Int32: return "Long";
    case VarKind::Single: return "Single";
    case VarKind::Double: return "Double";
    case VarKind::Date: return "Date";
    case VarKind::String: return "String";
    case VarKind::Boolean: return "Boolean";
    case VarKind::Object: return "Object";
    }
    return "Unknown";
}

std::shared_ptr<Font> font_of(const Variant& v) { return std::dynamic_pointer_cast<Font>(v.object()); }

std::shared_ptr<Font> require_font(const Variant& v) {
    auto f = font_of(v);
    if (!f) raise_error(kTypeMismatch);
    return f;
}

}  // namespace kel
