// The Qt host through real Qt events: typing, focus, Tab, send-keys, input methods.
#include <QApplication>
#include <QLineEdit>
#include <QTest>

#include "keltext/host/conversions.h"
#include "keltext/qt/form_window.h"
#include "keltext/qt/services.h"
#include "keltext/qt/views.h"

using namespace kel;
using namespace kel::qt;

namespace {

// Records what the controls raise, as a form driver would.
struct Recorder : model::FormObserver {
    std::vector<std::string> lines;
    void event_raised(model::HostedControl& c, int, std::string_view event, std::span<EventArg>) override {
        lines.push_back(c.name() + "." + std::string(event));
    }
    void keys_sent(model::HostedControl& c, std::string_view keys) override {
        lines.push_back(c.name() + " sent " + std::string(keys));
    }
    bool has(const std::string& line) const { return std::find(lines.begin(), lines.end(), line) != lines.end(); }
    long count(const std::string& line) const { return std::count(lines.begin(), lines.end(), line); }
};

std::string text_of_part(model::HostedControl& c, const char* part) {
    return c.part(part)->peek("Text").str();
}

}  // namespace

class QtHostTest : public QObject {
    Q_OBJECT

private slots:
    void numeric_typing_through_key_events();
};

void QtHostTest::numeric_typing_through_key_events() {
    FormWindow form;
    Recorder rec;
    form.set_observer(&rec);
    const ClassInfo& cls = *form.services().catalogue().find("KelNumeric");
    QtSite& n = form.create(cls, "n");
    form.create(cls, "next");
    n.dispatch().set("NoOfDecimals", int16_t{2});
    form.sync();
    QCOMPARE(form.focus(&n), model::FormDriver::FocusResult::moved);
    QCOMPARE(QApplication::focusWidget(), n.focus_view());
    QTest::keyClicks(n.focus_view(), "1234567");
    QCOMPARE(text_of_part(n, "txtNumeric"), std::string("1234.56"));
    auto* view = qobject_cast<QLineEdit*>(n.focus_view());
    QCOMPARE(view->text(), QString("1234.56"));
    QTest::keyClick(n.focus_view(), Qt::Key_Tab);
    QCOMPARE(form.focused()->name(), std::string("next"));
    QCOMPARE(to_double(n.dispatch().get("Text")), 1234.56);
    form.set_observer(nullptr);
}

QTEST_MAIN(QtHostTest)
#include "qt_host_test.moc"
