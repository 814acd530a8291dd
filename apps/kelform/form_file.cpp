#include "apps/kelform/form_file.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <limits>
#include <system_error>
#include <unordered_map>
#include <unordered_set>

#include "apps/kelform/safe_file.h"
#include "apps/kelform/script_player.h"
#include "apps/kelform/script_syntax.h"
#include "apps/kelform/text_file.h"
#include "keltext/host/charset.h"
#include "keltext/host/conversions.h"
#include "keltext/host/float_chars.h"
#include "keltext/host/font.h"
#include "keltext/minihost/property_store.h"
#include "keltext/host/errors.h"
#include "keltext/host/value_literal.h"

namespace kel::kelform {

FormFileError::FormFileError(std::string file, int line, const std::string& message)
    : std::runtime_error(line > 0 ? file + ":" + std::to_string(line) + ": " + message : file + ": " + message),
      file_(std::move(file)),
      line_(line),
      message_(message) {}

namespace {

const ClassInfo* find_class(std::span<const ClassInfo> classes, std::string_view name) {
    for (const ClassInfo& c : classes)
        if (same_name(c.name, name)) return &c;
    return nullptr;
}

constexpr int kMaxCell = 999;            // rows and columns a form may use
constexpr float kMaxTwips = 1000000.0f;  // far beyond any screen

std::optional<int> parse_cell(std::string_view s) {
    int v = 0;
    const auto [end, ec] = std::from_chars(s.data(), s.data() + s.size(), v);
    if (ec != std::errc() || end != s.data() + s.size() || v < 1 || v > kMaxCell) return std::nullopt;
    return v;
}

std::optional<float> parse_twips(std::string_view s) {
    if (s.empty() || !((s[0] >= '0' && s[0] <= '9') || s[0] == '.')) return std::nullopt;
    float v = 0;
    const auto [end, ec] = parse_float(s.data(), s.data() + s.size(), v);
    if (ec != std::errc() || end != s.data() + s.size() || !(v > 0) || v > kMaxTwips) return std::nullopt;
    return v;
}


class Parser {
public:
    Parser(const std::string& file, std::span<const ClassInfo> classes) : file_(file), classes_(classes) {}

    SavedForm parse(std::string_view text) {
        int line_no = 0;
        std::size_t pos = 0;
        while (pos <= text.size()) {
            const std::size_t nl = text.find('\n', pos);
            std::string_view line = text.substr(pos, nl == std::string_view::npos ? std::string_view::npos : nl - pos);
            if (!line.empty() && line.back() == '\r') line.remove_suffix(1);
            ++line_no;
            statement(line, line_no);
            if (nl == std::string_view::npos) break;
            pos = nl + 1;
        }
        if (current_) fail(current_->line, "control '" + current_->name + "' has no 'end'");
        if (!have_form_) fail(line_no, "the file has no 'form' line");
        saved_.trailing_comments = std::move(pending_comments_);
        return std::move(saved_);
    }

private:
    [[noreturn]] void fail(int line, const std::string& message) const { throw FormFileError(file_, line, message); }

    void statement(std::string_view line, int line_no) {
        std::vector<std::string_view> words;
        try {
            words = split_words(line);
        } catch (const ScriptError& e) {
            fail(line_no, e.what());
        }
        if (words.empty()) {
            // Keep comment lines (not blank ones) so that saving the form keeps them.
            const auto first = line.find_first_not_of(" \t");
            if (first != std::string_view::npos && line[first] == '#') {
                // Without the blanks and carriage returns at its end, so that a file written with
                // "\r\n" line ends reads and writes back the same comment every time.
                std::string_view comment = line.substr(first);
                while (!comment.empty() && (comment.back() == '\r' || comment.back() == ' ' || comment.back() == '\t'))
                    comment.remove_suffix(1);
                pending_comments_.emplace_back(comment);
            }
            return;
        }
        const std::string keyword(words[0]);
        const auto args = std::span<const std::string_view>(words).subspan(1);
        if (keyword == "form") return form_line(args, line_no);
        if (keyword == "control") return control_line(args, line_no);
        if (!current_) {
            if (keyword == "end" || keyword == "label" || keyword == "at" || keyword == "size" || keyword == "store" ||
                keyword == "set")
                fail(line_no, "'" + keyword + "' outside a control");
            fail(line_no, "unknown statement '" + shown(keyword) + "'");
        }
        if (keyword == "end") return end_line(args, line_no);
        if (keyword == "label") return label_line(args, line_no);
        if (keyword == "at") return at_line(args, line_no);
        if (keyword == "size") return size_line(args, line_no);
        if (keyword == "store") return store_line(args, line_no);
        if (keyword == "set") return set_line(args, line_no);
        fail(line_no, "unknown statement '" + shown(keyword) + "'");
    }

    std::string string_arg(std::string_view w, int line_no, const char* what) const {
        if (!is_string_literal(w)) fail(line_no, std::string(what) + " must be a quoted string");
        try {
            return decode_string(w);
        } catch (const ScriptError& e) {
            fail(line_no, e.what());
        }
    }

    Variant value_arg(std::string_view w, int line_no) const {
        try {
            return parse_value(w);
        } catch (const ScriptError& e) {
            fail(line_no, e.what());
        }
    }

    void form_line(std::span<const std::string_view> args, int line_no) {
        if (have_form_) fail(line_no, "a second 'form' line");
        if (current_) fail(line_no, "'form' inside control '" + current_->name + "'");
        if (args.size() != 1) fail(line_no, "'form' takes the form's title as one quoted string");
        saved_.title = string_arg(args[0], line_no, "the title");
        saved_.comments = std::move(pending_comments_);
        pending_comments_.clear();
        have_form_ = true;
    }

    void control_line(std::span<const std::string_view> args, int line_no) {
        if (!have_form_) fail(line_no, "the file must begin with a 'form' line");
        if (current_) fail(line_no, "control '" + current_->name + "' (line " + std::to_string(current_->line) +
                                        ") has no 'end' before the next control");
        if (args.size() != 2) fail(line_no, "'control' takes a class and a name");
        const ClassInfo* cls = find_class(classes_, args[0]);
        if (!cls) fail(line_no, "unknown class '" + shown(args[0]) + "'");
        if (cls->is_page) fail(line_no, "'" + cls->name + "' is a property page, not a control");
        const std::string name(args[1]);
        if (!is_name(name)) fail(line_no, "'" + shown(name) + "' is not a name (letters, digits and _)");
        if (const auto [it, added] = names_.try_emplace(name_key(name), saved_.controls.size()); !added) {
            const SavedControl& c = saved_.controls[it->second];
            fail(line_no, "a control named '" + c.name + "' is already on the form (line " + std::to_string(c.line) +
                              ")");
        }
        current_.emplace();
        current_->class_name = cls->name;
        current_->name = name;
        current_->line = line_no;
        current_class_ = cls;
        current_->comments = std::move(pending_comments_);
        pending_comments_.clear();
        seen_at_ = false;
        stored_keys_.clear();
    }

    void end_line(std::span<const std::string_view> args, int line_no) {
        if (!args.empty()) fail(line_no, "'end' takes nothing after it");
        if (!seen_at_) fail(line_no, "control '" + current_->name + "' has no 'at' line (its place on the form)");
        // Comments inside the block are written back before it.
        for (auto& c : pending_comments_) current_->comments.push_back(std::move(c));
        pending_comments_.clear();
        saved_.controls.push_back(std::move(*current_));
        current_.reset();
        current_class_ = nullptr;
    }

    void label_line(std::span<const std::string_view> args, int line_no) {
        if (args.size() != 1 && !(args.size() == 4 && args[1] == "at"))
            fail(line_no, "'label' takes a quoted text, optionally followed by 'at ROW COLUMN'");
        current_->label = string_arg(args[0], line_no, "the label");
        if (args.size() == 4) {
            const auto r = parse_cell(args[2]), c = parse_cell(args[3]);
            if (!r || !c) fail(line_no, "row and column are whole numbers from 1 to " + std::to_string(kMaxCell));
            current_->label_row = *r;
            current_->label_col = *c;
        }
    }

    void at_line(std::span<const std::string_view> args, int line_no) {
        if (args.size() != 2) fail(line_no, "'at' takes a row and a column");
        const auto r = parse_cell(args[0]), c = parse_cell(args[1]);
        if (!r || !c) fail(line_no, "row and column are whole numbers from 1 to " + std::to_string(kMaxCell));
        current_->row = *r;
        current_->col = *c;
        seen_at_ = true;
    }

    void size_line(std::span<const std::string_view> args, int line_no) {
        if (args.size() != 2) fail(line_no, "'size' takes a width and a height in twips");
        const auto w = parse_twips(args[0]), h = parse_twips(args[1]);
        if (!w || !h) fail(line_no, "width and height are numbers of twips above 0");
        current_->width = *w;
        current_->height = *h;
    }

    void store_line(std::span<const std::string_view> args, int line_no) {
        if (args.size() != 2) fail(line_no, "'store' takes a key and a value");
        const std::string key(args[0]);
        if (!is_name(key)) fail(line_no, "'" + shown(key) + "' is not a key (letters, digits and _)");
        if (!stored_keys_.insert(name_key(key)).second) fail(line_no, "'" + key + "' is stored twice");
        current_->stored.emplace_back(key, value_arg(args[1], line_no));
        current_->stored_lines.push_back(line_no);
    }

    void set_line(std::span<const std::string_view> args, int line_no) {
        if (args.size() != 2) fail(line_no, "'set' takes a property and a value");
        const PropertyInfo* p = current_class_->find_property(args[0]);
        if (!p) fail(line_no, current_class_->name + " has no property '" + shown(args[0]) + "'");
        if (p->read_only()) fail(line_no, current_class_->name + "." + p->name + " is read-only");
        if (p->indexed) fail(line_no, current_class_->name + "." + p->name + " takes an index");
        // The date words are checked here with any day: only their spelling can be wrong.
        try {
            setting_value(args[1], Date{});
        } catch (const ScriptError& e) {
            fail(line_no, e.what());
        }
        current_->settings.push_back({p->name, std::string(args[1]), line_no});
    }

    const std::string& file_;
    std::span<const ClassInfo> classes_;
    SavedForm saved_;
    bool have_form_ = false;
    bool seen_at_ = false;
    std::optional<SavedControl> current_;
    const ClassInfo* current_class_ = nullptr;
    // Files may hold tens of thousands of controls, and a control many stored keys: duplicates
    // are found through these, never by a scan.
    std::unordered_map<std::string, std::size_t> names_;  // name_key -> index in saved_.controls
    std::unordered_set<std::string> stored_keys_;         // name_key of the current control's keys
    std::vector<std::string> pending_comments_;
};

}  // namespace

SavedForm parse_form(std::string_view text, const std::string& file, std::span<const ClassInfo> classes) {
    return Parser(file, classes).parse(text);
}

SavedForm read_form_file(const std::string& path, std::span<const ClassInfo> classes, std::size_t max_bytes) {
    std::error_code ec;
    if (std::filesystem::is_directory(path, ec)) throw FormFileError(path, 0, "is a directory, not a form file");
    std::string text;
    try {
        text = decode_text(read_limited(path, max_bytes));
    } catch (const TextFileError& e) {
        throw FormFileError(path, e.line(), e.what());
    }
    return parse_form(text, path, classes);
}

std::string write_form(const SavedForm& form) {
    std::string out;
    for (const auto& c : form.comments) out += c + "\n";
    out += "form " + string_literal(form.title) + "\n";
    for (const SavedControl& c : form.controls) {
        out += "\n";
        for (const auto& note : c.comments) out += note + "\n";
        out += "control " + c.class_name + " " + c.name + "\n";
        if (!c.label.empty() || c.label_row) {
            out += "    label " + string_literal(c.label);
            if (c.label_row && c.label_col)
                out += " at " + std::to_string(*c.label_row) + " " + std::to_string(*c.label_col);
            out += "\n";
        }
        out += "    at " + std::to_string(c.row) + " " + std::to_string(c.col) + "\n";
        out += "    size " + float_text(c.width) + " " + float_text(c.height) + "\n";
        for (const auto& [key, value] : c.stored) out += "    store " + key + " " + value_literal(value, key) + "\n";
        for (const auto& s : c.settings) out += "    set " + s.property + " " + s.value + "\n";
        out += "end\n";
    }
    if (!form.trailing_comments.empty()) {
        out += "\n";
        for (const auto& c : form.trailing_comments) out += c + "\n";
    }
    return out;
}

void write_form_file(const std::string& path, const SavedForm& form) {
    try {
        write_file_safely(path, write_form(form));
    } catch (const SaveError& e) {
        throw FormFileError(path, 0, e.reason());
    }
}

Date financial_year_start(Date day) {
    const Ymd d = to_ymd(day);
    const int year = d.month >= 4 ? d.year : d.year - 1;
    return make_date(year, 4, 1).value_or(day);
}

Date financial_year_end(Date day) {
    const Ymd d = to_ymd(day);
    const int year = d.month >= 4 ? d.year + 1 : d.year;
    return make_date(year, 3, 31).value_or(day);
}

Variant setting_value(std::string_view literal, Date today) {
    if (literal == "today") return Variant(today);
    if (literal == "fy-start") return Variant(financial_year_start(today));
    if (literal == "fy-end") return Variant(financial_year_end(today));
    return parse_value(literal);
}

namespace {

// Every value a control writes, with the default it gives, whether the store would keep it or not.
class WrittenValues final : public PropertyBag {
public:
    struct Written {
        std::string key;
        Variant value;
        Variant default_value;
    };
    Variant read(std::string_view, const Variant& default_value) override { return default_value; }
    void write(std::string_view key, const Variant& value, const Variant& default_value) override {
        written.push_back({std::string(key), value, default_value});
    }
    std::vector<Written> written;
};

// A stored value is taken when what the control would store for its key now equals it, or when
// it is the key's default (nothing to store). Anything else would be lost at the next save.
void check_stored(mini::HostedControl& hosted, const SavedControl& c, const std::string& file) {
    WrittenValues now;
    try {
        hosted.control().WriteProperties(now);
    } catch (const RuntimeError&) {
        return;  // nothing to compare with: the control is left as it loaded
    }
    for (std::size_t i = 0; i < c.stored.size(); ++i) {
        const std::string& key = c.stored[i].first;
        const Variant& value = c.stored[i].second;
        const int line = i < c.stored_lines.size() ? c.stored_lines[i] : c.line;
        const auto w = std::find_if(now.written.begin(), now.written.end(),
                                    [&key = key](const WrittenValues::Written& x) { return same_name(x.key, key); });
        if (w == now.written.end())
            throw FormFileError(file, line, c.name + ": " + c.class_name + " stores no '" + key + "'");
        // Fonts are objects the store never calls equal: they compare as the file writes them.
        const bool fonts = value.is_object() && w->value.is_object();
        if (fonts ? value_literal(value, key) == value_literal(w->value, key)
                  : mini::stored_equal(w->value, value) || mini::stored_equal(value, w->default_value))
            continue;
        throw FormFileError(file, line, c.name + ": stored " + key + " " + value_literal(value, key) +
                                            " is not taken (the control keeps " + value_literal(w->value, key) + ")");
    }
}

}  // namespace

void open_form(mini::FormDriver& form, const SavedForm& saved, std::span<const ClassInfo> classes, const std::string& file,
               Date today) {
    std::vector<mini::HostedControl*> loaded;
    loaded.reserve(saved.controls.size());
    form.reserve(saved.controls.size());
    for (const SavedControl& c : saved.controls) {
        const ClassInfo* cls = find_class(classes, c.class_name);
        if (!cls) throw FormFileError(file, c.line, "unknown class '" + c.class_name + "'");
        try {
            // The form then places the control at its size, as a container lays out a loaded
            // form: some controls set their own width while they read their properties.
            mini::HostedControl& hosted = form.load(*cls, c.name, c.stored, c.width, c.height);
            check_stored(hosted, c, file);
            form.resize(hosted, c.width, c.height);
            loaded.push_back(&hosted);
        } catch (const RuntimeError& e) {
            throw FormFileError(file, c.line, c.name + " could not load its stored values: error " +
                                                  std::to_string(e.number()) + " (" + error_description(e.number()) + ")");
        } catch (const mini::FormError& e) {
            throw FormFileError(file, c.line, e.what());
        }
    }
    for (std::size_t i = 0; i < saved.controls.size(); ++i) {
        const SavedControl& c = saved.controls[i];
        for (const OpenSetting& s : c.settings) {
            Variant value;
            try {
                value = setting_value(s.value, today);
            } catch (const ScriptError& e) {
                throw FormFileError(file, s.line, e.what());
            }
            try {
                loaded[i]->dispatch().set(s.property, value);
            } catch (const RuntimeError& e) {
                throw FormFileError(file, s.line, c.name + "." + s.property + " -> error " +
                                                      std::to_string(e.number()) + " (" + error_description(e.number()) + ")");
            }
        }
    }
}

SavedForm capture_form(mini::FormDriver& form, const SavedForm& saved) {
    SavedForm out = saved;
    int next_row = 1;
    for (const SavedControl& c : out.controls) next_row = std::max(next_row, c.row + 2);
    // A form opened from the file holds its controls in the file's order: each is found in
    // its own place, and the map of names is only built when one is not.
    std::unordered_map<std::string, std::size_t> index;  // name_key -> place in out.controls
    const auto place_of = [&](const std::string& name, std::size_t expected) -> std::optional<std::size_t> {
        if (expected < out.controls.size() && same_name(out.controls[expected].name, name)) return expected;
        if (index.empty())
            for (std::size_t i = 0; i < out.controls.size(); ++i) index.try_emplace(name_key(out.controls[i].name), i);
        const auto it = index.find(name_key(name));
        if (it == index.end()) return std::nullopt;
        return it->second;
    };
    std::size_t expected = 0;
    for (mini::HostedControl* hosted : form.controls()) {
        std::optional<std::size_t> place = place_of(hosted->name(), expected);
        if (!place) {
            SavedControl c;
            c.class_name = hosted->info().name;
            c.name = hosted->name();
            c.label = hosted->name();
            c.row = std::min(next_row, kMaxCell);
            c.col = 20;
            next_row += 2;
            model::Part& surface = hosted->surface_part();
            c.width = static_cast<float>(surface.peek("Width").number());
            c.height = static_cast<float>(surface.peek("Height").number());
            place = out.controls.size();
            if (!index.empty()) index.emplace(name_key(c.name), *place);
            out.controls.push_back(std::move(c));
        }
        out.controls[*place].stored = form.save(*hosted);
        expected = *place + 1;
    }
    return out;
}

Date local_today() {
    // Forms that hang on today's date (the demo's financial year) are tested on a fixed day.
    if (const char* fixed = std::getenv("KELFORM_TODAY"); fixed && *fixed) {
        const std::string_view t(fixed);
        const auto digits = [&](std::size_t from, std::size_t n) {
            int v = 0;
            for (std::size_t i = from; i < from + n; ++i) {
                if (i >= t.size() || t[i] < '0' || t[i] > '9') return -1;
                v = v * 10 + (t[i] - '0');
            }
            return v;
        };
        std::optional<Date> d;
        if (t.size() == 10 && t[4] == '-' && t[7] == '-') d = make_date(digits(0, 4), digits(5, 2), digits(8, 2));
        if (!d) throw FormFileError("KELFORM_TODAY", 0, "'" + std::string(t) + "' is not a date (give yyyy-mm-dd)");
        return *d;
    }
    const std::time_t now = std::time(nullptr);
    std::tm local{};
    if (!localtime_r(&now, &local)) return make_date(2000, 1, 1).value_or(Date{});
    return make_date(local.tm_year + 1900, local.tm_mon + 1, local.tm_mday).value_or(Date{});
}

void add_form_commands(Player& player, std::span<const ClassInfo> classes, std::size_t max_file_bytes) {
    // The form file the script's form was loaded from, shared by the two commands of this player.
    auto saved = std::make_shared<SavedForm>();
    saved->title = "Form";
    const auto file_arg = [](Args& a) {
        const std::string_view word = a.next("FILE");
        a.finish();
        return is_string_literal(word) ? decode_string(word) : std::string(word);
    };
    player.add_command("loadform", [saved, classes, file_arg, max_file_bytes](Player& p, Args& a) {
        const std::string file = file_arg(a);
        try {
            SavedForm loaded = read_form_file(file, classes, max_file_bytes);
            open_form(p.form(), loaded, classes, file, local_today());
            if (saved->controls.empty()) {
                *saved = std::move(loaded);
            } else {
                for (auto& c : loaded.controls) saved->controls.push_back(std::move(c));
            }
        } catch (const FormFileError& e) {
            throw ScriptError(e.what());
        }
    });
    player.add_command("saveform", [saved, file_arg](Player& p, Args& a) {
        const std::string file = file_arg(a);
        try {
            write_form_file(file, capture_form(p.form(), *saved));
        } catch (const FormFileError& e) {
            throw ScriptError(e.what());
        }
    });
}

}  // namespace kel::kelform
