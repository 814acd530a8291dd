#pragma once
// `kelform play --host qt`: scripts run through real Qt widgets.
#include <ostream>

#include "apps/kelform/script_player.h"

namespace kel::kelform {

// What makes each script's form on the Qt host; empty (and the reason on `err`) when kelform
// was built without Qt or Qt cannot start.
Player::FormMaker qt_form_maker(std::ostream& err);

}  // namespace kel::kelform
