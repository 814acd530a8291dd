// kelform built without Qt: the Qt host is not there to choose.
#include "apps/kelform/qt_host.h"

namespace kel::kelform {

Player::FormMaker qt_form_maker(std::ostream& err) {
    err << "kelform play: this kelform was built without Qt, so --host qt is not available\n";
    return {};
}

}  // namespace kel::kelform
