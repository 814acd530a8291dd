// `kelform play --host qt`: one QApplication for the run, offscreen when there is no display.
#include "apps/kelform/qt_host.h"

#include <QApplication>
#include <cstdlib>
#include <memory>

#include "apps/kelform/qt_driver.h"

namespace kel::kelform {

Player::FormMaker qt_form_maker(std::ostream& err) {
    static std::unique_ptr<QApplication> app;
    if (!QApplication::instance()) {
        const char* display = std::getenv("DISPLAY");
        const char* wayland = std::getenv("WAYLAND_DISPLAY");
        if (!std::getenv("QT_QPA_PLATFORM") && !(display && *display) && !(wayland && *wayland))
            setenv("QT_QPA_PLATFORM", "offscreen", 0);
        static int argc = 1;
        static char name[] = "kelform";
        static char* argv[] = {name, nullptr};
        app = std::make_unique<QApplication>(argc, argv);
    }
    if (!QApplication::instance()) {
        err << "kelform play: Qt could not start\n";
        return {};
    }
    return [](model::FormObserver* observer) { return std::make_unique<QtFormDriver>(observer); };
}

}  // namespace kel::kelform
