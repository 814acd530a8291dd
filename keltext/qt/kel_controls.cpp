#include "keltext/qt/kel_controls.h"

namespace kel::qt {

ControlWidget* create_control_widget(const ControlWidget::Creation& creation, QWidget* parent) {
    return new ControlWidget(creation, parent);
}

}  // namespace kel::qt
