#include "keltext/qt/control_widget.h"

#include <QPaintEvent>
#include <QPainter>
#include <QResizeEvent>
#include <QtGlobal>

#include "keltext/host/charset.h"
#include "keltext/host/errors.h"
#include "keltext/qt/property_bag.h"
#include "keltext/host/conversions.h"
#include "keltext/qt/qt_keys.h"
#include "keltext/qt/qt_values.h"
#include "keltext/qt/services.h"

namespace kel::qt {

ControlWidget::ControlWidget(const Creation& creation, QWidget* parent)
    : QWidget(parent),
      services_(Services::of_application()),
      cls_(creation.cls ? *creation.cls : throw model::FormError("a control needs its class")),
      name_(creation.name.empty() ? creation.cls->name : creation.name) {
    if (cls_.is_page) throw model::FormError(cls_.name + " is a property page");
    setFocusPolicy(Qt::TabFocus);
    setSizePolicy(QSizePolicy::Fixed, QSizePolicy::Fixed);
    setAttribute(Qt::WA_InputMethodEnabled);
    build(creation.store, creation.width, creation.height);
}

ControlWidget::~ControlWidget() { site_.reset(); }

void ControlWidget::build(const std::optional<model::StoredValues>& store, float width, float height) {
    // The old control goes first, with its views: a new one never meets its predecessor.
    site_.reset();
    site_ = std::make_unique<QtSite>(services_, cls_, name_, *this, this, width, height);
    if (!cls_.create) throw model::FormError("class " + cls_.name + " cannot be created");
    std::unique_ptr<Control> control = cls_.create(*site_);
    if (!control) throw model::FormError("class " + cls_.name + " cannot be created");
    site_->attach(std::move(control));
    QtSite& s = *site_;
    s.guarded("surface", "Initialize", [&] { s.control().Initialize(); });
    if (store) {
        StoredBag bag(*store);
        s.guarded("surface", "ReadProperties", [&] { s.control().ReadProperties(bag); });
    } else {
        s.guarded("surface", "InitProperties", [&] { s.control().InitProperties(); });
    }
    s.raise_resize();
    services_.after_input();
}

void ControlWidget::after_call() { services_.after_input(); }

QVariant ControlWidget::member(const QString& name) {
    const Variant v = dispatch().get(name.toStdString());
    return qvariant_of(v);
}

void ControlWidget::setMember(const QString& name, const QVariant& value) {
    struct After {
        ControlWidget& w;
        ~After() { w.after_call(); }
    } after{*this};
    dispatch().set(name.toStdString(), variant_of(value));
}

QVariant ControlWidget::invoke(const QString& method, const QVariantList& args) {
    struct After {
        ControlWidget& w;
        ~After() { w.after_call(); }
    } after{*this};
    std::vector<Variant> values;
    values.reserve(static_cast<std::size_t>(args.size()));
    for (const QVariant& a : args) values.push_back(variant_of(a));
    return qvariant_of(dispatch().call(method.toStdString(), std::span<const Variant>(values)));
}

Variant ControlWidget::getMember(std::string_view name, const Variant* index) { return dispatch().get(name, index); }

void ControlWidget::putMember(std::string_view name, const Variant& value, const Variant* index) {
    struct After {
        ControlWidget& w;
        ~After() { w.after_call(); }
    } after{*this};
    dispatch().set(name, value, index);
}

void ControlWidget::callMember(std::string_view name, std::vector<Variant> args) {
    struct After {
        ControlWidget& w;
        ~After() { w.after_call(); }
    } after{*this};
    dispatch().call(name, std::span<const Variant>(args));
}

const ClassInfo* ControlWidget::catalogueClass(const char* name) {
    const ClassInfo* cls = Services::of_application().catalogue().find(name);
    if (!cls) throw model::FormError(std::string("no class ") + name);
    return cls;
}

namespace {

// An argument the form's code left in a kind that does not convert reads as the control gave it.
template <class F>
auto arg_or(std::span<EventArg> args, std::size_t i, F&& f) -> decltype(f(Variant())) {
    if (i >= args.size()) return {};
    try {
        return f(args[i].value);
    } catch (const RuntimeError&) {
        return {};
    }
}

}  // namespace

template <>
short ControlWidget::argValue<short>(std::span<EventArg> args, std::size_t i) {
    return arg_or(args, i, [](const Variant& v) { return static_cast<short>(to_int16(v)); });
}
template <>
int ControlWidget::argValue<int>(std::span<EventArg> args, std::size_t i) {
    return arg_or(args, i, [](const Variant& v) { return static_cast<int>(to_int32(v)); });
}
template <>
float ControlWidget::argValue<float>(std::span<EventArg> args, std::size_t i) {
    return arg_or(args, i, [](const Variant& v) { return to_single(v); });
}
template <>
double ControlWidget::argValue<double>(std::span<EventArg> args, std::size_t i) {
    return arg_or(args, i, [](const Variant& v) { return to_double(v); });
}
template <>
bool ControlWidget::argValue<bool>(std::span<EventArg> args, std::size_t i) {
    return arg_or(args, i, [](const Variant& v) { return to_bool(v); });
}
template <>
QString ControlWidget::argValue<QString>(std::span<EventArg> args, std::size_t i) {
    return arg_or(args, i, [](const Variant& v) { return qstring_of(text_of(v)); });
}
template <>
QVariant ControlWidget::argValue<QVariant>(std::span<EventArg> args, std::size_t i) {
    return arg_or(args, i, [](const Variant& v) { return qvariant_of(v); });
}

Variant ControlWidget::argVariant(const QString& v) { return Variant(from_utf8(v.toStdString())); }
Variant ControlWidget::argVariant(const QVariant& v) { return variant_of(v); }

model::StoredValues ControlWidget::save() {
    StoredBag bag;
    QtSite& s = *site_;
    s.guarded("surface", "WriteProperties", [&] { s.control().WriteProperties(bag); });
    services_.after_input();
    return bag.values();
}

void ControlWidget::load(const model::StoredValues& store) {
    const float width = site_->surface_model().Width();
    const float height = site_->surface_model().Height();
    build(store, width, height);
}

QVariantMap ControlWidget::saveToMap() {
    QVariantMap map;
    for (const auto& [key, value] : save()) map.insert(QString::fromStdString(key), qvariant_of(value));
    return map;
}

void ControlWidget::loadFromMap(const QVariantMap& map) {
    model::StoredValues store;
    for (auto it = map.begin(); it != map.end(); ++it) store.emplace_back(it.key().toStdString(), variant_of(it.value()));
    load(store);
}

QString ControlWidget::kelSettings() { return QString::fromStdString(store_text(save())); }

void ControlWidget::setKelSettings(const QString& settings) {
    try {
        load(parse_store_text(settings.toStdString()));
    } catch (const StoreTextError& e) {
        report_text(e.what());
    }
}

void ControlWidget::report(const RuntimeError& e) {
    last_error_ = e.number();
    emit runtimeError(e.number(), QString::fromStdString(to_utf8(e.what())));
    qWarning("%s", e.what());
}

void ControlWidget::report_text(const char* message) {
    last_error_ = -1;
    emit runtimeError(-1, QString::fromUtf8(message));
    qWarning("%s", message);
}

QSize ControlWidget::sizeHint() const {
    if (!site_) return {};
    const model::SurfaceModel& surface = site_->surface_model();
    return {site_->to_pixels(surface.Width()), site_->to_pixels(surface.Height())};
}

void ControlWidget::emitEvent(int, std::span<EventArg>) {}

void ControlWidget::site_event(int number, std::string_view name, std::span<EventArg> args) {
    emitEvent(number, args);
    if (receivers(SIGNAL(kelEvent(int, QString, QVariantList&))) == 0) return;
    QVariantList list;
    for (const auto& a : args) list.push_back(qvariant_of(a.value));
    emit kelEvent(number, QString::fromStdString(std::string(name)), list);
    for (qsizetype i = 0; i < list.size() && i < static_cast<qsizetype>(args.size()); ++i)
        args[static_cast<std::size_t>(i)].value = variant_of(list[i]);
}

void ControlWidget::site_property_changed(std::string_view name) {
    emit kelPropertyChanged(QString::fromStdString(std::string(name)));
}

void ControlWidget::site_synced() {
    const QSize px = sizeHint();
    if (px != applied_) {
        applied_ = px;
        resize(px);
        updateGeometry();
    }
    const model::SurfaceModel& s = site_->surface_model();
    if (s.BackColor() != shown_back_ || s.ForeColor() != shown_fore_ || s.BorderStyle() != shown_border_) {
        shown_back_ = s.BackColor();
        shown_fore_ = s.ForeColor();
        shown_border_ = s.BorderStyle();
        update();
    }
}

void ControlWidget::resizeEvent(QResizeEvent* e) {
    QWidget::resizeEvent(e);
    // A size Qt gave (a layout, the application): the control hears of it in twips. The sizes
    // the control set itself come back here too, and are not fed back (no rounding creeps in).
    if (!site_ || e->size() == applied_) return;
    applied_ = e->size();
    site_->surface_model().set_size(site_->to_twips(e->size().width()), site_->to_twips(e->size().height()));
    services_.after_input();
}

void ControlWidget::paintEvent(QPaintEvent*) {
    if (!site_) return;
    QPainter p(this);
    const model::SurfaceModel& s = site_->surface_model();
    p.fillRect(rect(), qcolor_of(s.BackColor()));
    if (s.BorderStyle() == 1) {
        p.setPen(qcolor_of(s.ForeColor()));
        p.drawRect(rect().adjusted(0, 0, -1, -1));
    }
}

}  // namespace kel::qt
