#pragma once
// A control's stored values in a Qt application: the property store every host shares, and
// its text form for the kelSettings property, one `store KEY VALUE` line a value, exactly as
// a form file's control block writes them (docs/kelform.md).
#include <stdexcept>
#include <string>
#include <string_view>

#include "keltext/widgetmodel/hosted.h"
#include "keltext/widgetmodel/property_store.h"

namespace kel::qt {

using StoredBag = model::PropertyStore;

// kelSettings that cannot be read: the message names the line ("line 2: ...").
class StoreTextError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

std::string store_text(const model::StoredValues& values);
// Blank lines and `#` comments are skipped; anything but `store KEY VALUE` is an error, and so
// is a key stored twice.
model::StoredValues parse_store_text(std::string_view text);

}  // namespace kel::qt
