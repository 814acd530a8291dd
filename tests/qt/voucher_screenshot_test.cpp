// The demo voucher on the desktop, filled in through Qt's events as a person would type it:
// Enter moves on, the form's code speaks on the status line, F4 opens the calendar, the record
// is saved and printed as the terminal form writes it. The window is then grabbed to a PNG
// in the build tree (voucher.png, kept by CI) and checked not to be blank.
#include <QApplication>
#include <QCalendarWidget>
#include <QFile>
#include <QImage>
#include <QLabel>
#include <QLineEdit>
#include <QSet>
#include <QSignalSpy>
#include <QTemporaryDir>
#include <QTest>

#include "apps/kelform-qt/desktop_form.h"
#include "apps/kelform/demo_form.h"
#include "keltext/library/catalogue.h"
#include "keltext/qt/views.h"

using namespace kel;
using namespace kel::kelform;

namespace {

// The text a control's view shows.
QString shown(DesktopForm& form, const char* name) {
    model::HostedControl* c = form.driver().find(name);
    if (!c) return QStringLiteral("<no control>");
    QWidget& w = form.driver().form_window().widget_of(*c);
    if (auto* combo = w.findChild<qt::ComboView*>()) return combo->edit().text();
    auto* edit = w.findChild<QLineEdit*>();
    return edit ? edit->text() : QString();
}

const char* focused_name(DesktopForm& form) {
    model::HostedControl* f = form.driver().focused();
    return f ? f->name().c_str() : "";
}

void type_and_enter(const QString& text) {
    QWidget* w = QApplication::focusWidget();
    QVERIFY(w);
    QTest::keyClicks(w, text);
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_Return);
    QCoreApplication::processEvents();
}

}  // namespace

class VoucherScreenshotTest : public QObject {
    Q_OBJECT

private slots:
    void fill_in_save_and_grab();
};

void VoucherScreenshotTest::fill_in_save_and_grab() {
    QTemporaryDir dir;
    const std::string record = dir.filePath(QStringLiteral("voucher.json")).toStdString();
    Catalogue catalogue;
    const SavedForm saved = parse_form(demo_form_text(), std::string(kDemoFormName), catalogue.classes());
    const Date today = *make_date(2026, 12, 6);
    DesktopForm form(saved, std::string(kDemoFormName), today, record);
    QWidget& window = form.window();
    QVERIFY(QTest::qWaitForWindowActive(&window));
    QCOMPARE(window.windowTitle(), QStringLiteral("Payment voucher"));
    QCOMPARE(focused_name(form), "Payee");

    type_and_enter(QStringLiteral("ravi kumar"));
    QCOMPARE(focused_name(form), "PAN");
    type_and_enter(QStringLiteral("abcde1234f"));
    QCOMPARE(focused_name(form), "Amount");
    // The numeric box refuses a letter: its ControlError is the form's status message.
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_X);
    QCOMPARE(form.status(), QStringLiteral("Amount: key refused - up to 8 digits, a point and 2 decimals"));
    type_and_enter(QStringLiteral("12500"));
    QCOMPARE(focused_name(form), "VoucherDate");
    QCOMPARE(form.status(), QString());  // grouped and padded only: no change of value
    // F4 on the date box opens the calendar on its date; Escape closes it.
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_F4);
    QVERIFY(form.calendar());
    QCOMPARE(form.calendar()->selectedDate(), QDate(2026, 12, 6));
    QTest::keyClick(form.calendar(), Qt::Key_Escape);
    QCoreApplication::processEvents();
    QVERIFY(!form.calendar());
    QTRY_VERIFY(QApplication::activeWindow() == &window);
    QCOMPARE(focused_name(form), "VoucherDate");
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_Return);
    QCoreApplication::processEvents();
    QCOMPARE(focused_name(form), "PayMode");
    type_and_enter(QStringLiteral("ch"));
    QCOMPARE(focused_name(form), "ChequeNo");
    // Below the smallest cheque number: leaving clamps it, and the form says so.
    type_and_enter(QStringLiteral("12345"));
    QCOMPARE(focused_name(form), "Period");
    QCOMPARE(form.status(), QStringLiteral("Cheque number: 12345 was changed to 100000"));

    // Month 13 is no period: Ctrl+S completes the field first, its DateError speaks, nothing
    // is saved and the box keeps focus once.
    QTest::keyClicks(QApplication::focusWidget(), QStringLiteral("1326"));
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_S, Qt::ControlModifier);
    QCOMPARE(form.status(), QStringLiteral("Period: give a month 01-12 and a two-digit year (mm/yy) - focus stays; "
                                           "leave again to keep it"));
    QCOMPARE(focused_name(form), "Period");
    QVERIFY(!QFile::exists(QString::fromStdString(record)));

    QCOMPARE(shown(form, "Payee"), QStringLiteral("Ravi Kumar"));
    QCOMPARE(shown(form, "PAN"), QStringLiteral("ABCDE1234F"));
    QCOMPARE(shown(form, "Amount"), QStringLiteral("12,500.00"));
    QCOMPARE(shown(form, "VoucherDate"), QStringLiteral("06/12/2026"));
    QCOMPARE(shown(form, "PayMode"), QStringLiteral("Cheque"));
    QCOMPARE(shown(form, "ChequeNo"), QStringLiteral("100000"));
    QCOMPARE(shown(form, "Period"), QStringLiteral("13/26_"));

    const QImage image = window.grab().toImage();
    QVERIFY(image.save(QStringLiteral(KELTEXT_SCREENSHOT)));
    QSet<QRgb> colours;
    for (int y = 0; y < image.height(); y += 2)
        for (int x = 0; x < image.width(); x += 2) colours.insert(image.pixel(x, y));
    QVERIFY2(colours.size() > 8, "the grabbed window is blank");

    // F10 leaves the box a second time, as it is, saves the record the terminal form would
    // write and prints it.
    QSignalSpy done(&form, &DesktopForm::finished);
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_F10);
    QVERIFY2(done.count() == 1, qPrintable(form.status()));
    QFile file(QString::fromStdString(record));
    QVERIFY(file.open(QIODevice::ReadOnly));
    const QByteArray json = file.readAll();
    for (const char* member : {"\"Payee\": \"Ravi Kumar\"", "\"PAN\": \"ABCDE1234F\"", "\"Amount\": 12500",
                               "\"VoucherDate\": \"06/12/2026\"", "\"PayMode\": \"Cheque\"",
                               "\"ChequeNo\": \"100000\""})
        QVERIFY2(json.contains(member), json.constData());
    QCOMPARE(done.front().front().toString().toUtf8() + "\n", json);
}

QTEST_MAIN(VoucherScreenshotTest)
#include "voucher_screenshot_test.moc"
