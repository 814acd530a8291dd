#pragma once
// A kelform form on the desktop: the form file's controls as Qt widgets at their places with
// their labels, the form's code (apps/kelform/form_code.h, shared with the terminal form), a
// status line, and the desktop's keys: Enter moves on as Tab does, F4 drops the combo's list
// or opens the date box's calendar (at its CalendarPosition), Ctrl+S saves the record, F10
// finishes (saves the record when there is one and prints it).
#include <QObject>
#include <QPointer>
#include <optional>
#include <string>

#include "apps/kelform/form_code.h"
#include "apps/kelform/form_file.h"
#include "apps/kelform/qt_driver.h"

class QLabel;
class QCalendarWidget;

namespace kel::kelform {

class DesktopForm final : public QObject, private model::FormObserver {
    Q_OBJECT

public:
    // Opens the form (FormFileError as open_form gives it) and, when `record_path` names a file
    // that exists, the record in it (RecordError, TextFileError).
    DesktopForm(const SavedForm& saved, const std::string& file, Date today,
                std::optional<std::string> record_path = std::nullopt);
    ~DesktopForm() override;

    QWidget& window();
    QtFormDriver& driver() { return driver_; }
    QString status() const;
    // The record as F10 prints it; with a record file, it is saved first (nothing when that
    // fails: the status line says why and the form stays open).
    std::optional<std::string> finish();
    bool save_record();
    // The calendar open on a date box, or null.
    QCalendarWidget* calendar() const;

signals:
    // F10 finished the form: the record to print.
    void finished(const QString& json);

protected:
    bool eventFilter(QObject* watched, QEvent* event) override;

private:
    // FormObserver: the form's code.
    void event_raised(model::HostedControl& control, int number, std::string_view event,
                      std::span<EventArg> args) override;
    void handler_error(std::string_view where, int number) override;

    void lay_out();
    void say(const std::string& message);
    void open_list(model::HostedControl& control);
    void open_calendar(model::HostedControl& control);
    void after_input(model::HostedControl* before);
    bool complete_field(bool come_back);

    const SavedForm& saved_;
    Date today_;
    FormCode code_;
    QtFormDriver driver_;
    std::optional<std::string> record_path_;
    QLabel* status_ = nullptr;
    std::string typed_;  // the focused field's text when the input began
    QPointer<QWidget> calendar_popup_;
    QCalendarWidget* calendar_ = nullptr;
};

}  // namespace kel::kelform
