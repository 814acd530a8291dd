// Records: the values of a filled-in form as JSON, and loading them into a form again.
#include "apps/kelform/record.h"

#include <gtest/gtest.h>

#include "apps/kelform/demo_form.h"
#include "apps/kelform/form_file.h"
#include "keltext/library/catalogue.h"

namespace kel::kelform {
namespace {

class RecordTest : public ::testing::Test {
protected:
    // The demo voucher as `kelform` opens it, on a fixed day.
    void open(mini::Form& form) {
        const SavedForm saved = parse_form(demo_form_text(), "voucher.kform", catalogue.classes());
        open_form(form, saved, catalogue.classes(), "voucher.kform", make_date(2026, 12, 6).value());
    }
    std::string error_of(std::string_view json) {
        mini::Form form;
        open(form);
        try {
            load_record(form, json, "r.json");
        } catch (const RecordError& e) {
            return e.what();
        }
        return "";
    }
    Catalogue catalogue;
};

TEST_F(RecordTest, WhatIsSavedComesBackWhole) {
    mini::Form form;
    open(form);
    // As opened: the date is today, everything else blank, and blank is null, not 0.
    EXPECT_EQ(record_json(form),
              "{\n  \"Payee\": null,\n  \"PAN\": null,\n  \"Amount\": null,\n  \"VoucherDate\": \"06/12/2026\",\n"
              "  \"PayMode\": null,\n  \"ChequeNo\": null,\n  \"Period\": null\n}");
    const std::string filled =
        "{\n  \"Payee\": \"Ren\u00e9e D'Souza\",\n  \"PAN\": \"ABCDE1234F\",\n  \"Amount\": 1234567.5,\n"
        "  \"VoucherDate\": \"05/08/2026\",\n  \"PayMode\": \"UPI\",\n  \"ChequeNo\": \"123456\",\n"
        "  \"Period\": \"06/26 \"\n}";
    load_record(form, filled, "r.json");
    EXPECT_EQ(record_json(form), filled);
    EXPECT_EQ(form.find("Amount")->keyboard_part()->peek("Text"), Variant("12,34,567.50"));  // as after typing
    EXPECT_EQ(form.find("PayMode")->dispatch().get("ListIndex"), Variant(int16_t{3}));

    // Whole amounts are written without a point; a date in another spelling is the same date.
    mini::Form other;
    open(other);
    load_record(other, R"({"Amount": 2500, "VoucherDate": "5/8/2026", "Payee": null})", "r.json");
    const std::string json = record_json(other);
    EXPECT_NE(json.find("\"Amount\": 2500,"), std::string::npos) << json;
    EXPECT_NE(json.find("\"VoucherDate\": \"05/08/2026\""), std::string::npos) << json;
    EXPECT_NE(json.find("\"Payee\": null"), std::string::npos) << json;
}

TEST_F(RecordTest, BadRecordsNameTheFileAndTheControl) {
    const struct {
        const char* json;
        const char* message;
    } cases[] = {
        {"{\"Payee\": \"A\",", "r.json: parse error at line 1, column 15: syntax error while parsing object key - "
                               "unexpected end of input; expected string literal"},
        {"[1, 2]", "r.json: a record is a JSON object, one member per control"},
        {R"({"Payee": "A", "payee": "B"})", "r.json: payee: given twice"},
        {R"({"Nobody": "x"})", "r.json: Nobody: the form has no such control"},
        {R"({"Amount": "2500"})", "r.json: Amount: \"2500\" is not a number"},
        {R"({"Payee": 7})", "r.json: Payee: 7 is not a text"},
        {R"({"Amount": 99999999})", "r.json: Amount: 99999999 is not kept: the control holds 5000000"},
        {R"({"VoucherDate": "01/01/2020"})",
         "r.json: VoucherDate: \"01/01/2020\" is not kept: the control holds \"01/04/2026\""},
        {R"({"VoucherDate": "someday"})", "r.json: VoucherDate: \"someday\" is not kept: the control holds \"06/12/2026\""},
        {R"({"ChequeNo": "12"})", "r.json: ChequeNo: \"12\" is not kept: the control holds \"100000\""},
        {R"({"ChequeNo": "12ab34"})", "r.json: ChequeNo: \"12ab34\" is not kept: the control holds \"100000\""},
        {R"({"Payee": "日本"})", "r.json: Payee: \"日本\" holds characters that Windows-1252 cannot hold"},
    };
    for (const auto& c : cases) EXPECT_EQ(error_of(c.json), c.message) << c.json;
}

}  // namespace
}  // namespace kel::kelform
