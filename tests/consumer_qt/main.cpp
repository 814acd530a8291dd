// A Qt application that puts a numeric box on a window and types into it (offscreen), built
// against the installed package. README's "In a Qt application" shows the same program.
#include <QApplication>
#include <QKeyEvent>
#include <cstdio>

#include "keltext/qt/kel_controls.h"

int main(int argc, char** argv) {
    QApplication app(argc, argv);
    QWidget window;
    auto* amount = new kel::qt::KelNumeric(&window);
    amount->setMaxLength(12);
    amount->setNoOfDecimals(2);
    amount->setTxtFormat(true);
    // A slot may change an event's by-reference argument: here it drops every "9".
    QObject::connect(amount, &kel::qt::KelNumeric::keyPress, [](short& keyAscii) {
        if (keyAscii == '9') keyAscii = 0;
    });
    window.show();
    QApplication::setActiveWindow(&window);
    amount->setFocus();
    for (const char c : std::string("12345697.5")) {
        const QString text(QChar::fromLatin1(c));
        const int key = c == '.' ? Qt::Key_Period : c;
        QKeyEvent press(QEvent::KeyPress, key, Qt::NoModifier, text);
        QApplication::sendEvent(QApplication::focusWidget(), &press);
        QKeyEvent release(QEvent::KeyRelease, key, Qt::NoModifier, text);
        QApplication::sendEvent(QApplication::focusWidget(), &release);
    }
    amount->clearFocus();  // leaving the box formats it
    const QString text = amount->member("Text").toString();
    std::printf("%s\n", qPrintable(text));
    return text == "1234567.5" ? 0 : 1;
}
