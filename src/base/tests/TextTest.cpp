#include <gtest/gtest.h>
#include <set>

#include "base/Ids.h"
#include "base/Numbers.h"
#include "base/Paths.h"
#include "base/Text.h"

TEST(Text, SurvivesTheWayToUtf8AndBack)
{
    const wchar_t* texts[] = {L"", L"Wagen", L"Stra\u00dfe", L"\u8eca\u4e21", L"\U0001F697 car"};
    for (const wchar_t* text : texts)
        EXPECT_EQ(base::Wide(base::Utf8(text)), text);
    EXPECT_EQ(base::Utf8(L"\u00fc\U0001F697"), "\xC3\xBC\xF0\x9F\x9A\x97");
}

TEST(Text, MarksMalformedBytesAndKeepsTheRest)
{
    struct Case
    {
        const char* name;
        std::string bytes;
        std::wstring text;
    };
    const Case cases[] = {
        {"lone continuation", "a\x80z", L"a\uFFFDz"},
        {"cut off sequence", "a\xE8\xBB", L"a\uFFFD\uFFFD"},
        {"overlong slash", "\xC0\xAF", L"\uFFFD\uFFFD"},
        {"surrogate", "\xED\xA0\x80", L"\uFFFD\uFFFD\uFFFD"},
        {"beyond Unicode", "\xF5\x80\x80\x80", L"\uFFFD\uFFFD\uFFFD\uFFFD"},
    };
    for (const Case& c : cases)
        EXPECT_EQ(base::Wide(c.bytes), c.text) << c.name;
}

TEST(Text, ComparesNamesWithoutCaseBeyondAscii)
{
    EXPECT_TRUE(base::EqualsNoCase(L"Fahrzeug \u00c4", L"FAHRZEUG \u00e4"));
    EXPECT_FALSE(base::EqualsNoCase(L"Car", L"Car2"));
    EXPECT_EQ(base::ToLower(L"\u00c9\u0416X"), L"\u00e9\u0436x");
}

TEST(Text, SplitKeepsEmptyFields)
{
    EXPECT_EQ(base::Split(L"a||b|", L'|'), (std::vector<std::wstring>{L"a", L"", L"b", L""}));
    EXPECT_TRUE(base::Split(L"", L'|').empty());
    EXPECT_EQ(base::Replace(L"aXbX", L"X", L"XX"), L"aXXbXX");
}

TEST(Numbers, ReadOnlyWhatIsWhollyANumber)
{
    EXPECT_EQ(base::ParseDouble(" +1.5e3\t"), 1500.0);
    EXPECT_EQ(base::ParseInteger("-7"), -7);
    EXPECT_EQ(base::ParseInteger("ff", 16), 255);
    EXPECT_EQ(base::ParseFloat(base::FormatFloat(0.1f)), 0.1f);
    for (const char* text : {"", "1,5", "1.5x", "nan", "inf", "+-1", "1 2", "1e999"})
        EXPECT_FALSE(base::ParseDouble(text)) << text;
}

TEST(Ids, AreFreshVersion4Uuids)
{
    std::set<std::wstring> seen;
    for (int i = 0; i < 1000; ++i)
    {
        const std::wstring id = base::NewId();
        ASSERT_EQ(id.size(), 36u);
        ASSERT_EQ(id.find_first_not_of(L"0123456789abcdef-"), std::wstring::npos);
        ASSERT_EQ(id[14], L'4');
        ASSERT_NE(std::wstring(L"89ab").find(id[19]), std::wstring::npos);
        ASSERT_TRUE(seen.insert(id).second);
    }
}

TEST(Paths, TurnAtTheBorderOnly)
{
    EXPECT_EQ(base::NativePath(L"\\lib\\$Car\\Stra\u00dfe.dae").native(), "/lib/$Car/Stra\xC3\x9F"
                                                                          "e.dae");
    EXPECT_EQ(base::InnerPath("/lib/$Car/Car.dae"), L"\\lib\\$Car\\Car.dae");
}
