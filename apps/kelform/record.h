#pragma once
// Records: what a person typed into a form, apart from the form's definition. A record is a
// JSON object with one member per control, keyed by the control's name, in tab order: the
// value as the form reads it through the control's Text (a number for the numeric box, a text
// for the others, dates as "dd/mm/yyyy"), or null for a field left blank. Blank is not zero: an
// empty numeric box is null, though its Text reads 0.
#include <stdexcept>
#include <string>
#include <string_view>

#include "keltext/minihost/form.h"

namespace kel::kelform {

// A record that cannot be loaded: "FILE: CONTROL: message", or "FILE: message".
class RecordError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

// The form's values as a record (two-space indented JSON, UTF-8).
std::string record_json(mini::FormDriver& form);

// Loads a record into an opened form: each value, in the form's control order, is set through
// the control's Text; the control is then focused and left, as after typing, and read back.
// A value the control does not keep as given (refused, corrected, clamped), a key twice, a
// name the form lacks, a value of the wrong kind or text Windows-1252 cannot hold is a
// RecordError naming `file` and the control. A null, or a control the record does not name,
// leaves the control as the form opened it.
void load_record(mini::FormDriver& form, std::string_view json_text, const std::string& file);

}  // namespace kel::kelform
