// `kelform play --host qt`: one QApplication for the run, offscreen when there is no display.
#include "apps/kelform/qt_host.h"

#include <QApplication>
#include <cstdio>
#include <cstdlib>
#include <memory>

#include "apps/kelform/qt_driver.h"

namespace kel::kelform {
namespace {

// Qt's messages go to standard error as usual, where a script's output would show them, all
// but the note that a run without a login session has no runtime folder of its own.
void qt_message(QtMsgType type, const QMessageLogContext& context, const QString& message) {
    if (message.startsWith("QStandardPaths: XDG_RUNTIME_DIR not set")) return;
    std::fputs(qFormatLogMessage(type, context, message).toLocal8Bit().constData(), stderr);
    std::fputc('\n', stderr);
}

}  // namespace

Player::FormMaker qt_form_maker(std::ostream& err) {
    if (!QApplication::instance()) {
        const char* display = std::getenv("DISPLAY");
        const char* wayland = std::getenv("WAYLAND_DISPLAY");
        if (!std::getenv("QT_QPA_PLATFORM") && !(display && *display) && !(wayland && *wayland))
            setenv("QT_QPA_PLATFORM", "offscreen", 0);
        static int argc = 1;
        static char name[] = "kelform";
        static char* argv[] = {name, nullptr};
        qInstallMessageHandler(qt_message);
        // Made once and never destroyed: the forms of every script live in it, and the
        // process ends right after the last script.
        new QApplication(argc, argv);
    }
    if (!QApplication::instance()) {
        err << "kelform play: Qt could not start\n";
        return {};
    }
    return [](model::FormObserver* observer) { return std::make_unique<QtFormDriver>(observer); };
}

}  // namespace kel::kelform
