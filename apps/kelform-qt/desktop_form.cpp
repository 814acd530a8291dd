#include "apps/kelform-qt/desktop_form.h"

#include <QApplication>
#include <QCalendarWidget>
#include <QKeyEvent>
#include <QLabel>
#include <QTimer>
#include <QVBoxLayout>
#include <algorithm>
#include <filesystem>

#include "apps/kelform/record.h"
#include "apps/kelform/safe_file.h"
#include "apps/kelform/text_file.h"
#include "keltext/host/charset.h"
#include "keltext/library/catalogue.h"
#include "keltext/qt/form_window.h"
#include "keltext/qt/services.h"
#include "keltext/qt/views.h"

namespace kel::kelform {
namespace {

QString qtext(const std::string& utf8) { return QString::fromStdString(utf8); }

}  // namespace

DesktopForm::DesktopForm(const SavedForm& saved, const std::string& file, Date today,
                         std::optional<std::string> record_path)
    : saved_(saved), today_(today), code_(saved), driver_(nullptr), record_path_(std::move(record_path)) {
    // The controls keep their classes for life: the application's catalogue, not a local one.
    open_form(driver_, saved_, qt::Services::of_application().catalogue().classes(), file, today_);
    if (record_path_ && std::filesystem::exists(*record_path_))
        load_record(driver_, read_limited(*record_path_, kDefaultMaxFileBytes), *record_path_);
    driver_.set_observer(this);
    lay_out();
    qApp->installEventFilter(this);
    for (model::HostedControl* c : driver_.controls())
        if (c->can_take_focus()) {
            driver_.focus(c);
            break;
        }
}

DesktopForm::~DesktopForm() {
    qApp->removeEventFilter(this);
    driver_.set_observer(nullptr);
}

QWidget& DesktopForm::window() { return driver_.form_window().window(); }

// Character cells as the terminal form counts them, at the window font's size.
void DesktopForm::lay_out() {
    QWidget& w = window();
    w.setWindowTitle(qtext(to_utf8(saved_.title)));
    const QFontMetrics fm(w.font());
    const int cell = fm.horizontalAdvance(QLatin1Char('n'));
    const int line = fm.height() + 2;
    const auto x_of = [&](int col) { return 8 + (col - 1) * cell; };
    const auto y_of = [&](int row) { return 8 + (row - 1) * line; };
    // Wide enough for the status line's longer messages.
    int right = 80 * cell, bottom = 0;
    for (const SavedControl& c : saved_.controls) {
        model::HostedControl* hosted = driver_.find(c.name);
        if (!hosted) continue;
        qt::ControlWidget& cw = driver_.form_window().widget_of(*hosted);
        cw.move(x_of(c.col), y_of(c.row));
        if (!c.label.empty()) {
            auto* label = new QLabel(qtext(to_utf8(c.label)), &w);
            label->setObjectName(qtext("label_" + c.name));
            label->move(x_of(c.label_col.value_or(3)), y_of(c.label_row.value_or(c.row)) + 2);
            label->show();
        }
        right = std::max(right, cw.x() + cw.width());
        bottom = std::max(bottom, cw.y() + cw.height());
    }
    auto* help = new QLabel(QStringLiteral("Enter next   F4 list/calendar   Ctrl+S save   F10 finish"), &w);
    help->move(8, bottom + line);
    help->show();
    status_ = new QLabel(&w);
    status_->setObjectName(QStringLiteral("status"));
    status_->setFrameShape(QFrame::StyledPanel);
    status_->setGeometry(0, bottom + 2 * line + 4, right + 16, line + 4);
    status_->show();
    w.setFixedSize(right + 16, status_->y() + status_->height());
}

void DesktopForm::say(const std::string& message) { status_->setText(qtext(message)); }
QString DesktopForm::status() const { return status_->text(); }
QCalendarWidget* DesktopForm::calendar() const { return calendar_popup_ ? calendar_ : nullptr; }

void DesktopForm::event_raised(model::HostedControl& control, int, std::string_view event, std::span<EventArg>) {
    if (const auto status = code_.event_status(control, event)) {
        say(*status);
    } else if (FormCode::opens_calendar(event)) {
        // The button's click is still being delivered: the calendar opens after it.
        QPointer<QObject> guard(this);
        const std::string name = control.name();
        QTimer::singleShot(0, this, [this, name] {
            if (model::HostedControl* c = driver_.find(name)) open_calendar(*c);
        });
    }
}

void DesktopForm::handler_error(std::string_view where, int number) {
    say(FormCode::handler_error_status(where, number));
}

bool DesktopForm::save_record() {
    if (!record_path_) {
        say("No record file: start kelform-qt with --record FILE to save what is typed");
        return false;
    }
    try {
        write_file_safely(*record_path_, record_json(driver_) + "\n");
    } catch (const std::exception& e) {
        say(std::string("Not saved: ") + e.what());
        return false;
    }
    say("Saved to " + *record_path_);
    return true;
}

// Saving and finishing complete the field being edited first, as a form's OK button does:
// focus leaves it (and with `come_back` returns), so it formats and checks its value.
bool DesktopForm::complete_field(bool come_back) {
    model::HostedControl* editing = driver_.focused();
    if (!editing) return true;
    driver_.focus(nullptr);
    if (FormCode::keeps_focus(driver_, editing)) {
        driver_.focus(editing);
        say(code_.kept_focus_status(*editing, status_->text().toStdString()));
        return false;
    }
    if (come_back) driver_.focus(editing);
    return true;
}

std::optional<std::string> DesktopForm::finish() {
    if (!complete_field(false)) return std::nullopt;
    if (record_path_ && !save_record()) return std::nullopt;
    std::string json = record_json(driver_);
    emit finished(qtext(json));
    return json;
}

void DesktopForm::open_list(model::HostedControl& control) {
    if (auto* combo = driver_.form_window().widget_of(control).findChild<qt::ComboView*>()) combo->showPopup();
}

void DesktopForm::open_calendar(model::HostedControl& control) {
    if (calendar_popup_) calendar_popup_->close();
    qt::ControlWidget& field = driver_.form_window().widget_of(control);
    auto* popup = new QWidget(&window(), Qt::Popup);
    popup->setAttribute(Qt::WA_DeleteOnClose);
    popup->setObjectName(QStringLiteral("calendar"));
    auto* layout = new QVBoxLayout(popup);
    layout->setContentsMargins(1, 1, 1, 1);
    calendar_ = new QCalendarWidget(popup);
    layout->addWidget(calendar_);
    const Ymd start = to_ymd(FormCode::calendar_start(control, today_));
    calendar_->setSelectedDate(QDate(start.year, start.month, start.day));
    const std::string name = control.name();
    connect(calendar_, &QCalendarWidget::activated, popup, [this, popup, name](QDate picked) {
        model::HostedControl* c = driver_.find(name);
        const auto day = make_date(picked.year(), picked.month(), picked.day());
        if (!c || !day) return;
        if (const auto refused = code_.refuse_day(*c, *day)) {
            say(*refused);
            return;
        }
        popup->close();
        FormCode::pick_day(driver_, *c, *day);
        driver_.members_changed();
    });
    // Closed, the popup gives the form its activation back (Qt delivers keys only there).
    connect(popup, &QObject::destroyed, this, [this] {
        QWidget& w = window();
        w.activateWindow();
        QApplication::setActiveWindow(&w);
    });
    popup->adjustSize();
    // The calendar stands at the field's corner the box asks for, never over the field.
    const QPoint top_left = field.mapToGlobal(QPoint(0, 0));
    const int corner = FormCode::calendar_corner(control);
    const int x = corner == 1 || corner == 3 ? top_left.x() + field.width() - popup->width() : top_left.x();
    const int y = corner == 0 || corner == 1 ? top_left.y() - popup->height() : top_left.y() + field.height();
    popup->move(x, y);
    popup->show();
    calendar_popup_ = popup;
}

// The date box's rule after any input: a box left with a bad date gets focus back once.
void DesktopForm::after_input(model::HostedControl* before) {
    if (!before) return;
    // The form tells the person when a box changed what they typed as they left it.
    if (driver_.focused() != before && status_->text().isEmpty())
        if (const auto changed = code_.left_status(*before, typed_)) say(*changed);
    if (!FormCode::keeps_focus(driver_, before)) return;
    driver_.focus(before);
    say(code_.kept_focus_status(*before, status_->text().toStdString()));
}

bool DesktopForm::eventFilter(QObject* watched, QEvent* event) {
    const QEvent::Type type = event->type();
    if (type != QEvent::KeyPress && type != QEvent::KeyRelease && type != QEvent::MouseButtonPress)
        return QObject::eventFilter(watched, event);
    auto* widget = qobject_cast<QWidget*>(watched);
    // Only input to this form's window; popups (a combo's list, the calendar) handle their own.
    if (!widget || widget->window() != &window() || QApplication::activePopupWidget())
        return QObject::eventFilter(watched, event);
    model::HostedControl* before = driver_.focused();
    // Each input starts with a clear status line: what it shows is about this input.
    if (type != QEvent::KeyRelease) {
        status_->clear();
        typed_ = before ? FormCode::edit_text(*before) : std::string();
    }
    if (type == QEvent::KeyPress) {
        auto* key = static_cast<QKeyEvent*>(event);
        const Qt::KeyboardModifiers mods = key->modifiers() & ~Qt::KeypadModifier;
        if (key->key() == Qt::Key_F4 && mods == Qt::NoModifier && before) {
            if (is_class(*before, "KelCombo")) open_list(*before);
            if (is_class(*before, "KelDateMask")) open_calendar(*before);
            return true;
        }
        if (key->key() == Qt::Key_S && mods == Qt::ControlModifier) {
            if (complete_field(true)) save_record();
            return true;
        }
        if (key->key() == Qt::Key_F10 && mods == Qt::NoModifier) {
            finish();
            return true;
        }
    }
    if (type == QEvent::KeyRelease) {
        auto* key = static_cast<QKeyEvent*>(event);
        // The form's own keys are the form's, both halves: the control never hears them.
        const Qt::KeyboardModifiers mods = key->modifiers() & ~Qt::KeypadModifier;
        if (((key->key() == Qt::Key_F4 || key->key() == Qt::Key_F10) && mods == Qt::NoModifier) ||
            (key->key() == Qt::Key_S && mods == Qt::ControlModifier))
            return true;
        const bool enter = key->key() == Qt::Key_Return || key->key() == Qt::Key_Enter;
        if (enter && !key->isAutoRepeat() && (key->modifiers() & ~Qt::KeypadModifier) == Qt::NoModifier && before) {
            // Enter moves on as Tab does, once the control has had the whole keystroke (its
            // KeyPress may have moved focus itself).
            QTimer::singleShot(0, this, [this, before] {
                if (driver_.focused() == before) driver_.tab(true);
                after_input(before);
            });
            return false;
        }
    }
    QTimer::singleShot(0, this, [this, before] { after_input(before); });
    return false;
}

}  // namespace kel::kelform
