// The Designer plugin as Designer and an application use it: the collection, the controls in
// design mode, "Edit List..." on the combo, and a form saved by the form builder and loaded
// with QUiLoader, which must hold exactly what the minimal host's save and load give.
#include <QApplication>
#include <QBuffer>
#include <QtUiPlugin/QDesignerCustomWidgetCollectionInterface>
#include <QDesignerFormEditorInterface>
#include <QDesignerTaskMenuExtension>
#include <QExtensionManager>
#include <QFileInfo>
#include <QFormBuilder>
#include <QMetaProperty>
#include <QPluginLoader>
#include <QPushButton>
#include <QTest>
#include <QUiLoader>
#include <map>
#include <memory>

#include "keltext/host/conversions.h"
#include "keltext/minihost/form.h"
#include "keltext/qt/control_widget.h"
#include "keltext/qt/page_view.h"
#include "keltext/qt/property_bag.h"
#include "keltext/qt/services.h"

using namespace kel;
using namespace kel::qt;

namespace {

const QStringList kClasses = {"kel::qt::KelAlphaNumeric", "kel::qt::KelNumeric", "kel::qt::KelDateMask",
                              "kel::qt::KelCombo"};

// Every key each class stores, with a value that is not its default (the numeric's Maxvalue
// before NoOfDecimals: set one by one in that order, the bound would be lost).
const std::map<QString, std::string> kStores = {
    {"kel::qt::KelAlphaNumeric",
     "store BorderStyle 0\nstore TextType i32:1\nstore Forecolor 0x0000FF\nstore Backcolor 0x00FFFF\n"
     "store Font font:\"Arial\":12:bold\nstore MaxLength i32:10\nstore Text \"AB12\"\nstore Locked true\n"
     "store Enabled false\nstore TextSelect false\n"},
    {"kel::qt::KelNumeric",
     "store Maxvalue 5000\nstore NoOfDecimals 2\nstore Increment 5\nstore UpDownScroll true\nstore MinValue 10\n"
     "store BorderStyle 0\nstore Forecolor 0x0000FF\nstore Backcolor 0x00FFFF\nstore Font font:\"Arial\":12\n"
     "store MaxLength 10\nstore Locked true\nstore Enabled false\nstore TriggerError true\nstore TxtFormat true\n"},
    {"kel::qt::KelDateMask",
     "store DateStyle i32:1\nstore Forecolor 0x0000FF\nstore Backcolor 0x00FFFF\nstore Font font:\"Arial\":12:italic\n"
     "store ShowCalendar false\nstore Enabled false\nstore Locked true\nstore TriggerError true\nstore ZubDate false\n"
     "store AllowBlankDate true\nstore CalendarPosition u8:0\n"},
    {"kel::qt::KelCombo",
     "store TextType i32:2\nstore Forecolor 0x0000FF\nstore Backcolor 0x00FFFF\nstore Font font:\"Arial\":12\n"
     "store MaxLength 8\nstore Text \"CASH\"\nstore AutoSearch true\nstore Locked true\nstore Enabled false\n"
     "store FillList \"CASH\\xC91\\xC8CARD\\xC92\\xC8\"\n"},
};

// One property each class is edited through, as in Designer's property editor.
const std::map<QString, std::pair<const char*, QVariant>> kEdits = {
    {"kel::qt::KelAlphaNumeric", {"MaxLength", 20}},
    {"kel::qt::KelNumeric", {"NoOfDecimals", 3}},
    {"kel::qt::KelDateMask", {"Locked", false}},
    {"kel::qt::KelCombo", {"MaxLength", 12}},
};

// What the minimal host holds after loading `store` and saving it again.
model::StoredValues minimal_host_round_trip(const ClassInfo& cls, const model::StoredValues& store) {
    mini::Form form;
    model::HostedControl& c = form.load(cls, "c", store);
    return form.save(c);
}

// Designer's form editor as a plugin meets it: with its extension manager.
class TestCore final : public QDesignerFormEditorInterface {
public:
    explicit TestCore(QObject* parent) : QDesignerFormEditorInterface(parent) {
        setExtensionManager(new QExtensionManager(this));
    }
};

// The form builder as Designer writes with the plugin: the controls' typed properties are not
// written (Designer's property sheet keeps only kelSettings marked changed). A bare QFormBuilder
// writes every readable property, stored or not.
class DesignerFormBuilder final : public QFormBuilder {
protected:
    bool checkProperty(QObject* obj, const QString& prop) const override {
        if (qobject_cast<ControlWidget*>(obj)) {
            const QMetaObject* meta = obj->metaObject();
            const int p = meta->indexOfProperty(prop.toLatin1().constData());
            if (p >= ControlWidget::staticMetaObject.propertyOffset() && !meta->property(p).isStored()) return false;
        }
        return QFormBuilder::checkProperty(obj, prop);
    }
};

}  // namespace

class DesignerTest : public QObject {
    Q_OBJECT

private slots:
    void initTestCase();
    void collection_has_the_four_controls();
    void design_mode_widens_the_alphanumeric_box();
    void edit_list_applies_through_the_page();
    void ui_round_trip_equals_the_minimal_host();
    void cleanupTestCase();

private:
    QDesignerCustomWidgetInterface* plugin_for(const QString& name);
    ControlWidget* create(const QString& name, QWidget* parent);

    std::unique_ptr<QPluginLoader> loader_;
    QDesignerCustomWidgetCollectionInterface* collection_ = nullptr;
    QDesignerFormEditorInterface* core_ = nullptr;
};

void DesignerTest::initTestCase() {
    loader_ = std::make_unique<QPluginLoader>(QStringLiteral(KELTEXT_DESIGNER_PLUGIN));
    QObject* instance = loader_->instance();
    QVERIFY2(instance, qPrintable(loader_->errorString()));
    collection_ = qobject_cast<QDesignerCustomWidgetCollectionInterface*>(instance);
    QVERIFY(collection_);
    // Designer's side: a form editor with its extension manager, as Designer initializes plugins.
    core_ = new TestCore(this);
}

void DesignerTest::cleanupTestCase() { Services::of_application().set_user_mode(true); }

QDesignerCustomWidgetInterface* DesignerTest::plugin_for(const QString& name) {
    for (QDesignerCustomWidgetInterface* w : collection_->customWidgets())
        if (w->name() == name) return w;
    return nullptr;
}

ControlWidget* DesignerTest::create(const QString& name, QWidget* parent) {
    QDesignerCustomWidgetInterface* plugin = plugin_for(name);
    if (!plugin) return nullptr;
    return qobject_cast<ControlWidget*>(plugin->createWidget(parent));
}

void DesignerTest::collection_has_the_four_controls() {
    QStringList names;
    for (QDesignerCustomWidgetInterface* w : collection_->customWidgets()) {
        names << w->name();
        QCOMPARE(w->group(), QStringLiteral("KelText"));
        QVERIFY(!w->icon().isNull());
        QVERIFY(!w->toolTip().isEmpty());
        QVERIFY(w->domXml().contains(QStringLiteral("class=\"%1\"").arg(w->name())));
        QVERIFY(!w->isContainer());
    }
    QCOMPARE(names, kClasses);
    // Created outside Designer (as QUiLoader does), a control runs in run mode.
    QWidget form;
    for (const QString& name : kClasses) {
        ControlWidget* w = create(name, &form);
        QVERIFY2(w, qPrintable(name));
        QCOMPARE(QString::fromLatin1(w->metaObject()->className()), name);
        QVERIFY(w->site().user_mode());
    }
}

void DesignerTest::design_mode_widens_the_alphanumeric_box() {
    for (QDesignerCustomWidgetInterface* w : collection_->customWidgets()) w->initialize(core_);
    QVERIFY(!Services::of_application().user_mode());
    QWidget form;
    ControlWidget* alpha = create(kClasses[0], &form);
    QVERIFY(!alpha->site().user_mode());
    const float before = alpha->site().surface_model().Width();
    QVERIFY(alpha->setProperty("MaxLength", 40));
    QVERIFY(alpha->site().surface_model().Width() > before);
    QVERIFY(alpha->width() > alpha->site().to_pixels(before));
}

void DesignerTest::edit_list_applies_through_the_page() {
    QWidget form;
    form.show();
    ControlWidget* combo = create(kClasses[3], &form);
    combo->setKelSettings(QString::fromStdString(kStores.at(kClasses[3])));
    auto* menu = qt_extension<QDesignerTaskMenuExtension*>(core_->extensionManager(), combo);
    QVERIFY(menu);
    QVERIFY(!qt_extension<QDesignerTaskMenuExtension*>(core_->extensionManager(), create(kClasses[1], &form)));
    QCOMPARE(menu->taskActions().size(), 1);
    QAction* edit = menu->taskActions().front();
    QCOMPARE(edit->text(), QStringLiteral("Edit List..."));
    edit->trigger();
    auto* dialog = form.findChild<PageDialog*>(QStringLiteral("kelEditList"));
    QVERIFY(dialog);
    QtSite& page = dialog->page().site();
    // The page shows the combo's list; an entry added and the settings changed, Apply writes
    // them to the combo on the form, which shows the new list.
    QCOMPARE(to_int32(page.part("lstList")->peek("ListCount")), 2);
    page.part("txtList")->poke("Text", std::string("CHEQUE"));
    page.part("txtItemData")->poke("Text", std::string("7"));
    QTest::mouseClick(page.view_of(*page.part("cmdAdd")), Qt::LeftButton);
    page.part("txtMaxLength")->poke("Text", std::string("15"));
    page.part("chkLocked")->poke("Value", int16_t{0});
    QVERIFY(dialog->page().changed());
    const QList<QPushButton*> buttons = dialog->findChildren<QPushButton*>();
    QPushButton* apply = nullptr;
    for (QPushButton* b : buttons)
        if (b->text().remove('&') == QStringLiteral("Apply")) apply = b;
    QVERIFY(apply);
    QTest::mouseClick(apply, Qt::LeftButton);
    QVERIFY(!dialog->page().changed());
    QCOMPARE(combo->member("ListCount").toInt(), 3);
    QCOMPARE(combo->site().part("cboCustom")->peek("List", 2).str(), std::string("CHEQUE"));
    QCOMPARE(combo->member("MaxLength").toInt(), 15);
    QCOMPARE(combo->member("Locked").toBool(), false);
    QVERIFY(combo->kelSettings().contains(QStringLiteral("CHEQUE")));
    dialog->reject();
}

void DesignerTest::ui_round_trip_equals_the_minimal_host() {
    Services& services = Services::of_application();
    QWidget form;
    form.setObjectName(QStringLiteral("Form"));
    std::map<QString, model::StoredValues> expected;
    for (const QString& name : kClasses) {
        ControlWidget* w = create(name, &form);
        w->setObjectName(QString(name).remove(QStringLiteral("kel::qt::")));
        w->setKelSettings(QString::fromStdString(kStores.at(name)));
        const auto& [property, value] = kEdits.at(name);
        QVERIFY2(w->setProperty(property, value), property);
        QCOMPARE(w->lastError(), 0);
        expected[w->objectName()] = w->save();
    }
    QBuffer ui;
    ui.open(QIODevice::WriteOnly);
    DesignerFormBuilder builder;
    builder.save(&ui, &form);
    ui.close();
    QVERIFY2(ui.data().contains("kelSettings"), ui.data().constData());

    // An application loads the .ui in run mode.
    services.set_user_mode(true);
    ui.open(QIODevice::ReadOnly);
    QUiLoader loader;
    loader.clearPluginPaths();
    loader.addPluginPath(QFileInfo(QStringLiteral(KELTEXT_DESIGNER_PLUGIN)).absolutePath());
    std::unique_ptr<QWidget> loaded(loader.load(&ui));
    QVERIFY2(loaded, qPrintable(loader.errorString()));
    for (const auto& [object, store] : expected) {
        auto* w = loaded->findChild<ControlWidget*>(object);
        QVERIFY2(w, qPrintable(object));
        const model::StoredValues want = minimal_host_round_trip(w->classInfo(), store);
        QCOMPARE(QString::fromStdString(store_text(w->save())), QString::fromStdString(store_text(want)));
    }
    auto* combo = loaded->findChild<ControlWidget*>(QStringLiteral("KelCombo"));
    QCOMPARE(combo->member("ListCount").toInt(), 2);
    QCOMPARE(combo->member("MaxLength").toInt(), 12);
}

QTEST_MAIN(DesignerTest)
#include "designer_test.moc"
