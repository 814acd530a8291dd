// The public wrappers: Q_PROPERTYs through the member table, signals with by-reference
// arguments, and persistence through kelSettings, which must store and load exactly as the
// minimal host's save and load do.
#include <QApplication>
#include <QSignalSpy>
#include <QTest>

#include "keltext/host/conversions.h"
#include "keltext/host/value_literal.h"
#include "keltext/minihost/form.h"
#include "keltext/qt/form_window.h"
#include "keltext/qt/kel_controls.h"
#include "keltext/qt/property_bag.h"
#include "keltext/qt/services.h"

using namespace kel;
using namespace kel::qt;

namespace {

std::string literal_lines(const model::StoredValues& values) { return store_text(values); }

// Every key each class stores, with a value that is not its default. The numeric's Maxvalue
// stands before NoOfDecimals, as a .ui file would order the properties.
const std::vector<std::pair<std::string, std::string>> kStores = {
    {"KelAlphaNumeric",
     "store BorderStyle 0\nstore TextType i32:1\nstore Forecolor 0x0000FF\nstore Backcolor 0x00FFFF\n"
     "store Font font:\"Arial\":12:bold\nstore MaxLength i32:10\nstore Text \"AB12\"\nstore Locked true\n"
     "store Enabled false\nstore TextSelect false\n"},
    {"KelNumeric",
     "store Maxvalue 5000\nstore NoOfDecimals 2\nstore Increment 5\nstore UpDownScroll true\nstore MinValue 10\n"
     "store BorderStyle 0\nstore Forecolor 0x0000FF\nstore Backcolor 0x00FFFF\nstore Font font:\"Arial\":12\n"
     "store MaxLength 10\nstore Locked true\nstore Enabled false\nstore TriggerError true\nstore TxtFormat true\n"},
    {"KelDateMask",
     "store DateStyle i32:1\nstore Forecolor 0x0000FF\nstore Backcolor 0x00FFFF\nstore Font font:\"Arial\":12:italic\n"
     "store ShowCalendar false\nstore Enabled false\nstore Locked true\nstore TriggerError true\nstore ZubDate false\n"
     "store AllowBlankDate true\nstore CalendarPosition u8:0\n"},
    {"KelCombo",
     "store TextType i32:2\nstore Forecolor 0x0000FF\nstore Backcolor 0x00FFFF\nstore Font font:\"Arial\":12\n"
     "store MaxLength 8\nstore Text \"CASH\"\nstore AutoSearch true\nstore Locked true\nstore Enabled false\n"
     "store FillList \"CASH\\xC91\\xC8CARD\\xC92\\xC8\"\n"},
};

// What WriteProperties writes, whether the store keeps it or not.
struct WrittenKeys final : PropertyBag {
    std::vector<std::string> keys;
    Variant read(std::string_view, const Variant& d) override { return d; }
    void write(std::string_view key, const Variant&, const Variant&) override { keys.emplace_back(key); }
};

}  // namespace

class QtWrappersTest : public QObject {
    Q_OBJECT

private slots:
    void properties_round_trip_data();
    void properties_round_trip();
    void property_errors_are_reported_not_thrown();
    void signals_by_reference_drop_a_key();
    void generic_event_signal_changes_arguments();
    void settings_round_trip_equals_the_minimal_host_data();
    void settings_round_trip_equals_the_minimal_host();
    void settings_load_where_properties_in_order_would_not();
    void variant_map_bag_round_trip();
    void settings_errors_name_the_line();
    void methods_are_invokable();
};

void QtWrappersTest::properties_round_trip_data() {
    QTest::addColumn<QString>("cls");
    QTest::addColumn<QString>("property");
    QTest::addColumn<QVariant>("value");
    QTest::newRow("int") << "KelNumeric" << "MaxLength" << QVariant(12);
    QTest::newRow("int decimals") << "KelNumeric" << "NoOfDecimals" << QVariant(3);
    QTest::newRow("double") << "KelNumeric" << "MaxValue" << QVariant(5000.0);
    QTest::newRow("bool") << "KelNumeric" << "TxtFormat" << QVariant(true);
    QTest::newRow("colour") << "KelAlphaNumeric" << "BackColor" << QVariant(QColor(255, 0, 0));
    QTest::newRow("string") << "KelAlphaNumeric" << "Text" << QVariant(QString("Ramesh"));
    QTest::newRow("text outside ASCII") << "KelCombo" << "Text" << QVariant(QString::fromUtf8("Caf\u00e9 \u20ac"));
    QTest::newRow("enum") << "KelDateMask" << "DateStyle" << QVariant::fromValue(KelDateMask::mmyyA);
    QTest::newRow("enum by name") << "KelAlphaNumeric" << "TextType" << QVariant(QString("KelANUpperCase"));
    QTest::newRow("font") << "KelCombo" << "Font" << QVariant(QFont("DejaVu Sans", 12));
}

void QtWrappersTest::properties_round_trip() {
    QFETCH(QString, cls);
    QFETCH(QString, property);
    QFETCH(QVariant, value);
    FormWindow form;
    ControlWidget& w = form.widget_of(form.create(*form.services().catalogue().find(cls.toStdString()), "c"));
    QVERIFY(w.setProperty(property.toLatin1(), value));
    QCOMPARE(w.lastError(), 0);
    const QVariant back = w.property(property.toLatin1());
    if (value.metaType().id() == QMetaType::QString && back.metaType().flags() & QMetaType::IsEnumeration) {
        QCOMPARE(back.toInt(), int(KelAlphaNumeric::KelANUpperCase));
    } else if (value.metaType().id() == QMetaType::QFont) {
        QCOMPARE(back.value<QFont>().family(), value.value<QFont>().family());
        QCOMPARE(back.value<QFont>().pointSizeF(), value.value<QFont>().pointSizeF());
    } else {
        QCOMPARE(back, value);
    }
}

void QtWrappersTest::property_errors_are_reported_not_thrown() {
    KelCombo box;
    QSignalSpy errors(&box, &ControlWidget::runtimeError);
    box.setListIndex(7);  // no such entry: 381, and the combo selects nothing
    QCOMPARE(errors.count(), 1);
    QCOMPARE(errors.at(0).at(0).toInt(), 381);
    QCOMPARE(box.lastError(), 381);
    QCOMPARE(box.ListIndex(), -1);
    QVERIFY(!box.setProperty("ListIndex", 9) || box.lastError() == 381);
}

void QtWrappersTest::signals_by_reference_drop_a_key() {
    FormWindow form;
    auto& box = static_cast<KelNumeric&>(form.widget_of(form.create(*form.services().catalogue().find("KelNumeric"), "n")));
    std::vector<int> seen;
    connect(&box, &KelNumeric::keyPress, &box, [&](short& keyAscii) {
        seen.push_back(keyAscii);
        if (keyAscii == '3') keyAscii = 0;  // the form drops the key
    });
    form.focus(&box.site());
    QTest::keyClicks(box.site().focus_view(), "1234");
    QCOMPARE(box.site().keyboard_part()->peek("Text").str(), std::string("124"));
    QCOMPARE(seen, (std::vector<int>{'1', '2', '3', '4'}));
}

void QtWrappersTest::generic_event_signal_changes_arguments() {
    FormWindow form;
    auto& box = form.widget_of(form.create(*form.services().catalogue().find("KelAlphaNumeric"), "a"));
    box.setMember("TextType", 5);
    connect(&box, &ControlWidget::kelEvent, &box, [](int, const QString& name, QVariantList& args) {
        if (name == "KeyPress" && args.value(0).toInt() == 'x') args[0] = QVariant(short('y'));
    });
    form.focus(&box.site());
    QTest::keyClicks(box.site().focus_view(), "axb");
    QCOMPARE(box.site().keyboard_part()->peek("Text").str(), std::string("ayb"));
}

void QtWrappersTest::settings_round_trip_equals_the_minimal_host_data() {
    QTest::addColumn<QString>("cls");
    QTest::addColumn<QString>("settings");
    for (const auto& [cls, text] : kStores) QTest::newRow(cls.c_str()) << QString::fromStdString(cls) << QString::fromStdString(text);
}

void QtWrappersTest::settings_round_trip_equals_the_minimal_host() {
    QFETCH(QString, cls);
    QFETCH(QString, settings);
    const model::StoredValues store = parse_store_text(settings.toStdString());
    mini::Form mini;
    const ClassInfo& info = *Services::of_application().catalogue().find(cls.toStdString());
    const model::StoredValues mini_saved = mini.save(mini.load(info, "c", store));

    // Every key the class writes is in the table, with a value the store keeps.
    WrittenKeys written;
    mini.create(info, "probe").control().WriteProperties(written);
    for (const auto& key : written.keys) {
        const bool kept = std::any_of(mini_saved.begin(), mini_saved.end(), [&](const auto& kv) { return same_name(kv.first, key); });
        QVERIFY2(kept, key.c_str());
    }

    std::unique_ptr<ControlWidget> w(create_control_widget({&info, "c", 1200, 300, std::nullopt}, nullptr));
    w->setProperty("kelSettings", settings);
    QCOMPARE(w->lastError(), 0);
    QCOMPARE(w->property("kelSettings").toString().toStdString(), literal_lines(mini_saved));
    // And once more from what it wrote.
    w->setKelSettings(w->kelSettings());
    QCOMPARE(w->kelSettings().toStdString(), literal_lines(mini_saved));
}

void QtWrappersTest::settings_load_where_properties_in_order_would_not() {
    // Set one by one in .ui order, NoOfDecimals resets the bounds MaxValue set before it.
    KelNumeric in_order;
    in_order.setProperty("MaxValue", 5000.0);
    in_order.setProperty("NoOfDecimals", 2);
    QCOMPARE(in_order.MaxValue(), 0.0);
    KelNumeric loaded;
    loaded.setKelSettings("store Maxvalue 5000\nstore NoOfDecimals 2\n");
    QCOMPARE(loaded.MaxValue(), 5000.0);
    QCOMPARE(loaded.NoOfDecimals(), 2);
}

void QtWrappersTest::variant_map_bag_round_trip() {
    // Each stored value keeps its kind through the map: a 16-bit MaxLength stays 16-bit.
    for (const auto& [cls, text] : kStores) {
        const ClassInfo* info = Services::of_application().catalogue().find(cls);
        std::unique_ptr<ControlWidget> from(create_control_widget({info, "a", 1200, 300, parse_store_text(text)}, nullptr));
        std::unique_ptr<ControlWidget> to(create_control_widget({info, "b", 1200, 300, std::nullopt}, nullptr));
        const QVariantMap map = from->saveToMap();
        QVERIFY(!map.isEmpty());
        to->loadFromMap(map);
        QCOMPARE(to->kelSettings(), from->kelSettings());
    }
}

void QtWrappersTest::settings_errors_name_the_line() {
    KelNumeric box;
    QSignalSpy errors(&box, &ControlWidget::runtimeError);
    box.setKelSettings("store MaxLength 9\nstore Maxvalue \"unterminated\n");
    QCOMPARE(errors.count(), 1);
    QVERIFY(errors.at(0).at(1).toString().contains("line 2"));
    QCOMPARE(box.MaxLength(), KelNumeric().MaxLength());  // nothing was loaded
    QVERIFY_THROWS_EXCEPTION(StoreTextError, parse_store_text("stor MaxLength 9"));
    QVERIFY_THROWS_EXCEPTION(StoreTextError, parse_store_text("store MaxLength 9\nstore maxlength 8"));
}

void QtWrappersTest::methods_are_invokable() {
    KelCombo combo;
    QVERIFY(QMetaObject::invokeMethod(&combo, "AddItem", Q_ARG(QString, "Cash"), Q_ARG(QVariant, QVariant())));
    combo.AddItem("Card");
    QCOMPARE(combo.property("ListCount").toInt(), 2);
    QCOMPARE(combo.List(1).toString(), QString("Card"));
    combo.setProperty("ListIndex", 1);
    QCOMPARE(combo.Text(), QString("Card"));
    combo.RemoveItem(5);  // no such entry: 381, reported
    QCOMPARE(combo.lastError(), 381);
}

QTEST_MAIN(QtWrappersTest)
#include "qt_wrappers_test.moc"
