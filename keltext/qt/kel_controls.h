#pragma once
#include "keltext/qt/control_widget.h"
