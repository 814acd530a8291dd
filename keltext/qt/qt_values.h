#pragma once
// The controls' values as Qt types and back: colours (system colours as palette roles),
// fonts, variants. One place for each conversion.
#include <QColor>
#include <QFont>
#include <QString>
#include <QVariant>
#include <memory>

#include "keltext/host/font.h"
#include "keltext/host/variant.h"

namespace kel::qt {

// A colour as Qt shows it: an RGB value as it is, a system colour as the application
// palette's colour of the role that stands for it (window, window text, button face, ...).
QColor qcolor_of(Colour c);
// An RGB colour (the alpha is dropped: the controls have none).
Colour colour_of(const QColor& c);

QFont qfont_of(const kel::Font& f);
std::shared_ptr<kel::Font> font_of(const QFont& f);

// A variant as a QVariant: numbers keep their C++ type (short, int, float, double, uchar),
// strings become QString (from Windows-1252), dates QDate, fonts QFont, empty an invalid QVariant.
QVariant qvariant_of(const Variant& v);
// A QVariant as a variant: the inverse of qvariant_of; a colour becomes its RGB value, text
// outside Windows-1252 loses the characters the set lacks.
Variant variant_of(const QVariant& v);

}  // namespace kel::qt
