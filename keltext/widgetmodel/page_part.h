#pragma once
// The part "page" of a property page, on any host: its Changed flag and the design-time
// services (the controls the page edits, reached late-bound through their member tables).
#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "keltext/host/container.h"
#include "keltext/widgetmodel/hosted.h"
#include "keltext/widgetmodel/part.h"

namespace kel::model {

class PagePart final : public Part, public PageServices {
public:
    explicit PagePart(std::vector<HostedControl*> selected) : selected_(std::move(selected)) {}

    std::size_t selected_count() const override { return selected_.size(); }
    Dispatch& selected_control(std::size_t i) override;  // 381 past the end
    bool Changed() const override { return changed_; }
    void Changed(bool v) override { changed_ = v; }
    const std::vector<HostedControl*>& selected() const { return selected_; }

    std::string_view widget_type() const override { return "Page"; }
    std::vector<std::string> members() const override { return {"Changed"}; }
    std::vector<std::string> notifications() const override { return {}; }
    Variant peek(std::string_view member, std::optional<int32_t> index = std::nullopt) const override;
    void poke(std::string_view member, const Variant& value, std::optional<int32_t> index = std::nullopt) override;

private:
    std::vector<HostedControl*> selected_;
    bool changed_ = false;
};

}  // namespace kel::model
