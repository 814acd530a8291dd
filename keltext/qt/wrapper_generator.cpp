// Writes keltext/qt/kel_controls.h and .cpp, the Qt wrappers of the controls, from the
// catalogue's class tables: moc needs every Q_PROPERTY, signal and invokable written out, and
// the tables are where the members are described once. The files are committed; a test runs
// this program with --check and fails when they differ from what it writes.
//
//   keltext_qt_wrapper_generator OUTDIR          writes OUTDIR/kel_controls.h and .cpp
//   keltext_qt_wrapper_generator --check DIR     exit 1 when DIR's files differ
#include <cctype>
#include <fstream>
#include <iostream>
#include <sstream>
#include <string>
#include <vector>

#include "keltext/library/catalogue.h"

namespace {

using kel::ClassInfo;
using kel::PropertyInfo;

// How a published type appears in Qt.
enum class QtType { Bool, Int, Double, String, Color, Font, Enum, Variant };

struct Prop {
    const PropertyInfo* info;
    QtType type;
    std::string enum_name;
};

bool is_enum(const ClassInfo& cls, const std::string& type) {
    for (const auto& e : cls.enums)
        if (e.name == type) return true;
    return false;
}

// Variant-typed properties that always hold one kind of value are typed for Designer.
QtType variant_override(const ClassInfo& cls, const std::string& name) {
    if (name == "MaxLength" || name == "SelStart" || name == "Sellength" || name == "hWnd" || name == "ListIndex")
        return QtType::Int;
    if (name == "SelText") return QtType::String;
    if (cls.name == "KelNumeric" && (name == "MaxValue" || name == "MinValue" || name == "Increment"))
        return QtType::Double;
    if ((cls.name == "KelAlphaNumeric" || cls.name == "KelCombo") && name == "Text") return QtType::String;
    return QtType::Variant;
}

Prop prop_of(const ClassInfo& cls, const PropertyInfo& p) {
    const std::string& t = p.type;
    if (t == "Boolean") return {&p, QtType::Bool, {}};
    if (t == "Integer" || t == "Long") return {&p, QtType::Int, {}};
    if (t == "Single" || t == "Double") return {&p, QtType::Double, {}};
    if (t == "String") return {&p, QtType::String, {}};
    if (t == "OLE_COLOR") return {&p, QtType::Color, {}};
    if (t == "Font") return {&p, QtType::Font, {}};
    if (is_enum(cls, t)) return {&p, QtType::Enum, t};
    return {&p, variant_override(cls, p.name), {}};
}

std::string cpp_type(const Prop& p) {
    switch (p.type) {
    case QtType::Bool: return "bool";
    case QtType::Int: return "int";
    case QtType::Double: return "double";
    case QtType::String: return "QString";
    case QtType::Color: return "QColor";
    case QtType::Font: return "QFont";
    case QtType::Enum: return p.enum_name;
    case QtType::Variant: return "QVariant";
    }
    return "QVariant";
}

std::string param_type(const Prop& p) {
    const std::string t = cpp_type(p);
    return (p.type == QtType::Bool || p.type == QtType::Int || p.type == QtType::Double || p.type == QtType::Enum)
               ? t
               : "const " + t + "&";
}

// The value of a member as the Qt type.
std::string from_variant(const Prop& p, const std::string& v) {
    switch (p.type) {
    case QtType::Bool: return "kel::to_bool(" + v + ")";
    case QtType::Int: return "static_cast<int>(kel::to_int32(" + v + "))";
    case QtType::Double: return "kel::to_double(" + v + ")";
    case QtType::String: return "qstring_of(kel::text_of(" + v + "))";
    case QtType::Color: return "qcolor_of(kel::to_int32(" + v + "))";
    case QtType::Font: return "qfont_value(" + v + ")";
    case QtType::Enum: return "static_cast<" + p.enum_name + ">(kel::to_int32(" + v + "))";
    case QtType::Variant: return "qvariant_of(" + v + ")";
    }
    return "qvariant_of(" + v + ")";
}

std::string to_variant(const Prop& p, const std::string& v) {
    switch (p.type) {
    case QtType::Bool: return "kel::Variant(" + v + ")";
    case QtType::Int: return "kel::Variant(static_cast<int32_t>(" + v + "))";
    case QtType::Double: return "kel::Variant(" + v + ")";
    case QtType::String: return "kel::Variant(cp1252_value(" + v + "))";
    case QtType::Color: return "kel::Variant(static_cast<int32_t>(colour_of(" + v + ")))";
    case QtType::Font: return "kel::Variant(font_of(" + v + "))";
    case QtType::Enum: return "kel::Variant(static_cast<int32_t>(" + v + "))";
    case QtType::Variant: return "variant_of(" + v + ")";
    }
    return "variant_of(" + v + ")";
}

// Setters that would hide a QWidget member of the same name take a prefix.
std::string setter_name(const std::string& prop) {
    static const std::vector<std::string> taken = {"Enabled", "Font", "Mask", "Visible", "Hidden", "Disabled",
                                                   "Palette", "Cursor", "Locale", "Geometry", "Style"};
    for (const auto& t : taken)
        if (t == prop) return "setKel" + prop;
    return "set" + prop;
}

std::string lower_first(std::string s) {
    if (!s.empty()) s[0] = static_cast<char>(std::tolower(static_cast<unsigned char>(s[0])));
    return s;
}

std::string arg_type(const std::string& published) {
    if (published == "Integer") return "short";
    if (published == "Long") return "int";
    if (published == "Single") return "float";
    if (published == "Double") return "double";
    if (published == "Boolean") return "bool";
    if (published == "String") return "QString";
    return "QVariant";
}

bool is_wrapped(const ClassInfo& cls) { return !cls.is_page && cls.create; }

std::string header(const kel::Catalogue& catalogue) {
    std::ostringstream o;
    o << "#pragma once\n"
         "// Generated by keltext/qt/wrapper_generator.cpp from the catalogue's class tables: do not edit.\n"
         "// The controls as QWidgets: one Q_PROPERTY per published property (designable, not stored:\n"
         "// kelSettings keeps what the control stores), one signal per event with its arguments by\n"
         "// reference (a slot may change them: keyAscii = 0 drops a key), the methods as invokables.\n"
         "// Accessors never throw: a run-time error is reported by runtimeError() and lastError().\n"
         "#include <QColor>\n#include <QFont>\n#include <QString>\n#include <QVariant>\n\n"
         "#include \"keltext/qt/control_widget.h\"\n\nnamespace kel::qt {\n";
    for (const auto& cls : catalogue.classes()) {
        if (!is_wrapped(cls)) continue;
        o << "\nclass " << cls.name << " : public ControlWidget {\n    Q_OBJECT\n";
        for (const auto& p : cls.properties) {
            if (p.indexed) continue;
            const Prop q = prop_of(cls, p);
            o << "    Q_PROPERTY(" << cpp_type(q) << " " << p.name << " READ " << p.name;
            if (!p.read_only()) o << " WRITE " << setter_name(p.name);
            o << " STORED false DESIGNABLE " << (p.hidden() ? "false" : "true") << ")\n";
        }
        o << "\npublic:\n";
        for (const auto& e : cls.enums) {
            o << "    enum " << e.name << " {";
            for (std::size_t i = 0; i < e.members.size(); ++i)
                o << (i ? ", " : " ") << e.members[i].first << " = " << e.members[i].second;
            o << " };\n    Q_ENUM(" << e.name << ")\n";
        }
        o << "\n    explicit " << cls.name << "(QWidget* parent = nullptr);\n";
        o << "    " << cls.name << "(const Creation& creation, QWidget* parent);\n\n";
        for (const auto& p : cls.properties) {
            if (p.indexed) {
                o << "    Q_INVOKABLE QVariant " << p.name << "(int index);\n";
                if (!p.read_only())
                    o << "    Q_INVOKABLE void " << setter_name(p.name) << "(int index, const QVariant& value);\n";
                continue;
            }
            const Prop q = prop_of(cls, p);
            o << "    " << cpp_type(q) << " " << p.name << "();\n";
            if (!p.read_only()) o << "    void " << setter_name(p.name) << "(" << param_type(q) << " value);\n";
        }
        o << "\n";
        for (const auto& m : cls.methods) {
            o << "    Q_INVOKABLE void " << m.name << "(";
            for (std::size_t i = 0; i < m.args.size(); ++i) {
                const std::string t = arg_type(m.args[i].type);
                o << (i ? ", " : "") << (t == "QString" || t == "QVariant" ? "const " + t + "&" : t) << " "
                  << m.args[i].name;
                if (m.args[i].optional) o << " = " << t << "()";
            }
            o << ");\n";
        }
        o << "\nsignals:\n";
        for (const auto& e : cls.events) {
            o << "    void " << lower_first(e.name) << "(";
            for (std::size_t i = 0; i < e.args.size(); ++i)
                o << (i ? ", " : "") << arg_type(e.args[i].type) << "& " << lower_first(e.args[i].name);
            o << ");\n";
        }
        o << "\nprotected:\n    void emitEvent(int number, std::span<EventArg> args) override;\n};\n";
    }
    o << "\n}  // namespace kel::qt\n";
    return o.str();
}

std::string source(const kel::Catalogue& catalogue) {
    std::ostringstream o;
    o << "// Generated by keltext/qt/wrapper_generator.cpp from the catalogue's class tables: do not edit.\n"
         "#include \"keltext/qt/kel_controls.h\"\n\n"
         "#include \"keltext/host/charset.h\"\n#include \"keltext/host/conversions.h\"\n"
         "#include \"keltext/qt/qt_keys.h\"\n#include \"keltext/qt/qt_values.h\"\n\nnamespace kel::qt {\nnamespace {\n\n"
         "QFont qfont_value(const kel::Variant& v) {\n"
         "    const auto f = kel::font_of(v);\n    return f ? qfont_of(*f) : QFont();\n}\n\n"
         "std::string cp1252_value(const QString& s) { return kel::from_utf8(s.toStdString()); }\n\n"
         "// An index as form code writes it: a 16-bit integer where it fits (the list takes no other).\n"
         "kel::Variant index_value(int i) {\n"
         "    if (i >= -32768 && i <= 32767) return kel::Variant(static_cast<int16_t>(i));\n"
         "    return kel::Variant(static_cast<int32_t>(i));\n}\n\n"
         "}  // namespace\n";
    for (const auto& cls : catalogue.classes()) {
        if (!is_wrapped(cls)) continue;
        const std::string& c = cls.name;
        o << "\n// ---- " << c << "\n\n";
        o << c << "::" << c << "(QWidget* parent) : " << c << "(Creation{catalogueClass(\"" << c
          << "\"), {}, 1200, 300, std::nullopt}, parent) {}\n\n";
        o << c << "::" << c << "(const Creation& creation, QWidget* parent) : ControlWidget(creation, parent) {}\n";
        for (const auto& p : cls.properties) {
            if (p.indexed) {
                o << "\nQVariant " << c << "::" << p.name << "(int index) {\n"
                  << "    return reporting([&] {\n        const kel::Variant i = index_value(index);\n"
                  << "        return qvariant_of(getMember(\"" << p.name << "\", &i));\n    });\n}\n";
                if (!p.read_only())
                    o << "\nvoid " << c << "::" << setter_name(p.name)
                      << "(int index, const QVariant& value) {\n"
                      << "    reporting([&] {\n        const kel::Variant i = index_value(index);\n"
                      << "        putMember(\"" << p.name << "\", variant_of(value), &i);\n    });\n}\n";
                continue;
            }
            const Prop q = prop_of(cls, p);
            o << "\n" << (q.type == QtType::Enum ? c + "::" : "") << cpp_type(q) << " " << c << "::" << p.name << "() {\n"
              << "    return reporting([&] { return " << from_variant(q, "getMember(\"" + p.name + "\")") << "; });\n}\n";
            if (!p.read_only())
                o << "\nvoid " << c << "::" << setter_name(p.name) << "(" << param_type(q) << " value) {\n"
                  << "    reporting([&] { putMember(\"" << p.name << "\", " << to_variant(q, "value") << "); });\n}\n";
        }
        for (const auto& m : cls.methods) {
            o << "\nvoid " << c << "::" << m.name << "(";
            for (std::size_t i = 0; i < m.args.size(); ++i) {
                const std::string t = arg_type(m.args[i].type);
                o << (i ? ", " : "") << (t == "QString" || t == "QVariant" ? "const " + t + "&" : t) << " "
                  << m.args[i].name;
            }
            o << ") {\n    reporting([&] {\n        std::vector<kel::Variant> args;\n";
            for (const auto& a : m.args) {
                const std::string t = arg_type(a.type);
                std::string value = t == "QString" ? "kel::Variant(cp1252_value(" + a.name + "))"
                                    : t == "QVariant" ? "variant_of(" + a.name + ")"
                                    : t == "short"    ? "kel::Variant(static_cast<int16_t>(" + a.name + "))"
                                    : t == "int"      ? "kel::Variant(static_cast<int32_t>(" + a.name + "))"
                                                      : "kel::Variant(" + a.name + ")";
                if (a.optional) o << "        if (" << a.name << ".isValid()) ";
                else o << "        ";
                o << "args.push_back(" << value << ");\n";
            }
            o << "        callMember(\"" << m.name << "\", std::move(args));\n    });\n}\n";
        }
        o << "\nvoid " << c << "::emitEvent(int number, std::span<EventArg> args) {\n    switch (number) {\n";
        for (const auto& e : cls.events) {
            o << "    case " << e.number << ": {\n";
            for (std::size_t i = 0; i < e.args.size(); ++i)
                o << "        " << arg_type(e.args[i].type) << " a" << i << " = argValue<" << arg_type(e.args[i].type)
                  << ">(args, " << i << ");\n";
            o << "        emit " << lower_first(e.name) << "(";
            for (std::size_t i = 0; i < e.args.size(); ++i) o << (i ? ", " : "") << "a" << i;
            o << ");\n";
            for (std::size_t i = 0; i < e.args.size(); ++i) o << "        putArg(args, " << i << ", a" << i << ");\n";
            o << "        break;\n    }\n";
        }
        o << "    default: break;\n    }\n}\n";
    }
    o << "\nControlWidget* create_control_widget(const ControlWidget::Creation& creation, QWidget* parent) {\n"
         "    const std::string& name = creation.cls ? creation.cls->name : std::string();\n";
    for (const auto& cls : catalogue.classes())
        if (is_wrapped(cls))
            o << "    if (name == \"" << cls.name << "\") return new " << cls.name << "(creation, parent);\n";
    o << "    return new ControlWidget(creation, parent);\n}\n\n}  // namespace kel::qt\n";
    return o.str();
}

std::string read(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    std::ostringstream s;
    s << in.rdbuf();
    return s.str();
}

}  // namespace

int main(int argc, char** argv) {
    const std::vector<std::string> args(argv + 1, argv + argc);
    const bool check = !args.empty() && args[0] == "--check";
    if (args.size() != (check ? 2u : 1u)) {
        std::cerr << "usage: keltext_qt_wrapper_generator [--check] DIR\n";
        return 2;
    }
    const std::string dir = args.back();
    const kel::Catalogue catalogue;
    const std::pair<std::string, std::string> files[] = {{dir + "/kel_controls.h", header(catalogue)},
                                                        {dir + "/kel_controls.cpp", source(catalogue)}};
    int status = 0;
    for (const auto& [path, text] : files) {
        if (check) {
            if (read(path) != text) {
                std::cerr << path << " differs from what the class tables generate: run keltext_qt_wrapper_generator "
                          << dir << "\n";
                status = 1;
            }
            continue;
        }
        std::ofstream out(path, std::ios::binary);
        out << text;
        if (!out) {
            std::cerr << path << ": cannot write\n";
            return 1;
        }
    }
    return status;
}
