// An application that embeds KelText through its installed CMake package: it places a
// numeric box on a form of the minimal host, types into it and reads the value back.
#include <cstdio>

#include "keltext/library/catalogue.h"
#include "keltext/minihost/form.h"

int main() {
    kel::Catalogue catalogue;
    kel::mini::Form form;

    const kel::ClassInfo* numeric = catalogue.find("KelNumeric");
    if (!numeric) return 1;
    auto& amount = form.create(*numeric, "amount");
    kel::Dispatch& box = amount.dispatch();  // members by name, as form code reaches them
    box.set("MaxLength", kel::Variant(int16_t{12}));
    box.set("NoOfDecimals", kel::Variant(int16_t{2}));
    box.set("TxtFormat", kel::Variant(true));

    form.focus(&amount);
    for (char c : std::string_view("1234567.5")) form.keystroke(kel::mini::keystroke_for_char(static_cast<uint8_t>(c)));
    form.focus(nullptr);  // leaving the box groups and pads the text

    const kel::Variant value = box.get("Text");
    const kel::Variant shown = amount.part("txtNumeric")->peek("Text");
    std::printf("value %.2f shown %s\n", value.number(), shown.str().c_str());
    return value.number() == 1234567.5 && shown.str() == "12,34,567.50" ? 0 : 1;
}
