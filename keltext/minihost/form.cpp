#include "keltext/minihost/form.h"

#include <cmath>
#include <deque>
#include <unordered_map>

#include "keltext/host/conversions.h"
#include "keltext/host/errors.h"
#include "keltext/minihost/property_store.h"
#include "keltext/minihost/site.h"

namespace kel::mini {

class FormImpl final : public FormServices {
public:
    explicit FormImpl(FormObserver* observer) : observer_(observer) {}
    ~FormImpl() override {
        // Controls go in reverse order of creation: a page before the controls it edits.
        while (!sites_.empty()) sites_.pop_back();
    }

    // FormServices
    bool user_mode() const override { return user_mode_; }
    FormObserver* observer() override { return observer_; }
    int32_t next_handle() override {
        next_handle_ += 2;
        return next_handle_;
    }
    void queue_keys(HostedControl& from, std::string_view keys) override;
    int16_t key_state(int16_t virtual_key) const override {
        return virtual_key == kVkInsert && insert_ ? 1 : 0;
    }
    int& handler_depth() override { return handler_depth_; }
    bool delivering_sent_keys() const override { return delivering_; }
    model::Clipboard& clipboard() override { return clipboard_; }

    MiniSite& site_of(HostedControl& c);
    MiniSite* find(std::string_view name);
    MiniSite& add(const ClassInfo& cls, std::string name, float width, float height,
                  std::optional<std::vector<HostedControl*>> selected);

    Form::FocusResult focus(MiniSite* target);
    void tab(bool forward);
    MiniSite& require_focus();
    InputPart* input_target(MiniSite& s);
    void key_down(MiniSite& s, int16_t key_code, int16_t shift);
    void key_press(MiniSite& s, int16_t char_code);
    void key_up(MiniSite& s, int16_t key_code, int16_t shift);
    void keystroke(const Keystroke& k);
    InputPart& deliverable_part(HostedControl& control, Part& part, std::string_view notification);
    void run_pending();

    // How many synthetic keystrokes one round of delivery takes: controls whose keystrokes
    // queue further keystrokes without end are stopped here instead of hanging the form.
    static constexpr std::size_t kMaxSentKeys = 10000;

    FormObserver* observer_;
    bool user_mode_ = true;
    bool insert_ = false;
    // The minimal host's clipboard lives as long as its form.
    struct MemoryClipboard final : model::Clipboard {
        std::string text() const override { return held; }
        void set_text(std::string_view t) override { held = t; }
        std::string held;
    } clipboard_;
    int32_t next_handle_ = 0x100;
    std::vector<std::unique_ptr<MiniSite>> sites_;
    // Forms may hold tens of thousands of controls: names and sites are found through maps,
    // never by a scan, so that loading, saving and each keystroke stay linear in the form.
    std::unordered_map<std::string, MiniSite*> by_name_;  // name_key -> site
    MiniSite* focused_ = nullptr;
    std::deque<model::SentKey> queue_;
    bool delivering_ = false;
    int handler_depth_ = 0;
};

namespace {

bool valid_name(std::string_view name) {
    if (name.empty()) return false;
    for (char c : name)
        if (!((c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z') || (c >= '0' && c <= '9') || c == '_')) return false;
    return true;
}

void check_size(float width, float height) {
    if (!std::isfinite(width) || !std::isfinite(height) || width < 0 || height < 0)
        throw FormError("a control's size must be zero or more");
}

}  // namespace

MiniSite& FormImpl::site_of(HostedControl& c) {
    auto* s = dynamic_cast<MiniSite*>(&c);
    if (!s || &s->form() != this) throw FormError("control " + c.name() + " is not on this form");
    return *s;
}

MiniSite* FormImpl::find(std::string_view name) {
    const auto it = by_name_.find(name_key(name));
    return it == by_name_.end() ? nullptr : it->second;
}

MiniSite& FormImpl::add(const ClassInfo& cls, std::string name, float width, float height,
                        std::optional<std::vector<HostedControl*>> selected) {
    if (!valid_name(name)) throw FormError("bad control name '" + name + "': letters, digits and _ only");
    std::string key = name_key(name);
    if (by_name_.contains(key)) throw FormError("a control named " + name + " already exists");
    check_size(width, height);
    if (!cls.create) throw FormError("class " + cls.name + " cannot be created");
    auto site = std::make_unique<MiniSite>(*this, cls, std::move(name), width, height, std::move(selected));
    std::unique_ptr<Control> control = cls.create(*site);
    if (!control) throw FormError("class " + cls.name + " cannot be created");
    site->attach(std::move(control));
    by_name_.emplace(std::move(key), site.get());
    site->set_place(sites_.size());
    sites_.push_back(std::move(site));
    return *sites_.back();
}

void FormImpl::queue_keys(HostedControl& from, std::string_view keys) {
    std::vector<model::SentKey> parsed;
    try {
        parsed = model::parse_send_keys(keys);
    } catch (const model::SendKeysError&) {
        raise_error(kInvalidProcedureCall);  // as the platform's send keys does
    }
    if (observer_) observer_->keys_sent(from, keys);
    if (!focused_) return;  // nowhere to go: dropped
    queue_.insert(queue_.end(), parsed.begin(), parsed.end());
}

Form::FocusResult FormImpl::focus(MiniSite* target) {
    if (target == focused_) return Form::FocusResult::unchanged;
    if (target && !target->can_take_focus()) {
        if (observer_) observer_->focus_refused(*target);
        return Form::FocusResult::refused;
    }
    if (MiniSite* from = focused_) {
        if (InputPart* p = from->keyboard_input()) p->user_notify("LostFocus");
        from->guarded("surface", "ExitFocus", [&] { from->control().ExitFocus(); });
    }
    focused_ = target;
    if (target) {
        target->guarded("surface", "EnterFocus", [&] { target->control().EnterFocus(); });
        if (InputPart* p = target->keyboard_input()) p->user_notify("GotFocus");
    }
    return Form::FocusResult::moved;
}

void FormImpl::tab(bool forward) {
    // Steps through creation order from the focused control, skipping pages and controls
    // that cannot take focus; without focus, Tab starts at the first and Shift+Tab at the last.
    const std::size_t n = sites_.size();
    if (n == 0) return;
    std::size_t i = focused_ ? focused_->place() : (forward ? n - 1 : 0);
    const std::size_t steps = focused_ ? n - 1 : n;
    for (std::size_t step = 0; step < steps; ++step) {
        i = forward ? (i + 1) % n : (i + n - 1) % n;
        MiniSite* s = sites_[i].get();
        if (!s->is_page() && s->can_take_focus()) {
            focus(s);
            return;
        }
    }
}

MiniSite& FormImpl::require_focus() {
    if (!focused_) throw FormError("no control has focus");
    return *focused_;
}

InputPart* FormImpl::input_target(MiniSite& s) {
    InputPart* p = s.keyboard_input();
    if (!p || !s.mini_surface().Enabled() || !p->input_enabled()) return nullptr;
    return p;
}

void FormImpl::key_down(MiniSite& s, int16_t key_code, int16_t shift) {
    if (model::toggles_insert(key_code, shift)) insert_ = !insert_;  // it flips as the key goes down
    if (InputPart* p = input_target(s)) p->user_key_down(key_code, shift);
}

void FormImpl::key_press(MiniSite& s, int16_t char_code) {
    if (InputPart* p = input_target(s)) p->user_key_press(char_code);
}

void FormImpl::key_up(MiniSite& s, int16_t key_code, int16_t shift) {
    if (InputPart* p = input_target(s)) p->user_key_up(key_code, shift);
}

void FormImpl::keystroke(const Keystroke& k) {
    if (!focused_) return;
    if (k.key_code == kVkTab && (k.shift & (kCtrlMask | kAltMask)) == 0) {
        tab((k.shift & kShiftMask) == 0);
        return;
    }
    MiniSite& s = *focused_;
    key_down(s, k.key_code, k.shift);
    if (k.char_code) key_press(s, *k.char_code);
    key_up(s, k.key_code, k.shift);
}

InputPart& FormImpl::deliverable_part(HostedControl& control, Part& part, std::string_view notification) {
    MiniSite& s = site_of(control);
    InputPart* p = s.input_part(&part);
    if (!p) throw FormError(control.name() + " has no such constituent");
    if (!find_notification(*p, notification))
        throw FormError(control.name() + "." + p->part_name() + " does not raise " + std::string(notification));
    return *p;
}

void FormImpl::run_pending() {
    if (delivering_) return;  // the round already running delivers them
    delivering_ = true;
    struct Done {
        bool& flag;
        ~Done() { flag = false; }
    } done{delivering_};
    std::size_t delivered = 0;
    while (!queue_.empty()) {
        model::SentKey k = queue_.front();
        queue_.pop_front();
        if (!focused_) continue;  // nobody to take it: dropped
        if (++delivered > kMaxSentKeys) {
            queue_.clear();
            if (observer_) observer_->handler_error(focused_->name() + ".surface.SendKeys", model::kOutOfStackSpace);
            break;
        }
        switch (k.kind) {
        case model::SentKey::tab: tab(true); break;
        case model::SentKey::back_tab: tab(false); break;
        case model::SentKey::keystroke: keystroke(k.key); break;
        }
    }
}

// ---- Form

Form::Form(FormObserver* observer) : impl_(std::make_unique<FormImpl>(observer)) {}
Form::~Form() = default;

void Form::set_observer(FormObserver* observer) { impl_->observer_ = observer; }
void Form::set_user_mode(bool running) { impl_->user_mode_ = running; }
bool Form::user_mode() const { return impl_->user_mode_; }

HostedControl& Form::create(const ClassInfo& cls, std::string name, float width, float height) {
    if (cls.is_page) throw FormError(cls.name + " is a property page: open it with page");
    MiniSite& s = impl_->add(cls, std::move(name), width, height, std::nullopt);
    s.guarded("surface", "Initialize", [&] { s.control().Initialize(); });
    s.guarded("surface", "InitProperties", [&] { s.control().InitProperties(); });
    s.raise_resize();
    impl_->run_pending();
    return s;
}

HostedControl& Form::load(const ClassInfo& cls, std::string name, const StoredValues& store, float width,
                          float height) {
    if (cls.is_page) throw FormError(cls.name + " is a property page: open it with page");
    MiniSite& s = impl_->add(cls, std::move(name), width, height, std::nullopt);
    PropertyStore bag(store);
    s.guarded("surface", "Initialize", [&] { s.control().Initialize(); });
    s.guarded("surface", "ReadProperties", [&] { s.control().ReadProperties(bag); });
    s.raise_resize();
    impl_->run_pending();
    return s;
}

StoredValues Form::save(HostedControl& control) {
    MiniSite& s = impl_->site_of(control);
    PropertyStore bag;
    s.guarded("surface", "WriteProperties", [&] { s.control().WriteProperties(bag); });
    impl_->run_pending();
    return bag.values();
}

HostedControl* Form::find(std::string_view name) { return impl_->find(name); }

void Form::reserve(std::size_t more) {
    impl_->sites_.reserve(impl_->sites_.size() + more);
    impl_->by_name_.reserve(impl_->by_name_.size() + more);
}

std::vector<HostedControl*> Form::controls() {
    std::vector<HostedControl*> out;
    for (auto& s : impl_->sites_)
        if (!s->is_page()) out.push_back(s.get());
    return out;
}

HostedControl& Form::open_page(const ClassInfo& page_class, std::string name, std::vector<HostedControl*> selected) {
    if (!page_class.is_page) throw FormError(page_class.name + " is not a property page");
    for (HostedControl* c : selected) {
        if (!c) throw FormError("a page needs controls to edit");
        // The controls may stand on another host's form: a page edits them through their
        // member tables alone.
        if (c->info().is_page) throw FormError("a page cannot edit a page");
    }
    MiniSite& s = impl_->add(page_class, std::move(name), 5925, 3495, std::move(selected));
    auto* page = dynamic_cast<PropertyPage*>(&s.control());
    s.guarded("surface", "Initialize", [&] { s.control().Initialize(); });
    if (page) s.guarded("page", "SelectionChanged", [&] { page->SelectionChanged(); });
    impl_->run_pending();
    return s;
}

void Form::apply_page(HostedControl& page) {
    MiniSite& s = impl_->site_of(page);
    if (!s.is_page()) throw FormError(page.name() + " is not a property page");
    if (auto* p = dynamic_cast<PropertyPage*>(&s.control())) s.guarded("page", "ApplyChanges", [&] { p->ApplyChanges(); });
    // Applied: nothing is left to apply until the designer edits again.
    s.page_part()->Changed(false);
    impl_->run_pending();
}

HostedControl* Form::focused() { return impl_->focused_; }

Form::FocusResult Form::focus(HostedControl* target) {
    MiniSite* s = target ? &impl_->site_of(*target) : nullptr;
    FocusResult r = impl_->focus(s);
    impl_->run_pending();
    return r;
}

void Form::tab(bool forward) {
    impl_->tab(forward);
    impl_->run_pending();
}

void Form::keystroke(const Keystroke& k) {
    impl_->require_focus();
    impl_->keystroke(k);
    impl_->run_pending();
}

void Form::type(std::string_view text) {
    for (char c : text) keystroke(model::keystroke_for_char(static_cast<uint8_t>(c)));
}

void Form::key_down(int16_t key_code, int16_t shift) {
    impl_->key_down(impl_->require_focus(), key_code, shift);
    impl_->run_pending();
}

void Form::key_up(int16_t key_code, int16_t shift) {
    impl_->key_up(impl_->require_focus(), key_code, shift);
    impl_->run_pending();
}

void Form::key_press(int16_t char_code) {
    impl_->key_press(impl_->require_focus(), char_code);
    impl_->run_pending();
}

void Form::paste(std::string_view text) {
    MiniSite& s = impl_->require_focus();
    if (InputPart* p = impl_->input_target(s)) p->user_paste(text);
    impl_->run_pending();
}

void Form::select(HostedControl& control, int32_t start, int32_t length) {
    MiniSite& s = impl_->site_of(control);
    InputPart* p = s.keyboard_input();
    if (!p) throw FormError(control.name() + " has no edit field");
    p->user_select(start, length);
    impl_->run_pending();
}

void Form::set_insert(bool on) { impl_->insert_ = on; }
bool Form::insert_on() const { return impl_->insert_; }
void Form::set_clipboard(std::string_view text) { impl_->clipboard_.set_text(text); }
std::string Form::clipboard() const { return impl_->clipboard_.text(); }

void Form::click(HostedControl& control, Part& part) {
    InputPart& p = impl_->deliverable_part(control, part, "Click");
    if (impl_->site_of(control).mini_surface().Enabled() && p.input_enabled()) p.user_click();
    impl_->run_pending();
}

void Form::dbl_click(HostedControl& control, Part& part) {
    InputPart& p = impl_->deliverable_part(control, part, "DblClick");
    if (impl_->site_of(control).mini_surface().Enabled() && p.input_enabled()) p.user_notify("DblClick");
    impl_->run_pending();
}

void Form::notify(HostedControl& control, Part& part, std::string_view notification) {
    InputPart& p = impl_->deliverable_part(control, part, notification);
    std::string name = *find_notification(p, notification);
    for (std::string_view keyed : {"KeyDown", "KeyUp", "KeyPress", "MouseDown", "MouseUp", "MouseMove"})
        if (name == keyed) throw FormError(name + " carries arguments: use the key or mouse commands");
    if (impl_->site_of(control).mini_surface().Enabled() && p.input_enabled()) p.user_notify(name);
    impl_->run_pending();
}

void Form::mouse(HostedControl& control, Part& part, bool down, int16_t button, int16_t shift, float x, float y) {
    InputPart& p = impl_->deliverable_part(control, part, down ? "MouseDown" : "MouseUp");
    if (impl_->site_of(control).mini_surface().Enabled() && p.input_enabled()) p.user_mouse(down, button, shift, x, y);
    impl_->run_pending();
}

void Form::resize(HostedControl& control, float width, float height) {
    impl_->site_of(control).mini_surface().set_size(width, height);
    impl_->run_pending();
}

void Form::run_pending() { impl_->run_pending(); }

}  // namespace kel::mini
