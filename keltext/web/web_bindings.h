#pragma once
// The object JavaScript holds: a web form on the library's own classes, its calls taking
// JavaScript values. A page's module may add its own functions on the same form (opening a
// form file, reading a record) through web_form().
#include <emscripten/val.h>

#include <string>

#include "keltext/library/catalogue.h"
#include "keltext/web/web_form.h"

namespace kel::web {

class JsForm {
public:
    JsForm();
    WebForm& web_form() { return form_; }
    const Catalogue& catalogue() const { return catalogue_; }

    // The page's form code: handler(control, event, args) for each event raised; setting a
    // number in `args` (args.KeyAscii = 0) changes that argument.
    void on_event(emscripten::val handler);

    std::string create(const std::string& cls, const std::string& name, float width, float height);
    std::string get(const std::string& name, const std::string& property, emscripten::val index);
    std::string set(const std::string& name, const std::string& property, emscripten::val value, emscripten::val index);
    std::string call(const std::string& name, const std::string& method, emscripten::val args);
    std::string peek(const std::string& name, const std::string& part, const std::string& member, emscripten::val index);
    std::string poke(const std::string& name, const std::string& part, const std::string& member, emscripten::val value);
    std::string focus(const std::string& name) { return form_.focus(name); }
    std::string tab(bool forward) { return form_.tab(forward); }
    std::string keystroke(int key_code, int shift, int char_code) {
        return form_.keystroke(static_cast<int16_t>(key_code), static_cast<int16_t>(shift), char_code);
    }
    std::string key_down(int key_code, int shift) {
        return form_.key_down(static_cast<int16_t>(key_code), static_cast<int16_t>(shift));
    }
    std::string key_press(int char_code) { return form_.key_press(static_cast<int16_t>(char_code)); }
    std::string key_up(int key_code, int shift) {
        return form_.key_up(static_cast<int16_t>(key_code), static_cast<int16_t>(shift));
    }
    std::string type(const std::string& text) { return form_.type(text); }
    std::string paste(const std::string& text) { return form_.paste(text); }
    std::string select(const std::string& name, int start, int length) { return form_.select(name, start, length); }
    std::string set_insert(bool on) { return form_.set_insert(on); }
    std::string click(const std::string& name, const std::string& part) { return form_.click(name, part); }
    std::string dbl_click(const std::string& name, const std::string& part) { return form_.dbl_click(name, part); }
    std::string notify(const std::string& name, const std::string& part, const std::string& notification) {
        return form_.notify(name, part, notification);
    }
    std::string describe() { return form_.describe(); }
    std::string changes(bool everything) { return form_.changes(everything); }

private:
    Catalogue catalogue_;
    WebForm form_;
};

}  // namespace kel::web
