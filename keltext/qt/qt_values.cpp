#include "keltext/qt/qt_values.h"

#include <QDate>
#include <QGuiApplication>
#include <QPalette>

#include "keltext/host/charset.h"
#include "keltext/host/date.h"
#include "keltext/qt/qt_keys.h"

namespace kel::qt {
namespace {

// The palette role of the system colours the controls use; others show as the window colour.
QPalette::ColorRole role_of(int index) {
    switch (index) {
    case 0x05: return QPalette::Base;          // window background
    case 0x08: return QPalette::Text;          // window text
    case 0x0D: return QPalette::Highlight;
    case 0x0E: return QPalette::HighlightedText;
    case 0x0F: return QPalette::Button;        // button face
    case 0x12: return QPalette::ButtonText;
    case 0x11: return QPalette::PlaceholderText;  // grey text
    case 0x18: return QPalette::ToolTipBase;
    case 0x17: return QPalette::ToolTipText;
    default: return QPalette::Window;
    }
}

}  // namespace

QColor qcolor_of(Colour c) {
    if (is_system_colour(c)) return QGuiApplication::palette().color(role_of(c & 0xFF));
    return QColor(c & 0xFF, (c >> 8) & 0xFF, (c >> 16) & 0xFF);
}

Colour colour_of(const QColor& c) { return rgb(c.red(), c.green(), c.blue()); }

QFont qfont_of(const kel::Font& f) {
    QFont q(QString::fromStdString(to_utf8(f.name)));
    if (f.size > 0) q.setPointSizeF(f.size);
    q.setBold(f.bold);
    q.setItalic(f.italic);
    return q;
}

std::shared_ptr<kel::Font> font_of(const QFont& f) {
    const double size = f.pointSizeF() > 0 ? f.pointSizeF() : 9;
    return std::make_shared<kel::Font>(from_utf8(f.family().toStdString()), size, f.bold(), f.italic());
}

QVariant qvariant_of(const Variant& v) {
    switch (v.kind()) {
    case VarKind::Empty: return {};
    case VarKind::Byte: return QVariant::fromValue(static_cast<uchar>(*v.get_if<uint8_t>()));
    case VarKind::Int16: return QVariant::fromValue(static_cast<short>(*v.get_if<int16_t>()));
    case VarKind::Int32: return QVariant::fromValue(static_cast<int>(*v.get_if<int32_t>()));
    case VarKind::Single: return QVariant::fromValue(*v.get_if<float>());
    case VarKind::Double: return QVariant::fromValue(*v.get_if<double>());
    case VarKind::Boolean: return QVariant::fromValue(*v.get_if<bool>());
    case VarKind::String: return qstring_of(v.str());
    case VarKind::Date: {
        const Ymd d = to_ymd(*v.get_if<Date>());
        return QDate(d.year, d.month, d.day);
    }
    case VarKind::Object:
        if (const auto f = kel::font_of(v)) return qfont_of(*f);
        return {};
    }
    return {};
}

Variant variant_of(const QVariant& v) {
    if (!v.isValid() || v.isNull()) return {};
    switch (v.metaType().id()) {
    case QMetaType::Bool: return v.toBool();
    case QMetaType::UChar: return static_cast<uint8_t>(v.value<uchar>());
    case QMetaType::Short: return static_cast<int16_t>(v.value<short>());
    case QMetaType::Int: return static_cast<int32_t>(v.toInt());
    case QMetaType::Float: return v.toFloat();
    case QMetaType::Double: return v.toDouble();
    case QMetaType::QColor: return static_cast<int32_t>(colour_of(v.value<QColor>()));
    case QMetaType::QFont: return Variant(font_of(v.value<QFont>()));
    case QMetaType::QDate: {
        const QDate d = v.toDate();
        if (const auto date = make_date(d.year(), d.month(), d.day())) return *date;
        return {};
    }
    default: break;
    }
    if (v.canConvert<QString>()) return from_utf8(v.toString().toStdString());
    return {};
}

}  // namespace kel::qt
