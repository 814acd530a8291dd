#include "keltext/library/catalogue.h"

#include "keltext/alphanumeric/class_info.h"
#include "keltext/combo/class_info.h"
#include "keltext/datemask/class_info.h"
#include "keltext/host/conversions.h"
#include "keltext/numeric/class_info.h"

namespace kel {

Catalogue::Catalogue()
    : classes_{kel_alpha_numeric_class(), kel_numeric_class(), kel_date_mask_class(), kel_combo_class(),
               pag_combo_class()} {}

const ClassInfo* Catalogue::find(std::string_view class_name) const {
    for (const auto& c : classes_)
        if (same_name(c.name, class_name)) return &c;
    return nullptr;
}

std::unique_ptr<Control> Catalogue::create(std::string_view class_name, Site& site) const {
    const ClassInfo* c = find(class_name);
    if (!c || !c->create) return nullptr;
    return c->create(site);
}

}  // namespace kel
