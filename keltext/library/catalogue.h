#pragma once
// The library's registration: every class it offers, by name, with its member table.
#include <memory>
#include <string_view>
#include <vector>

#include "keltext/host/container.h"
#include "keltext/host/members.h"

namespace kel {

class Catalogue {
public:
    Catalogue();  // knows KelAlphaNumeric, KelNumeric, KelDateMask, KelCombo and pagCombo

    // Names match without regard to case; null when the library has no such class.
    const ClassInfo* find(std::string_view class_name) const;
    const std::vector<ClassInfo>& classes() const { return classes_; }

    // A new instance of the class on the site (constituents built, nothing raised yet);
    // null for an unknown class.
    std::unique_ptr<Control> create(std::string_view class_name, Site& site) const;

private:
    std::vector<ClassInfo> classes_;
};

}  // namespace kel
