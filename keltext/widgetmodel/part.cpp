#include "keltext/widgetmodel/part.h"

#include "keltext/host/conversions.h"

namespace kel::model {

std::optional<std::string> find_member(const Part& part, std::string_view name) {
    for (auto& m : part.members())
        if (same_name(m, name)) return m;
    return std::nullopt;
}

std::optional<std::string> find_notification(const Part& part, std::string_view name) {
    for (auto& n : part.notifications())
        if (same_name(n, name)) return n;
    return std::nullopt;
}

}  // namespace kel::model
