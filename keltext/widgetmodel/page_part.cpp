#include "keltext/widgetmodel/page_part.h"

#include "keltext/host/conversions.h"
#include "keltext/host/errors.h"
#include "keltext/widgetmodel/widget_base.h"

namespace kel::model {

Dispatch& PagePart::selected_control(std::size_t i) {
    if (i >= selected_.size()) raise_error(kInvalidPropertyIndex);
    return selected_[i]->dispatch();
}

Variant PagePart::peek(std::string_view member, std::optional<int32_t> index) const {
    no_index(index);
    if (same_name(member, "Changed")) return changed_;
    raise_error(kNoSuchMember);
}

void PagePart::poke(std::string_view member, const Variant& value, std::optional<int32_t> index) {
    no_index(index);
    if (same_name(member, "Changed")) return Changed(to_bool(value));
    raise_error(kNoSuchMember);
}

}  // namespace kel::model
