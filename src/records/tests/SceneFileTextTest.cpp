#include <gtest/gtest.h>

#include <fstream>
#include <string>

#include <malloc.h>
#include <sys/resource.h>

#include "records/SceneFileText.h"
#include "records/tests/SampleTable.h"
#include "records/tests/SceneFileFixture.h"

using namespace scenefile;

namespace
{

const bool told = TellSampleTable();

std::string Repeat(const std::string& text, int count)
{
    std::string result;
    result.reserve(text.size() * static_cast<std::size_t>(count));
    for (int i = 0; i < count; ++i)
        result += text;
    return result;
}

std::string Chain(int count)
{
    std::string chain;
    for (int i = 0; i < count; ++i)
        chain += Object(6, "s" + std::to_string(i), "s", Attribute("parent_object_id", "S" + std::to_string(i + 1)));
    return chain;
}

std::string Utf16(const std::string& text)
{
    std::string wide = "\xFF\xFE";
    for (const char c : text)
        (wide += c) += '\0';
    return wide;
}

struct Refusal
{
    const char* what;
    std::string text;
    const char* error; ///< a part of it
};

TEST(SceneFileText, BadFilesAreRefusedWithLineAndReason)
{
    const std::string body = Object(7, "a", "A");
    const std::string whole = Scene(body);
    const Refusal refusals[] = {
        {"nothing", "", "line 1: "},
        {"no markup", "Scene of today\n", "line 2: No document element"},
        {"cut off in an element", whole.substr(0, whole.size() / 2), "line "},
        {"cut off between elements", whole.substr(0, whole.find("</vtattr:Scene>")), "line "},
        {"cut off in a tag", Scene("").substr(0, 60), "line 2: the text ends within a tag"},
        {"another root", "<html/>", "line 1: element <html> is not expected here"},
        {"a record as the root", body, "<vtattr:Object> is not expected here"},
        {"a second root", whole + Scene("").substr(39), "<vtattr:Scene> is not expected here"},
        {"another version", "<vtattr:Scene version=\"2\"/>", "line 1: the version \"2\" of the scene is not known"},
        {"no version", "<vtattr:Scene/>", "the version \"\""},
        {"an attribute out of place", Scene(Attribute("name", "A")), "line 3: element <vtattr:Attribute> is not"},
        {"an element out of place", Scene(body + "  <vtattr:Light/>\n"), "line 8: element <vtattr:Light> is not"},
        {"text out of place", Scene(body + "loose\n"), "text \""},
        {"no type", Scene("<vtattr:Object>" + Attribute("name", "A") + "</vtattr:Object>"),
         "line 3: the object has no type"},
        {"an empty record", Scene("<vtattr:Object type=\"7\"/>"), "line 3: the object has no attributes"},
        {"an endless value", Scene(Object(7, "a", std::string(17U << 20, 'x'))),
         "line 6: a value is larger than 16 MB"},
        {"a negative type", Scene("<vtattr:Object type=\"-1\"/>"), "line 3: \"-1\" is not a type"},
        {"a type beyond 32 bits", Scene("<vtattr:Object type=\"4294967296\"/>"), "is not a type"},
        {"two types", Scene("<vtattr:Object type=\"6\">" + Attribute("object_type", "7", "int") + "</vtattr:Object>"),
         "object_type is 7"},
        {"no number", Scene(Object(7, "a", "A", Attribute("visible", "yes", "int"))),
         "line 7: attribute \"visible\": \"yes\" is not an integer"},
        {"an infinite number", Scene(Object(7, "a", "A", Attribute("transparency", "inf", "float"))), "line 7: "},
        {"a short tuple", Scene(Object(7, "a", "A", Attribute("scale", "1 1", "floatTupel3"))),
         "line 7: attribute \"scale\": \"1 1\" holds 2 numbers, not 3"},
        {"a short matrix", Scene(Object(7, "a", "A", Attribute("last_transform_matrix", "1 0 0 0", "floatList"))),
         "line 7: attribute \"last_transform_matrix\": it holds 4 numbers, not 16"},
        {"a long layout", Scene(Object(1, "a", "A", Attribute("splitter_position", "1 0 0", "floatList"))),
         "it holds 3 numbers, not 2"},
        {"an unknown attribute type", Scene(Object(7, "a", "A", Attribute("x", "1", "double"))),
         "line 7: attribute \"x\": \"double\" is not a type"},
        {"one attribute twice", Scene(Object(7, "a", "A", Attribute("name", "B"))),
         "line 7: attribute \"name\" is there twice"},
        {"one id twice", Scene(Object(7, "id", "A") + Object(6, "ID", "B")),
         "line 8: a record of the id \"ID\" is there already, in line 3"},
        {"its own parent", Scene(Object(6, "a", "A", Attribute("parent_object_id", "A"))),
         "line 3: a static body is its own"},
        {"a circle of parents",
         Scene(Object(6, "a", "A", Attribute("parent_object_id", "b")) +
               Object(6, "b", "B", Attribute("parent_object_id", "a"))),
         "a static body is its own parent"},
        {"a thousand and two parents", Scene(Chain(1002)), "nested deeper than 1000 levels"},
        {"nesting", Scene(Repeat("<vtattr:Object>", 10000)), "nested too deeply"},
        {"nesting of a foreign element", Repeat("<a>", 10000), "element <a> is not expected here"},
        {"a document type", "<!DOCTYPE a [<!ENTITY b \"c\">]>" + whole, "line 1: a document type is not allowed"},
        {"a tag of many attributes", "<vtattr:Scene " + Repeat("a='' ", 10000) + "/>", "too many XML attributes"},
        {"UTF-16", Utf16(whole), "the text is UTF-16 or UTF-32, not UTF-8"},
        {"Latin-1 declared", "<?xml version=\"1.0\" encoding=\"ISO-8859-1\"?><vtattr:Scene version=\"1\"/>",
         "\"ISO-8859-1\" is not UTF-8"},
        {"Latin-1 undeclared",
         Scene(Object(7, "a",
                      "Stra\xDF"
                      "e")),
         "line 6: the text is not UTF-8"},
        {"an overlong form", Scene(Object(7, "a", "\xC0\x80")), "the text is not UTF-8"},
        {"a byte 0", Scene(Object(7, "a", std::string("A\0B", 3))), "line 6: there is a byte 0"},
    };
    for (const Refusal& refusal : refusals)
    {
        SCOPED_TRACE(refusal.what);
        const VtTSceneRecords read = ParseSceneText(refusal.text);
        EXPECT_TRUE(read.objects.empty());
        EXPECT_NE(read.error.find(refusal.error), std::string::npos) << read.error;
    }
}

TEST(SceneFileText, WritesTheSameBytesAgainWithWhateverItDoesNotKnow)
{
    const std::string text =
        Scene(Object(7, "b", "Last by name, first in the file", Attribute("transparency", "0.1", "float")) +
              Object(42, "unknown", "of a later version", Attribute("colour_of_money", "1 2 3", "intTupel3")) +
              "  <vtattr:Object type=\"8\">\n" + Attribute("object_type", "8", "int") + "  </vtattr:Object>\n" +
              Object(6, "a", "&lt;\xC3\xA4 &amp;&#13;\n\xF0\x9F\x9A\x97&gt; ",
                     Attribute("no &quot;tab&#9;", "  ") +
                         "    <vtattr:Attribute name=\"child_ids\" type=\"stringList\"><vtattr:value></vtattr:value>"
                         "<vtattr:value>p</vtattr:value></vtattr:Attribute>\n"));
    const VtTSceneRecords read = ParseSceneText(text);
    ASSERT_EQ(read.error, "");
    EXPECT_EQ(WriteSceneText(read.objects), text);
    EXPECT_EQ(WriteSceneText(ParseSceneText("\xEF\xBB\xBF" + text).objects), text);
}

TEST(SceneFileText, TheSchemaTakesWhatIsWrittenAndRefusesTheRest)
{
    const Folder folder;
    const std::string schema = std::string(PANORAMIC_SHARE) + "/scene.xsd";
    const auto takes = [&](const std::string& text)
    {
        folder.Write("scene.xml", text);
        return std::system(("xmllint --nonet --noout --schema '" + schema + "' '" +
                            (folder.path / "scene.xml").string() + "' 2>/dev/null")
                               .c_str()) == 0;
    };
    EXPECT_TRUE(takes(Scene(Object(7, "a", "A", Attribute("visible", "1", "int")) + Object(42, "b", "B"))));
    EXPECT_FALSE(takes(Scene(Object(7, "a", "A", Attribute("x", "1", "double")))));
    EXPECT_FALSE(takes(Scene(Object(7, "a", "A", Attribute("name", "B")))));
    EXPECT_FALSE(takes(Scene("<vtattr:Object/>")));
    EXPECT_FALSE(takes("<vtattr:Scene xmlns:vtattr=\"urn:panoramic:attributes\"/>"));

    std::ifstream example(std::string(PANORAMIC_DOCS) + "/scene-file.md");
    std::string document{std::istreambuf_iterator<char>(example), std::istreambuf_iterator<char>()};
    const std::size_t begin = document.find("<?xml");
    ASSERT_NE(begin, std::string::npos);
    const std::string shown = document.substr(begin, document.find("```", begin) - begin);
    EXPECT_TRUE(takes(shown));
    const VtTSceneRecords read = ParseSceneText(shown);
    EXPECT_EQ(read.error, "");
    EXPECT_TRUE(takes(WriteSceneText(read.objects)));
}

long PeakKilobytes()
{
    rusage usage{};
    getrusage(RUSAGE_SELF, &usage);
    return usage.ru_maxrss;
}

TEST(SceneFileText, AHundredMegabytesCostAFewTimesTheirSize)
{
    constexpr long megabyte = 1024; // kilobytes
    const std::string texts[] = {
        "<vtattr:Scene>" + Repeat("<a/>", 25 << 20),
        Scene(Object(7, "a", std::string(100U << 20, 'x'))),
        Scene(Repeat("<vtattr:Object type=\"7\"/>", 1 << 20)),
        Scene(Repeat(Object(7, "", "A"), 256 << 10)),
    };
    const long before = PeakKilobytes();
    for (const std::string& text : texts)
    {
        ParseSceneText(text);
        malloc_trim(0);
    }
    EXPECT_LT(PeakKilobytes() - before, 800 * megabyte);
}

} // namespace
