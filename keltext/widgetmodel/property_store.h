#pragma once
// The property store of every host: what a form keeps of a control between sessions.
#include <cstddef>
#include <string>
#include <string_view>
#include <unordered_map>

#include "keltext/host/container.h"
#include "keltext/widgetmodel/hosted.h"

namespace kel::model {

// Keys match without regard to case. Only values that differ from the default given with
// them are kept, in the order first written; a font is always kept. Fonts are copied in and
// out, so that a stored font never aliases a control's live font object.
class PropertyStore : public PropertyBag {
public:
    PropertyStore() = default;
    explicit PropertyStore(const StoredValues& values);

    Variant read(std::string_view key, const Variant& default_value) override;
    void write(std::string_view key, const Variant& value, const Variant& default_value) override;

    const StoredValues& values() const { return values_; }

private:
    StoredValues values_;
    std::unordered_map<std::string, std::size_t> index_;  // name_key -> place in values_
};

// The store's notion of equal: numbers of any kinds with the same value (a boolean counts as
// -1 or 0, empty as 0), identical strings, empty and the empty string, equal dates.
bool stored_equal(const Variant& a, const Variant& b);

}  // namespace kel::model
