#include "keltext/minihost/property_store.h"

#include <gtest/gtest.h>

namespace kel::mini {
namespace {

TEST(PropertyStore, EqualityAcrossKinds) {
    struct Case {
        Variant a, b;
        bool equal;
    };
    const Case cases[] = {
        {int16_t{5}, int32_t{5}, true}, {int16_t{5}, 5.0, true},     {uint8_t{0}, false, true},
        {int16_t{-1}, true, true},      {int32_t{1}, true, false},   {Variant(), int16_t{0}, true},
        {Variant(), false, true},       {Variant(), "", true},       {Variant(), "0", false},
        {"abc", "abc", true},           {"abc", "ABC", false},       {"5", int16_t{5}, false},
        {0.5f, 0.5, true},              {0.1f, 0.1, false},  // a single is not the double nearest 0.1
        {Date{10}, Date{10}, true},     {Date{10}, int32_t{10}, false},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(testing::Message() << kind_name(c.a.kind()) << " vs " << kind_name(c.b.kind()));
        EXPECT_EQ(stored_equal(c.a, c.b), c.equal);
        EXPECT_EQ(stored_equal(c.b, c.a), c.equal);
    }
}

TEST(PropertyStore, KeepsOnlyWhatDiffersInWriteOrder) {
    PropertyStore s;
    s.write("MaxLength", int16_t{0}, int16_t{0});
    s.write("TextType", int16_t{2}, int32_t{0});
    s.write("Enabled", true, true);
    s.write("Forecolor", int32_t{0xC00000}, int32_t{0});
    s.write("Text", "", Variant());
    s.write("Caption", "x", "");
    ASSERT_EQ(s.values().size(), 3u);
    EXPECT_EQ(s.values()[0].first, "TextType");
    EXPECT_EQ(s.values()[0].second, Variant(int16_t{2}));
    EXPECT_EQ(s.values()[1].first, "Forecolor");
    EXPECT_EQ(s.values()[2].first, "Caption");

    // Rewriting keeps the place; writing the default again takes the value out.
    s.write("FORECOLOR", int32_t{1}, int32_t{0});
    EXPECT_EQ(s.values()[1].first, "Forecolor");
    EXPECT_EQ(s.values()[1].second, Variant(int32_t{1}));
    s.write("texttype", int16_t{0}, int16_t{0});
    ASSERT_EQ(s.values().size(), 2u);
    EXPECT_EQ(s.values()[0].first, "Forecolor");
    // The values after the one taken out are still found, and rewritten in their place.
    s.write("caption", "y", "");
    EXPECT_EQ(s.read("Caption", ""), Variant("y"));
    ASSERT_EQ(s.values().size(), 2u);
    EXPECT_EQ(s.values()[1].second, Variant("y"));
}

TEST(PropertyStore, ReadsWithoutRegardToCaseAndGivesDefaults) {
    PropertyStore s({{"ForeColor", int32_t{7}}, {"Showcalendar", true}});
    EXPECT_EQ(s.read("Forecolor", int32_t{0}), Variant(int32_t{7}));
    EXPECT_EQ(s.read("SHOWCALENDAR", false), Variant(true));
    EXPECT_EQ(s.read("Missing", int16_t{3}), Variant(int16_t{3}));
    EXPECT_EQ(s.read("Missing", Variant()), Variant());
}

TEST(PropertyStore, FontsAreAlwaysStoredAndNeverShared) {
    auto font = std::make_shared<Font>("Fixedsys", 9);
    PropertyStore s;
    s.write("Font", Variant(font), Variant(default_font()));
    ASSERT_EQ(s.values().size(), 1u);
    font->size = 20;  // the control changes its live font later
    auto stored = font_of(s.values()[0].second);
    ASSERT_TRUE(stored);
    EXPECT_EQ(stored->size, 9);
    auto read = font_of(s.read("font", Variant()));
    ASSERT_TRUE(read);
    read->name = "Arial";
    EXPECT_EQ(font_of(s.read("Font", Variant()))->name, "Fixedsys");
}

TEST(PropertyStore, LoadedDuplicateKeysKeepTheLast) {
    PropertyStore s({{"Text", "a"}, {"TEXT", "b"}});
    ASSERT_EQ(s.values().size(), 1u);
    EXPECT_EQ(s.read("text", ""), Variant("b"));
}

}  // namespace
}  // namespace kel::mini
