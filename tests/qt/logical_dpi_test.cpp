// The second DPI the Qt scripts run at must really be in force: on Qt 6.4 offscreen,
// QT_FONT_DPI alone leaves the logical DPI at 96. KELTEXT_EXPECT_DPI names the DPI expected.
#include <QApplication>
#include <QTest>
#include <QWidget>
#include <cstdlib>

class LogicalDpi : public QObject {
    Q_OBJECT

private slots:
    void windowsSeeTheExpectedDpi() {
        const char* expected = std::getenv("KELTEXT_EXPECT_DPI");
        QVERIFY2(expected, "KELTEXT_EXPECT_DPI is not set");
        QWidget w;
        w.show();
        QCOMPARE(w.logicalDpiX(), std::atoi(expected));
        QCOMPARE(w.logicalDpiY(), std::atoi(expected));
    }
};

QTEST_MAIN(LogicalDpi)
#include "logical_dpi_test.moc"
