#pragma once
// Qt views over the widget models. A view shows its model and hands every input event to the
// services; it never edits on its own: the QLineEdit's own keys, undo, context menu, drag and
// drop and middle-click paste are all replaced by the model's, and the combo's QComboBox keeps
// an empty item model so that it can never rewrite the edit text (setCurrentIndex would).
#include <QCheckBox>
#include <QComboBox>
#include <QGroupBox>
#include <QLabel>
#include <QLineEdit>
#include <QListWidget>
#include <QPushButton>
#include <QToolButton>
#include <QWidget>

#include "keltext/qt/site.h"
#include "keltext/widgetmodel/buttons.h"
#include "keltext/widgetmodel/edit_box.h"
#include "keltext/widgetmodel/list_widgets.h"
#include "keltext/widgetmodel/masked_edit.h"

namespace kel::qt {

// Geometry, visibility and font of a view from its model (twips to pixels at the site's DPI).
void sync_widget(QWidget& view, const Widget& model, const QtSite& site);
// What a view last took of its model's font and colours: a keystroke changes neither, and
// building a QFont and a palette for every key would cost more than the key.
struct ShownStyle {
    bool set = false;
    kel::Font font;
    Colour fore = 0, back = 0;
};
// Colours and font of a text widget, when they changed.
void sync_text_style(QWidget& view, const TextWidget& model, ShownStyle& shown);

// A QLineEdit that only shows an edit-field model: the edit box, the masked edit box and the
// combo's edit field.
class EditFieldView final : public QLineEdit, public PartView {
    Q_OBJECT

public:
    // `in_combo`: the line edit of a ComboView (the combo places it and routes its keys).
    EditFieldView(QtSite& site, EditField& field, model::InputPart& input, QWidget* parent, bool in_combo = false);

    QWidget* widget() override { return this; }
    void sync() override;
    // Text, caret and selection only (a combo syncs geometry itself).
    void sync_text();

    // What the view shows, for a driver that checks it against the model.
    std::string shown_text() const;

protected:
    bool event(QEvent* e) override;
    void inputMethodEvent(QInputMethodEvent* e) override;

private:
    bool route_mouse(QEvent* e);
    void show_context_menu(const QPoint& global);

    QtSite& site_;
    EditField& field_;
    model::InputPart& input_;
    bool in_combo_;
    ShownStyle style_;
    int drag_anchor_ = -1;
};

class ComboView final : public QComboBox, public PartView {
    Q_OBJECT

public:
    ComboView(QtSite& site, model::ComboBoxModel& combo, QWidget* parent);

    QWidget* widget() override { return this; }
    void sync() override;
    EditFieldView& edit() { return *edit_; }

    void showPopup() override;
    void hidePopup() override;

protected:
    bool event(QEvent* e) override;

private:
    QtSite& site_;
    model::ComboBoxModel& combo_;
    EditFieldView* edit_;
    ShownStyle style_;
    QListWidget* popup_ = nullptr;
};

class ListView final : public QListWidget, public PartView {
    Q_OBJECT

public:
    ListView(QtSite& site, model::ListBoxModel& list, QWidget* parent);
    QWidget* widget() override { return this; }
    void sync() override;

private:
    QtSite& site_;
    model::ListBoxModel& list_;
};

// The spin button pair: two arrow buttons that never take focus.
class SpinView final : public QWidget, public PartView {
    Q_OBJECT

public:
    SpinView(QtSite& site, model::SpinButtonModel& spin, QWidget* parent);
    QWidget* widget() override { return this; }
    void sync() override;
    QToolButton* up() { return up_; }
    QToolButton* down() { return down_; }

protected:
    void resizeEvent(QResizeEvent* e) override;

private:
    QtSite& site_;
    model::SpinButtonModel& spin_;
    QToolButton* up_;
    QToolButton* down_;
};

// A button-like view whose click is the model's click: the date box's calendar image, push
// buttons, check boxes, labels and frames.
class ImageView final : public QToolButton, public PartView {
    Q_OBJECT

public:
    ImageView(QtSite& site, model::ImageModel& image, QWidget* parent);
    QWidget* widget() override { return this; }
    void sync() override;

private:
    QtSite& site_;
    model::ImageModel& image_;
};

class CheckView final : public QCheckBox, public PartView {
    Q_OBJECT

public:
    CheckView(QtSite& site, model::CheckBoxModel& check, QWidget* parent);
    QWidget* widget() override { return this; }
    void sync() override;

protected:
    // The model decides the new value: Qt's own toggle is not used.
    void nextCheckState() override {}

private:
    QtSite& site_;
    model::CheckBoxModel& check_;
};

class ButtonView final : public QPushButton, public PartView {
    Q_OBJECT

public:
    ButtonView(QtSite& site, model::PushButtonModel& button, QWidget* parent);
    QWidget* widget() override { return this; }
    void sync() override;

private:
    QtSite& site_;
    model::PushButtonModel& button_;
};

class LabelView final : public QLabel, public PartView {
    Q_OBJECT

public:
    LabelView(QtSite& site, model::LabelModel& label, QWidget* parent);
    QWidget* widget() override { return this; }
    void sync() override;

protected:
    void mouseReleaseEvent(QMouseEvent* e) override;

private:
    QtSite& site_;
    model::LabelModel& label_;
};

class FrameView final : public QGroupBox, public PartView {
    Q_OBJECT

public:
    FrameView(QtSite& site, model::FrameModel& frame, QWidget* parent);
    QWidget* widget() override { return this; }
    void sync() override;

private:
    QtSite& site_;
    model::FrameModel& frame_;
};

// Runs a person's click or notification on a part, when the surface and the widget take
// input, then the keys it queued.
void deliver_click(QtSite& site, model::InputPart& part);
void deliver_notification(QtSite& site, model::InputPart& part, std::string_view notification);

}  // namespace kel::qt
