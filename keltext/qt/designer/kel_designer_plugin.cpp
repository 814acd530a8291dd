#include "keltext/qt/designer/kel_designer_plugin.h"

#include <QAction>
#include <QDesignerFormEditorInterface>
#include <QDesignerFormWindowCursorInterface>
#include <QDesignerFormWindowInterface>
#include <QDesignerPropertySheetExtension>
#include <QExtensionManager>
#include <QFont>
#include <QPainter>
#include <QMetaProperty>
#include <QPixmap>

#include "keltext/qt/control_widget.h"
#include "keltext/qt/page_view.h"
#include "keltext/qt/services.h"

namespace kel::qt::designer {
namespace {

constexpr const char* kSettings = "kelSettings";

QDesignerPropertySheetExtension* sheet_of(QDesignerFormWindowInterface* form, QWidget* w) {
    if (!form || !form->core() || !form->core()->extensionManager()) return nullptr;
    return qt_extension<QDesignerPropertySheetExtension*>(form->core()->extensionManager(), w);
}

// Every property edit changes what WriteProperties writes: kelSettings is marked changed, so
// Designer writes it and reads it back when the form is opened again. The typed properties are
// marked unchanged: set one by one after kelSettings when the .ui is loaded, they would undo
// what it loaded (NoOfDecimals resets the bounds, a double Increment changes the stored kind).
void mark_settings_changed(ControlWidget* w) {
    QDesignerFormWindowInterface* form = QDesignerFormWindowInterface::findFormWindow(w);
    QDesignerPropertySheetExtension* sheet = sheet_of(form, w);
    if (!sheet) return;
    const QMetaObject* meta = w->metaObject();
    const int own_first = ControlWidget::staticMetaObject.propertyOffset();
    for (int i = 0; i < sheet->count(); ++i) {
        const QString name = sheet->propertyName(i);
        if (name == QLatin1String(kSettings)) {
            sheet->setChanged(i, true);
            continue;
        }
        const int p = meta->indexOfProperty(name.toLatin1().constData());
        if (p >= own_first && !meta->property(p).isStored()) sheet->setChanged(i, false);
    }
}

// After the edit: Designer marks the edited property changed once its setter has returned.
void mark_settings_changed_later(ControlWidget* w) {
    QMetaObject::invokeMethod(w, [w] { mark_settings_changed(w); }, Qt::QueuedConnection);
}

QIcon make_icon(const QString& glyph) {
    QPixmap pixmap(22, 22);
    pixmap.fill(QColor(0xC8, 0xEC, 0xFF));  // the controls' pale blue
    QPainter painter(&pixmap);
    painter.setPen(QColor(0x00, 0x00, 0xC0));  // and their dark blue text
    painter.drawRect(0, 0, 21, 21);
    QFont font = painter.font();
    font.setPixelSize(10);
    font.setBold(true);
    painter.setFont(font);
    painter.drawText(pixmap.rect(), Qt::AlignCenter, glyph);
    return QIcon(pixmap);
}

}  // namespace

ControlPlugin::ControlPlugin(const char* class_name, const char* tool_tip, QObject* parent)
    : QObject(parent), class_name_(QString::fromLatin1(class_name)), tool_tip_(QString::fromUtf8(tool_tip)) {}

QString ControlPlugin::name() const { return QStringLiteral("kel::qt::") + class_name_; }

QIcon ControlPlugin::icon() const {
    if (class_name_ == QLatin1String("KelAlphaNumeric")) return make_icon(QStringLiteral("Ab"));
    if (class_name_ == QLatin1String("KelNumeric")) return make_icon(QStringLiteral("1.5"));
    if (class_name_ == QLatin1String("KelDateMask")) return make_icon(QStringLiteral("d/m"));
    return make_icon(QStringLiteral("A\u25BE"));
}

void ControlPlugin::initialize(QDesignerFormEditorInterface* core) {
    if (core_) return;
    core_ = core;
    // Designer is where forms are designed: every control it shows is in design mode.
    Services::of_application().set_user_mode(false);
    if (QExtensionManager* manager = core->extensionManager())
        manager->registerExtensions(new TaskMenuFactory(manager), Q_TYPEID(QDesignerTaskMenuExtension));
}

QWidget* ControlPlugin::createWidget(QWidget* parent) {
    const ClassInfo* cls = Services::of_application().catalogue().find(class_name_.toStdString());
    if (!cls) return nullptr;
    ControlWidget* w = create_control_widget({cls, class_name_.toStdString(), 1200, 300, std::nullopt}, parent);
    if (core_) QObject::connect(w, &ControlWidget::kelPropertyChanged, w, [w] { mark_settings_changed_later(w); });
    return w;
}

QString ControlPlugin::domXml() const {
    QString object = class_name_;
    object[0] = object[0].toLower();
    return QStringLiteral("<ui language=\"c++\"><widget class=\"%1\" name=\"%2\"/></ui>").arg(name(), object);
}

EditListTaskMenu::EditListTaskMenu(ControlWidget* combo, QObject* parent)
    : QObject(parent), combo_(combo), edit_list_(new QAction(tr("Edit List..."), this)) {
    connect(edit_list_, &QAction::triggered, this, &EditListTaskMenu::open_dialog);
}

// The page edits a copy of the combo that nobody sees: Apply gives the copy's settings to the
// combo as one property edit, which Designer records (and undoes) as such. The combo itself
// is re-created by that edit, so the page must not hold on to it.
void EditListTaskMenu::open_dialog() {
    if (!combo_) return;
    const ClassInfo* page_class = Services::of_application().catalogue().find("pagCombo");
    if (!page_class) return;
    QWidget* top = combo_->window();
    auto* copy = create_control_widget({&combo_->classInfo(), "Copy", 1200, 300, combo_->save()}, nullptr);
    auto* dialog = new PageDialog(*page_class, {&copy->site()}, top);
    copy->setParent(dialog);
    copy->hide();
    dialog->setAttribute(Qt::WA_DeleteOnClose);
    dialog->setObjectName(QStringLiteral("kelEditList"));
    QPointer<ControlWidget> combo = combo_;
    connect(dialog, &PageDialog::applied, dialog, [combo, copy] {
        if (combo) record_settings(*combo, copy->kelSettings());
    });
    dialog->open();
}

QObject* TaskMenuFactory::createExtension(QObject* object, const QString& iid, QObject* parent) const {
    if (iid != Q_TYPEID(QDesignerTaskMenuExtension)) return nullptr;
    auto* w = qobject_cast<ControlWidget*>(object);
    if (!w || w->classInfo().name != "KelCombo") return nullptr;
    return new EditListTaskMenu(w, parent);
}

void record_settings(ControlWidget& control, const QString& settings) {
    QDesignerFormWindowInterface* form = QDesignerFormWindowInterface::findFormWindow(&control);
    if (form && form->cursor()) {
        form->cursor()->setWidgetProperty(&control, QString::fromLatin1(kSettings), settings);
        mark_settings_changed_later(&control);
        return;
    }
    control.setKelSettings(settings);
}

Collection::Collection(QObject* parent) : QObject(parent) {
    widgets_ = {
        new ControlPlugin("KelAlphaNumeric",
                          "One-line text box that lets one class of characters through and shapes case as you type",
                          this),
        new ControlPlugin("KelNumeric",
                          "Decimal number box: fixed decimals, Indian digit grouping, a range and spin buttons", this),
        new ControlPlugin("KelDateMask",
                          "Masked date box (dd/mm/yyyy or mm/yyyy) that completes and checks the date, with a "
                          "calendar button",
                          this),
        new ControlPlugin("KelCombo",
                          "Drop-down combo box with a character filter, incremental search and item data; the "
                          "list is edited with Edit List...",
                          this),
    };
}

}  // namespace kel::qt::designer
