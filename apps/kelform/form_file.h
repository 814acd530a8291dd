#pragma once
// Form files (.kform): a saved form as plain text that a person can read and edit. Each
// control keeps its class, name, label, place on the screen, the size the form gives it, the
// values its WriteProperties stored (exactly those, so that ReadProperties reads them back),
// and the settings the form's code makes when the form opens. docs/kelform.md describes the
// format.
#include <cstddef>
#include <optional>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "apps/kelform/text_file.h"
#include "keltext/host/date.h"
#include "keltext/host/value_literal.h"
#include "keltext/host/variant.h"
#include "keltext/host/members.h"
#include "keltext/minihost/form.h"

namespace kel::kelform {

// A form file that cannot be read: the message names the file and the line
// ("voucher.kform:12: unknown statement 'foo'").
class FormFileError : public std::runtime_error {
public:
    FormFileError(std::string file, int line, const std::string& message);
    const std::string& file() const { return file_; }
    int line() const { return line_; }
    const std::string& message() const { return message_; }

private:
    std::string file_;
    int line_;
    std::string message_;
};

// A setting the form's code makes when the form opens (`set Prop VALUE`): for what a control
// does not store, such as a date box's range. The value is kept as written, so that a form
// saved again writes `fy-start` and not the date it stood for on the day it was opened.
struct OpenSetting {
    std::string property;  // as written
    std::string value;     // the value literal as written
    int line = 0;
};

struct SavedControl {
    std::string class_name;  // the library's own spelling
    std::string name;
    std::string label;
    // Field position on the form, in character cells from 1 (row 1 is the first row under
    // the title). The label goes on the same row before the field unless placed itself.
    int row = 1;
    int col = 1;
    std::optional<int> label_row, label_col;
    // The size the form gives the control when it loads it (twips); the control may change
    // its own size afterwards, but the file keeps what the form asks for.
    float width = 1200;
    float height = 300;
    mini::StoredValues stored;
    std::vector<int> stored_lines;  // the line of each stored value (0 for one not read from a file)
    std::vector<OpenSetting> settings;
    std::vector<std::string> comments;  // comment lines that stood in or before the block
    int line = 0;                       // the `control` line
};

struct SavedForm {
    std::string title;
    std::vector<std::string> comments;  // comment lines before `form`
    std::vector<SavedControl> controls;  // tab order
    std::vector<std::string> trailing_comments;
};

// Parses a form file. `file` names it in error messages. Class names are checked against the
// classes given (property pages cannot stand on a form), and so are the properties of `set`.
SavedForm parse_form(std::string_view text, const std::string& file, std::span<const ClassInfo> classes);
// Reads and parses a file of at most `max_bytes` (FormFileError with line 0 when it cannot be
// read or is larger). A file that starts with the UTF-8 byte-order mark is decoded from UTF-8.
SavedForm read_form_file(const std::string& path, std::span<const ClassInfo> classes,
                         std::size_t max_bytes = kDefaultMaxFileBytes);

// The text of a form file; parse_form of it gives the same form back.
std::string write_form(const SavedForm& form);
// Writes the file whole or not at all, as write_file_safely does (FormFileError with line 0,
// "voucher.kform: Permission denied", when it cannot).
void write_form_file(const std::string& path, const SavedForm& form);

// Value literals as form files and scripts write them: the host's (keltext/host/value_literal.h).
using kel::string_literal;
using kel::value_literal;
// The value of a `set` literal: a value literal, or one of the date words `today`,
// `fy-start`, `fy-end` (the financial year, April to March, that holds `today`).
// ScriptError when malformed.
Variant setting_value(std::string_view literal, Date today);

// The first and last day of the financial year (1 April to 31 March) that holds `day`.
Date financial_year_start(Date day);
Date financial_year_end(Date day);

// Loads every control of the saved form onto the form (in order, so tab order is file order) with
// the stored values, then makes the opening settings. Errors name the file and line. A stored
// value the control does not take (a key it does not store, a value of the wrong kind or out
// of range, which would vanish the next time the form is saved) is an error too.
void open_form(mini::FormDriver& form, const SavedForm& saved, std::span<const ClassInfo> classes, const std::string& file,
               Date today);

// Today's date on this machine's clock, in local time, or the date yyyy-mm-dd that the
// environment variable KELFORM_TODAY fixes (FormFileError when it is no date).
Date local_today();

// The saved form with each control's stored values replaced by what WriteProperties stores now.
// Controls on the form that the saved form does not hold are added below the others, with their
// name as the label and their present size.
SavedForm capture_form(mini::FormDriver& form, const SavedForm& saved);

class Player;
// Adds `loadform FILE` and `saveform FILE` to a script player. Both remember the form file
// between them, so that a form loaded and saved again keeps its title, labels and places.
void add_form_commands(Player& player, std::span<const ClassInfo> classes,
                       std::size_t max_file_bytes = kDefaultMaxFileBytes);

}  // namespace kel::kelform
