#pragma once
// Colours and the shared font object of the host.
#include <cstdint>
#include <memory>
#include <string>

#include "keltext/host/variant.h"

namespace kel {

// 0x00BBGGRR, or a system colour: top bit set, the system colour's index in the low byte.
using Colour = int32_t;

constexpr Colour rgb(int r, int g, int b) { return (b & 0xFF) << 16 | (g & 0xFF) << 8 | (r & 0xFF); }
constexpr Colour system_colour(int index) { return static_cast<Colour>(0x80000000u | static_cast<uint32_t>(index & 0xFF)); }
constexpr bool is_system_colour(Colour c) { return c < 0; }
constexpr Colour kGreyText = system_colour(0x11);  // 0x80000011

// Shared by reference: a control hands the same object to its surface and its edit widget,
// so a change through one is seen by the other.
class Font : public Object {
public:
    Font() = default;
    Font(std::string name, double size, bool bold = false, bool italic = false)
        : name(std::move(name)), size(size), bold(bold), italic(italic) {}

    std::string name = "Fixedsys";
    double size = 9;  // points
    bool bold = false;
    bool italic = false;

    bool same_as(const Font& o) const {
        return name == o.name && size == o.size && bold == o.bold && italic == o.italic;
    }
};

inline std::shared_ptr<Font> default_font() { return std::make_shared<Font>("Fixedsys", 9); }

// The font object a value holds, or null when it holds none.
std::shared_ptr<Font> font_of(const Variant& v);
// The same for a property set: a value that holds no font is a type mismatch (13).
std::shared_ptr<Font> require_font(const Variant& v);

}  // namespace kel
