#include "keltext/qt/views.h"

#include <QApplication>
#include <QClipboard>
#include <QContextMenuEvent>
#include <QFocusEvent>
#include <QHBoxLayout>
#include <QInputMethodEvent>
#include <QKeyEvent>
#include <QMenu>
#include <QMouseEvent>
#include <QVBoxLayout>
#include <limits>

#include "keltext/host/keys.h"
#include "keltext/qt/qt_keys.h"
#include "keltext/qt/qt_values.h"
#include "keltext/qt/services.h"

namespace kel::qt {
namespace {

bool takes_input(QtSite& site, model::InputPart& part) {
    return site.surface_model().Enabled() && part.input_enabled();
}

QRect rect_of(const Widget& model, const QtSite& site) {
    return QRect(site.to_pixels(model.Left()), site.to_pixels(model.Top()), site.to_pixels(model.Width()),
                 site.to_pixels(model.Height()));
}

// Mouse positions reach the controls in twips, relative to the widget.
float twips_x(const QtSite& site, const QPointF& p) { return site.to_twips(static_cast<int>(p.x())); }
float twips_y(const QtSite& site, const QPointF& p) { return site.to_twips(static_cast<int>(p.y())); }

int16_t button_of(Qt::MouseButton b) {
    switch (b) {
    case Qt::LeftButton: return 1;
    case Qt::RightButton: return 2;
    case Qt::MiddleButton: return 4;
    default: return 0;
    }
}

}  // namespace

void sync_widget(QWidget& view, const Widget& model, const QtSite& site) {
    const QRect r = rect_of(model, site);
    if (view.geometry() != r) view.setGeometry(r);
    if (view.isVisibleTo(view.parentWidget()) != model.Visible()) view.setVisible(model.Visible());
}

void sync_text_style(QWidget& view, const TextWidget& model, ShownStyle& shown) {
    const auto f = model.Font();
    if (f && (!shown.set || !shown.font.same_as(*f))) {
        view.setFont(qfont_of(*f));
        shown.font = *f;
    }
    if (!shown.set || shown.fore != model.ForeColor() || shown.back != model.BackColor()) {
        QPalette p = view.palette();
        p.setColor(QPalette::Base, qcolor_of(model.BackColor()));
        p.setColor(QPalette::Text, qcolor_of(model.ForeColor()));
        view.setPalette(p);
        shown.fore = model.ForeColor();
        shown.back = model.BackColor();
    }
    shown.set = true;
}

void deliver_click(QtSite& site, model::InputPart& part) {
    site.services().run_pending();
    if (takes_input(site, part)) part.user_click();
    site.services().after_input();
}

void deliver_notification(QtSite& site, model::InputPart& part, std::string_view notification) {
    site.services().run_pending();
    if (takes_input(site, part)) part.user_notify(notification);
    site.services().after_input();
}

// ---- edit field

EditFieldView::EditFieldView(QtSite& site, EditField& field, model::InputPart& input, QWidget* parent, bool in_combo)
    : QLineEdit(parent), site_(site), field_(field), input_(input), in_combo_(in_combo) {
    // The model holds the limit: the view shows any length (QLineEdit would cut at 32767).
    setMaxLength(std::numeric_limits<int>::max());
    setFrame(false);
    setDragEnabled(false);
    setAcceptDrops(false);
    setContextMenuPolicy(Qt::DefaultContextMenu);
    setFocusPolicy(Qt::ClickFocus);
    setAttribute(Qt::WA_InputMethodEnabled);
    sync();
}

std::string EditFieldView::shown_text() const { return cp1252_of(text()).value_or(std::string()); }

void EditFieldView::sync_text() {
    const QString t = qstring_of(field_.Text());
    if (text() != t) setText(t);
    const int start = field_.SelStart();
    const int length = field_.SelLength();
    if (length > 0) {
        if (selectionStart() != start || selectionLength() != length || cursorPosition() != start + length)
            setSelection(start, length);
    } else if (hasSelectedText() || cursorPosition() != start) {
        setCursorPosition(start);
    }
}

void EditFieldView::sync() {
    if (!in_combo_) {
        sync_widget(*this, field_, site_);
        sync_text_style(*this, field_, style_);
    }
    sync_text();
}

bool EditFieldView::event(QEvent* e) {
    Services& s = site_.services();
    switch (e->type()) {
    case QEvent::ShortcutOverride:
        return s.route_shortcut_override(site_, static_cast<QKeyEvent*>(e));
    case QEvent::KeyPress:
        s.route_key_press(site_, static_cast<QKeyEvent*>(e));
        return true;
    case QEvent::KeyRelease:
        s.route_key_release(site_, static_cast<QKeyEvent*>(e));
        return true;
    case QEvent::FocusIn: {
        // Qt's own focus handling draws the caret; the model's caret and selection then stand.
        const bool r = QLineEdit::event(e);
        s.route_focus_in(site_, static_cast<QFocusEvent*>(e));
        sync_text();
        return r;
    }
    case QEvent::FocusOut: {
        const bool r = QLineEdit::event(e);
        s.route_focus_out(site_, static_cast<QFocusEvent*>(e));
        if (!in_combo_) sync_text();
        return r;
    }
    case QEvent::MouseButtonPress:
    case QEvent::MouseButtonRelease:
    case QEvent::MouseButtonDblClick:
    case QEvent::MouseMove:
        return route_mouse(e);
    case QEvent::ContextMenu:
        show_context_menu(static_cast<QContextMenuEvent*>(e)->globalPos());
        return true;
    case QEvent::DragEnter:
    case QEvent::DragMove:
    case QEvent::Drop:
        // Dropped text would go around the controls' filters.
        e->ignore();
        return true;
    default: break;
    }
    return QLineEdit::event(e);
}

void EditFieldView::inputMethodEvent(QInputMethodEvent* e) { site_.services().route_input_method(site_, e); }

bool EditFieldView::route_mouse(QEvent* e) {
    auto* m = static_cast<QMouseEvent*>(e);
    Services& s = site_.services();
    if (!takes_input(site_, input_)) return true;
    const int16_t shift = shift_state(m->modifiers());
    const QPointF p = m->position();
    s.run_pending();
    switch (e->type()) {
    case QEvent::MouseButtonPress:
        if (m->button() == Qt::LeftButton) {
            drag_anchor_ = cursorPositionAt(m->pos());
            input_.user_select(drag_anchor_, 0);
        }
        input_.user_mouse(true, button_of(m->button()), shift, twips_x(site_, p), twips_y(site_, p));
        if (m->button() == Qt::MiddleButton && QApplication::clipboard()->supportsSelection()) {
            input_.user_select(cursorPositionAt(m->pos()), 0);
            s.route_paste(site_, QApplication::clipboard()->text(QClipboard::Selection));
        }
        break;
    case QEvent::MouseMove:
        if ((m->buttons() & Qt::LeftButton) && drag_anchor_ >= 0) {
            const int at = cursorPositionAt(m->pos());
            input_.user_select(std::min(at, drag_anchor_), std::abs(at - drag_anchor_));
        }
        break;
    case QEvent::MouseButtonRelease:
        input_.user_mouse(false, button_of(m->button()), shift, twips_x(site_, p), twips_y(site_, p));
        if (m->button() == Qt::LeftButton) {
            drag_anchor_ = -1;
            input_.user_notify("Click");
        }
        break;
    case QEvent::MouseButtonDblClick:
        input_.user_notify("DblClick");
        break;
    default: break;
    }
    s.after_input();
    return true;
}

void EditFieldView::show_context_menu(const QPoint& global) {
    // The menu's focus change (a popup) is not the control's: no exit formatting runs.
    QMenu menu(this);
    const bool has_selection = field_.SelLength() > 0;
    const bool editable = takes_input(site_, input_);
    QAction* copy = menu.addAction(tr("&Copy"));
    copy->setEnabled(has_selection);
    QAction* paste = menu.addAction(tr("&Paste"));
    paste->setEnabled(editable && !QApplication::clipboard()->text().isEmpty());
    menu.addSeparator();
    QAction* select_all = menu.addAction(tr("Select &All"));
    select_all->setEnabled(editable && !field_.Text().empty());
    QAction* chosen = menu.exec(global);
    if (!chosen) return;
    Services& s = site_.services();
    if (chosen == copy) {
        s.clipboard().set_text(field_.SelText());
    } else if (chosen == paste) {
        s.route_paste(site_, QApplication::clipboard()->text());
    } else if (chosen == select_all) {
        input_.user_select(0, static_cast<int32_t>(field_.Text().size()));
        s.after_input();
    }
}

// ---- combo

ComboView::ComboView(QtSite& site, model::ComboBoxModel& combo, QWidget* parent)
    : QComboBox(parent), site_(site), combo_(combo) {
    setEditable(true);
    // The edit field is the model's: no completer, no insertion of typed entries, and no
    // items in Qt's own model, so that nothing in QComboBox ever sets the edit text.
    setInsertPolicy(QComboBox::NoInsert);
    edit_ = new EditFieldView(site, combo, combo, this, true);
    setLineEdit(edit_);
    setCompleter(nullptr);
    setFocusPolicy(Qt::ClickFocus);
    sync();
}

void ComboView::sync() {
    sync_widget(*this, combo_, site_);
    sync_text_style(*edit_, combo_, style_);
    edit_->sync_text();
}

bool ComboView::event(QEvent* e) {
    Services& s = site_.services();
    switch (e->type()) {
    case QEvent::ShortcutOverride:
        return s.route_shortcut_override(site_, static_cast<QKeyEvent*>(e));
    case QEvent::KeyPress: {
        auto* k = static_cast<QKeyEvent*>(e);
        s.route_key_press(site_, k);
        // After the control had the key, F4 and Alt+Down or Alt+Up open the list, as the
        // terminal form does.
        const bool alt = k->modifiers() == Qt::AltModifier;
        if ((k->key() == Qt::Key_F4 && k->modifiers() == Qt::NoModifier) ||
            (alt && (k->key() == Qt::Key_Down || k->key() == Qt::Key_Up)))
            showPopup();
        return true;
    }
    case QEvent::KeyRelease:
        s.route_key_release(site_, static_cast<QKeyEvent*>(e));
        return true;
    case QEvent::Wheel:
        return true;  // Qt's wheel would step the current index
    case QEvent::FocusIn: {
        const bool r = QComboBox::event(e);
        s.route_focus_in(site_, static_cast<QFocusEvent*>(e));
        edit_->sync_text();
        return r;
    }
    case QEvent::FocusOut: {
        const bool r = QComboBox::event(e);
        s.route_focus_out(site_, static_cast<QFocusEvent*>(e));
        edit_->sync_text();
        return r;
    }
    case QEvent::InputMethod:
        s.route_input_method(site_, static_cast<QInputMethodEvent*>(e));
        return true;
    default: break;
    }
    return QComboBox::event(e);
}

void ComboView::showPopup() {
    // The list is the model's: shown in a popup of our own, a pick is the model's ListIndex.
    if (!takes_input(site_, combo_)) return;
    deliver_notification(site_, combo_, "DropDown");
    if (!popup_) {
        popup_ = new QListWidget(this);
        popup_->setWindowFlags(Qt::Popup);
        popup_->setFocusPolicy(Qt::NoFocus);
        const auto pick = [this](QListWidgetItem* item) {
            // Styles that activate on a single click send both signals for one click.
            if (!popup_->isVisible()) return;
            const int row = popup_->row(item);
            popup_->hide();
            site_.services().run_pending();
            if (row >= 0 && row < combo_.ListCount() && takes_input(site_, combo_))
                site_.guarded(combo_.part_name(), "Click", [&] { combo_.ListIndex(row); });
            site_.services().after_input();
        };
        // A click on an entry, or Enter on the one the arrow keys reached.
        connect(popup_, &QListWidget::itemClicked, this, pick);
        connect(popup_, &QListWidget::itemActivated, this, pick);
    }
    popup_->clear();
    std::string scratch;
    for (int32_t i = 0; i < combo_.ListCount(); ++i) popup_->addItem(qstring_of(std::string(combo_.list_text(i, scratch))));
    popup_->setCurrentRow(combo_.ListIndex());
    popup_->setFixedWidth(width());
    popup_->move(mapToGlobal(QPoint(0, height())));
    popup_->show();
}

void ComboView::hidePopup() {
    if (popup_) popup_->hide();
}

// ---- list box

ListView::ListView(QtSite& site, model::ListBoxModel& list, QWidget* parent)
    : QListWidget(parent), site_(site), list_(list) {
    setFocusPolicy(Qt::NoFocus);
    connect(this, &QListWidget::itemClicked, this, [this](QListWidgetItem* item) {
        const int row = this->row(item);
        site_.services().run_pending();
        if (row >= 0 && row < list_.ListCount() && takes_input(site_, list_))
            site_.guarded(list_.part_name(), "Click", [&] { list_.ListIndex(row); });
        site_.services().after_input();
    });
    sync();
}

void ListView::sync() {
    sync_widget(*this, list_, site_);
    std::string scratch;
    bool same = count() == list_.ListCount();
    for (int32_t i = 0; same && i < count(); ++i) same = item(i)->text() == qstring_of(std::string(list_.list_text(i, scratch)));
    const QSignalBlocker block(this);
    if (!same) {
        clear();
        for (int32_t i = 0; i < list_.ListCount(); ++i) addItem(qstring_of(std::string(list_.list_text(i, scratch))));
    }
    if (currentRow() != list_.ListIndex()) setCurrentRow(list_.ListIndex());
}

// ---- spin buttons

SpinView::SpinView(QtSite& site, model::SpinButtonModel& spin, QWidget* parent)
    : QWidget(parent), site_(site), spin_(spin), up_(new QToolButton(this)), down_(new QToolButton(this)) {
    setFocusPolicy(Qt::NoFocus);
    up_->setArrowType(Qt::UpArrow);
    down_->setArrowType(Qt::DownArrow);
    for (QToolButton* b : {up_, down_}) {
        b->setFocusPolicy(Qt::NoFocus);
        b->setAutoRepeat(true);
    }
    connect(up_, &QToolButton::clicked, this, [this] { deliver_notification(site_, spin_, "UpClick"); });
    connect(down_, &QToolButton::clicked, this, [this] { deliver_notification(site_, spin_, "DownClick"); });
    sync();
}

void SpinView::sync() { sync_widget(*this, spin_, site_); }

void SpinView::resizeEvent(QResizeEvent*) {
    const int half = height() / 2;
    up_->setGeometry(0, 0, width(), half);
    down_->setGeometry(0, half, width(), height() - half);
}

// ---- the simpler widgets

ImageView::ImageView(QtSite& site, model::ImageModel& image, QWidget* parent)
    : QToolButton(parent), site_(site), image_(image) {
    setFocusPolicy(Qt::NoFocus);
    setArrowType(Qt::DownArrow);
    connect(this, &QToolButton::clicked, this, [this] { deliver_click(site_, image_); });
    sync();
}

void ImageView::sync() { sync_widget(*this, image_, site_); }

CheckView::CheckView(QtSite& site, model::CheckBoxModel& check, QWidget* parent)
    : QCheckBox(parent), site_(site), check_(check) {
    setFocusPolicy(Qt::NoFocus);
    setTristate(true);
    connect(this, &QCheckBox::clicked, this, [this] { deliver_click(site_, check_); });
    sync();
}

void CheckView::sync() {
    sync_widget(*this, check_, site_);
    const QString caption = qstring_of(check_.Caption());
    if (text() != caption) setText(caption);
    const Qt::CheckState state = check_.Value() == 1 ? Qt::Checked : check_.Value() == 2 ? Qt::PartiallyChecked : Qt::Unchecked;
    if (checkState() != state) {
        const QSignalBlocker block(this);
        setCheckState(state);
    }
}

ButtonView::ButtonView(QtSite& site, model::PushButtonModel& button, QWidget* parent)
    : QPushButton(parent), site_(site), button_(button) {
    setFocusPolicy(Qt::NoFocus);
    connect(this, &QPushButton::clicked, this, [this] { deliver_click(site_, button_); });
    sync();
}

void ButtonView::sync() {
    sync_widget(*this, button_, site_);
    const QString caption = qstring_of(button_.Caption());
    if (text() != caption) setText(caption);
}

LabelView::LabelView(QtSite& site, model::LabelModel& label, QWidget* parent)
    : QLabel(parent), site_(site), label_(label) {
    sync();
}

void LabelView::sync() {
    sync_widget(*this, label_, site_);
    const QString caption = qstring_of(label_.Caption());
    if (text() != caption) setText(caption);
}

void LabelView::mouseReleaseEvent(QMouseEvent* e) {
    if (e->button() == Qt::LeftButton) deliver_click(site_, label_);
}

FrameView::FrameView(QtSite& site, model::FrameModel& frame, QWidget* parent)
    : QGroupBox(parent), site_(site), frame_(frame) {
    sync();
}

void FrameView::sync() {
    sync_widget(*this, frame_, site_);
    const QString caption = qstring_of(frame_.Caption());
    if (title() != caption) setTitle(caption);
}

}  // namespace kel::qt
