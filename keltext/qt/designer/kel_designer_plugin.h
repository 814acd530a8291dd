#pragma once
// The KelText controls in Qt Designer: a custom-widget collection (group "KelText") with the
// four controls, and on the combo the task-menu entry "Edit List..." that opens its property
// page in a dialog.
//
// While Designer runs the plugin (initialize() is Designer's call alone), the controls are in
// design mode; an application loading a .ui through QUiLoader creates them through the same
// plugin in run mode.
//
// A control keeps its settings in the stored property kelSettings (what its WriteProperties
// writes): every property edit marks kelSettings changed in Designer's property sheet, so
// that Designer writes it into the .ui; the typed properties are not stored.
#include <QtUiPlugin/QDesignerCustomWidgetCollectionInterface>
#include <QtUiPlugin/QDesignerCustomWidgetInterface>
#include <QDesignerTaskMenuExtension>
#include <QExtensionFactory>
#include <QObject>
#include <QPointer>
#include <QtPlugin>

class QDesignerFormEditorInterface;

namespace kel::qt {

class ControlWidget;

namespace designer {

class ControlPlugin final : public QObject, public QDesignerCustomWidgetInterface {
    Q_OBJECT
    Q_INTERFACES(QDesignerCustomWidgetInterface)

public:
    // `class_name`: the control's class (KelNumeric); the widget is kel::qt::<class_name>.
    ControlPlugin(const char* class_name, const char* tool_tip, QObject* parent);

    QString name() const override;
    QString group() const override { return QStringLiteral("KelText"); }
    QString toolTip() const override { return tool_tip_; }
    QString whatsThis() const override { return tool_tip_; }
    QString includeFile() const override { return QStringLiteral("keltext/qt/kel_controls.h"); }
    QIcon icon() const override;
    bool isContainer() const override { return false; }
    QWidget* createWidget(QWidget* parent) override;
    bool isInitialized() const override { return core_ != nullptr; }
    void initialize(QDesignerFormEditorInterface* core) override;
    QString domXml() const override;

private:
    QString class_name_;
    QString tool_tip_;
    QDesignerFormEditorInterface* core_ = nullptr;
};

// "Edit List...": the combo's property page in a dialog, on the selected combo.
class EditListTaskMenu final : public QObject, public QDesignerTaskMenuExtension {
    Q_OBJECT
    Q_INTERFACES(QDesignerTaskMenuExtension)

public:
    EditListTaskMenu(ControlWidget* combo, QObject* parent);
    QAction* preferredEditAction() const override { return edit_list_; }
    QList<QAction*> taskActions() const override { return {edit_list_}; }

private:
    void open_dialog();

    QPointer<ControlWidget> combo_;
    QAction* edit_list_;
};

class TaskMenuFactory final : public QExtensionFactory {
    Q_OBJECT

public:
    explicit TaskMenuFactory(QExtensionManager* parent) : QExtensionFactory(parent) {}

protected:
    QObject* createExtension(QObject* object, const QString& iid, QObject* parent) const override;
};

class Collection final : public QObject, public QDesignerCustomWidgetCollectionInterface {
    Q_OBJECT
    Q_PLUGIN_METADATA(IID "org.qt-project.Qt.QDesignerCustomWidgetCollectionInterface")
    Q_INTERFACES(QDesignerCustomWidgetCollectionInterface)

public:
    explicit Collection(QObject* parent = nullptr);
    QList<QDesignerCustomWidgetInterface*> customWidgets() const override { return widgets_; }

private:
    QList<QDesignerCustomWidgetInterface*> widgets_;
};

// Writes `settings` into the control's kelSettings as Designer's own edit: one undoable step,
// marked changed so that the .ui keeps it. Outside a Designer form, sets it directly.
void record_settings(ControlWidget& control, const QString& settings);

}  // namespace designer
}  // namespace kel::qt
