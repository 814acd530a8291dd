#pragma once
// The minimal host's property store is the one every host shares.
#include "keltext/minihost/form.h"
#include "keltext/widgetmodel/property_store.h"

namespace kel::mini {

using model::PropertyStore;
using model::stored_equal;

}  // namespace kel::mini
