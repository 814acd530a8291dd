#include "keltext/numeric/number_format.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstdlib>

#include "keltext/host/conversions.h"

namespace kel {
namespace {

bool all_digits(std::string_view t) {
    return std::all_of(t.begin(), t.end(), [](char c) { return c >= '0' && c <= '9'; });
}

// The last `n` characters of `t`; a leading "-" is kept in front, since dropping it would
// turn the number into its opposite rather than merely shorten it.
std::string_view last_chars(std::string_view t, int n, std::string& sign) {
    sign.clear();
    if (!t.empty() && t.front() == '-') {
        sign = "-";
        t.remove_prefix(1);
    }
    std::size_t keep = static_cast<std::size_t>(std::max(n, 0));
    if (t.size() > keep) t.remove_prefix(t.size() - keep);
    return t;
}

// The text form of an assigned value before it is shaped.
std::string assigned_text(const Variant& value) {
    if (value.is_string()) return StripGrouping(value.str());
    if (value.is_empty()) return {};
    if (value.is_number()) {
        std::string t = text_of(value);
        return t.find('E') == std::string::npos ? t : BoxNumberText(value.number());
    }
    return BoxNumberText(value.number());  // boolean, date
}

}  // namespace

std::string BoxNumberText(double value) {
    std::string plain = plain_number_text(value);
    if (plain.find('E') == std::string::npos || !std::isfinite(value)) return plain;
    // d.dddddddddddddde+XXX: the 15 significant digits and the power of ten of the first.
    char buf[40];
    std::snprintf(buf, sizeof buf, "%.*e", kMaxSignificantDigits - 1, std::fabs(value));
    const std::string_view sci(buf);
    const std::size_t e = sci.find('e');
    std::string digits;
    for (char c : sci.substr(0, e))
        if (c != '.') digits += c;
    while (digits.size() > 1 && digits.back() == '0') digits.pop_back();
    const int exponent = std::atoi(buf + e + 1);
    std::string out = value < 0 ? "-" : "";
    if (exponent >= 0) {
        const auto whole = static_cast<std::size_t>(exponent) + 1;
        if (digits.size() <= whole) {
            out += digits;
            out.append(whole - digits.size(), '0');
        } else {
            out.append(digits, 0, whole).append(".").append(digits, whole);
        }
    } else {
        out += "0.";
        out.append(static_cast<std::size_t>(-exponent - 1), '0');
        out += digits;
    }
    return out;
}

std::string GroupIndian(std::string_view t) {
    std::string_view sign;
    if (!t.empty() && (t.front() == '-' || t.front() == '+')) {
        sign = t.substr(0, 1);
        t.remove_prefix(1);
    }
    std::string out(sign);
    if (t.size() <= 3 || !all_digits(t)) {
        out.append(t);
        return out;
    }
    std::string_view head = t.substr(0, t.size() - 3);
    std::string_view tail = t.substr(t.size() - 3);
    out.reserve(sign.size() + t.size() + t.size() / 2);
    // Pairs from the right: the leftmost group takes the one or two characters left over.
    std::size_t first_group = head.size() % 2 == 0 ? 2 : 1;
    out.append(head.substr(0, first_group));
    for (std::size_t i = first_group; i < head.size(); i += 2) {
        out.push_back(',');
        out.append(head.substr(i, 2));
    }
    out.push_back(',');
    out.append(tail);
    return out;
}

std::string FormatGrouped(std::string_view text) {
    std::size_t dot = text.find('.');
    if (dot == std::string_view::npos) return GroupIndian(text);
    std::string out = GroupIndian(text.substr(0, dot));
    out.append(text.substr(dot));
    return out;
}

std::string StripGrouping(std::string_view text) {
    std::string out;
    out.reserve(text.size());
    for (char c : text)
        if (c != ',') out.push_back(c);
    return out;
}

std::string PadDecimals(std::string_view text, int decimals) {
    std::string out(text);
    if (decimals <= 0) return out;
    std::size_t n = static_cast<std::size_t>(decimals);
    std::size_t dot = text.find('.');
    if (dot == std::string_view::npos) {
        if (out.empty()) out = "0";
        out.push_back('.');
        out.append(n, '0');
        return out;
    }
    std::size_t have = text.size() - dot - 1;
    if (have < n) out.append(n - have, '0');
    return out;
}

double numeric_value_of(const Variant& value) {
    if (value.is_string()) return leading_value(StripGrouping(value.str()));
    if (value.is_object()) return 0;
    return value.number();
}

std::string ShapeAssignedText(const Variant& value, const NumericLimits& limits) {
    if (!numeric_test(value)) return "0";

    double v = numeric_value_of(value);
    bool replaced = false;
    if (limits.max_value > 0 && v > limits.max_value) {
        v = limits.max_value;
        replaced = true;
    }
    if (v < limits.min_value) {
        v = limits.min_value;
        replaced = true;
    }
    std::string text = replaced ? BoxNumberText(v) : assigned_text(value);

    std::size_t dot = text.find('.');
    int room = std::max(limits.max_length - limits.decimals - 1, 0);
    std::string sign;
    if (limits.decimals > 0 && dot != std::string::npos) {
        std::string_view whole = std::string_view(text).substr(0, dot);
        std::string_view dec = std::string_view(text).substr(dot + 1);
        // Excess decimals are dropped, not rounded: the box keeps what it was given.
        if (dec.size() > static_cast<std::size_t>(limits.decimals)) dec = dec.substr(0, static_cast<std::size_t>(limits.decimals));
        whole = last_chars(whole, room, sign);
        std::string out = sign;
        out.append(whole).append(".").append(dec);
        return out;
    }
    if (limits.decimals > 0) {
        std::string_view whole = last_chars(text, room, sign);
        std::string out = sign;
        out.append(whole).push_back('.');
        // Two zeros, which leaving the box then pads to the full decimals; a one-decimal box
        // gets one, since nothing would ever take the second away again.
        out.append(static_cast<std::size_t>(std::min(limits.decimals, 2)), '0');
        return out;
    }
    if (limits.max_length > 0) {
        std::string_view kept = last_chars(text, limits.max_length, sign);
        return sign + std::string(kept);
    }
    return text;
}

}  // namespace kel
