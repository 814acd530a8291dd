#pragma once
// The QWidget of one control: the control's container and surface view, and the base of the
// public wrappers (KelAlphaNumeric, KelNumeric, KelDateMask, KelCombo).
//
// A control is built with its widget: Initialize, then InitProperties (or ReadProperties of
// the stored values given), then Resize. load() and the kelSettings property re-create the
// control from stored values exactly as the minimal host's `load` does, so that a control
// instance sees exactly one of InitProperties and ReadProperties.
//
// Members are reached by name through the control's member table (member, setMember,
// invoke), which raise kel::RuntimeError as the member does. The wrappers' typed
// Q_PROPERTY accessors and Q_INVOKABLE methods go the same way but never throw into Qt:
// a run-time error there is reported by the runtimeError signal and lastError().
//
// Events reach, in order: the wrapper's typed signal (by-reference arguments: a slot may set
// keyAscii to 0), the generic kelEvent signal (arguments as a QVariantList a slot may change),
// then the services' observer (a form driver). Connect with Qt::DirectConnection (the
// default within one thread): a queued slot could not change an argument. A slot that does
// away with the control it hears from uses deleteLater(): the control is still running.
#include <QString>
#include <QVariantList>
#include <QVariantMap>
#include <QWidget>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "keltext/host/members.h"
#include "keltext/qt/site.h"
#include "keltext/widgetmodel/hosted.h"

namespace kel::qt {

class Services;

class ControlWidget : public QWidget, public SiteOwner {
    Q_OBJECT
    // What WriteProperties stores, one `store KEY VALUE` line each, as in a form file; setting
    // it re-creates the control and loads exactly those values. What .ui files keep.
    Q_PROPERTY(QString kelSettings READ kelSettings WRITE setKelSettings STORED true DESIGNABLE true)

public:
    // How a control is created: the class, its name (messages name it), the surface's size
    // in twips, and stored values to load instead of InitProperties.
    struct Creation {
        const ClassInfo* cls = nullptr;
        std::string name;
        float width = 1200;
        float height = 300;
        std::optional<model::StoredValues> store;
    };

    ControlWidget(const Creation& creation, QWidget* parent);
    ~ControlWidget() override;

    QtSite& site() { return *site_; }
    Dispatch& dispatch() { return site_->dispatch(); }
    const ClassInfo& classInfo() const { return cls_; }

    // Members by name, values as QVariants (qt_values.h): kel::RuntimeError as the member raises.
    QVariant member(const QString& name);
    void setMember(const QString& name, const QVariant& value);
    QVariant invoke(const QString& method, const QVariantList& args = {});

    // WriteProperties into an empty store; the values stored, in order.
    model::StoredValues save();
    // Re-creates the control and runs ReadProperties from exactly `store`.
    void load(const model::StoredValues& store);
    // The same through a QVariantMap property bag (keys as stored, values as qvariant_of).
    QVariantMap saveToMap();
    void loadFromMap(const QVariantMap& map);

    QString kelSettings();
    void setKelSettings(const QString& settings);

    // The last run-time error of a typed accessor or method, cleared by none (0 when none).
    int lastError() const { return last_error_; }

    // The surface's size at the logical DPI.
    QSize sizeHint() const override;
    QSize minimumSizeHint() const override { return sizeHint(); }

signals:
    void kelEvent(int number, const QString& name, QVariantList& args);
    void kelPropertyChanged(const QString& name);
    void runtimeError(int number, const QString& message);

protected:
    // The wrappers emit their typed signals here; `args` as the control raised them.
    virtual void emitEvent(int number, std::span<EventArg> args);
    // Runs a typed accessor or method: a run-time error is reported, not thrown.
    template <class F>
    auto reporting(F&& f) -> decltype(f()) {
        try {
            return f();
        } catch (const RuntimeError& e) {
            report(e);
        } catch (const model::FormError& e) {
            report_text(e.what());
        }
        return decltype(f())();
    }
    // Members through the member table, the views synced after a write or call.
    Variant getMember(std::string_view name, const Variant* index = nullptr);
    void putMember(std::string_view name, const Variant& value, const Variant* index = nullptr);
    void callMember(std::string_view name, std::vector<Variant> args);
    // The application's class of that name (FormError when the catalogue lacks it).
    static const ClassInfo* catalogueClass(const char* name);
    // Event arguments as the typed signals take them, and back when a slot changed one.
    template <class T>
    static T argValue(std::span<EventArg> args, std::size_t i);
    template <class T>
    static void putArg(std::span<EventArg> args, std::size_t i, const T& value) {
        if (i < args.size() && !(argValue<T>(args, i) == value)) args[i].value = argVariant(value);
    }
    static Variant argVariant(short v) { return Variant(static_cast<int16_t>(v)); }
    static Variant argVariant(int v) { return Variant(static_cast<int32_t>(v)); }
    static Variant argVariant(float v) { return Variant(v); }
    static Variant argVariant(double v) { return Variant(v); }
    static Variant argVariant(bool v) { return Variant(v); }
    static Variant argVariant(const QString& v);
    static Variant argVariant(const QVariant& v);
    void report(const RuntimeError& e);
    void report_text(const char* message);
    // After a call through the member table: views show the models, queued keys go.
    void after_call();

    void paintEvent(QPaintEvent* e) override;
    void resizeEvent(QResizeEvent* e) override;

    // SiteOwner
    void site_event(int number, std::string_view name, std::span<EventArg> args) override;
    void site_property_changed(std::string_view name) override;
    void site_synced() override;

private:
    void build(const std::optional<model::StoredValues>& store, float width, float height);

    Services& services_;
    const ClassInfo& cls_;
    std::string name_;
    std::unique_ptr<QtSite> site_;
    QSize applied_;
    // The surface as last painted: repainted only when it changes.
    Colour shown_back_ = 0, shown_fore_ = 0;
    int16_t shown_border_ = -1;
    int last_error_ = 0;
};

template <>
short ControlWidget::argValue<short>(std::span<EventArg> args, std::size_t i);
template <>
int ControlWidget::argValue<int>(std::span<EventArg> args, std::size_t i);
template <>
float ControlWidget::argValue<float>(std::span<EventArg> args, std::size_t i);
template <>
double ControlWidget::argValue<double>(std::span<EventArg> args, std::size_t i);
template <>
bool ControlWidget::argValue<bool>(std::span<EventArg> args, std::size_t i);
template <>
QString ControlWidget::argValue<QString>(std::span<EventArg> args, std::size_t i);
template <>
QVariant ControlWidget::argValue<QVariant>(std::span<EventArg> args, std::size_t i);

// The control of class `creation.cls` as its wrapper class when it has one (KelNumeric, ...),
// else as a plain ControlWidget.
ControlWidget* create_control_widget(const ControlWidget::Creation& creation, QWidget* parent);

}  // namespace kel::qt
