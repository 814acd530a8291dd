// An application that embeds KelText through its installed CMake package: it places a
// numeric box and a combo on a form of the minimal host, types into them and reads back.
#include <cstdio>
#include <string>

#include "keltext/host/charset.h"
#include "keltext/host/conversions.h"
#include "keltext/host/errors.h"
#include "keltext/library/catalogue.h"
#include "keltext/minihost/form.h"

int main() {
    kel::Catalogue catalogue;
    kel::mini::Form form;

    auto& amount = form.create(*catalogue.find("KelNumeric"), "amount");
    kel::Dispatch& box = amount.dispatch();  // members by name, as form code reaches them
    box.set("MaxLength", int16_t{12});
    box.set("NoOfDecimals", int16_t{2});
    box.set("TxtFormat", true);
    form.focus(&amount);
    form.type("1234567.5");
    form.focus(nullptr);  // leaving the box groups and pads the text
    const double value = kel::to_double(box.get("Text"));
    const std::string shown = amount.part("txtNumeric")->peek("Text").str();

    // The controls hold Windows-1252 text; an application speaking UTF-8 converts at the edge.
    auto& mode = form.create(*catalogue.find("KelCombo"), "mode");
    mode.dispatch().call("AddItem", {kel::from_utf8("Caf\u00e9")});
    std::string error;
    try {
        mode.dispatch().set("ListIndex", int16_t{5});
    } catch (const kel::RuntimeError& e) {
        error = e.what();
    }
    const kel::Variant first(int16_t{0});
    const std::string cafe = kel::to_utf8(mode.dispatch().get("List", &first).str());

    std::printf("value %.2f shown %s entry %s\n%s\n", value, shown.c_str(), cafe.c_str(), error.c_str());
    return value == 1234567.5 && shown == "12,34,567.50" && cafe == "Caf\u00e9" &&
                   error == "KelCombo.ListIndex: run-time error 381: Invalid property array index"
               ? 0
               : 1;
}
