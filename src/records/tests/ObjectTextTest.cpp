#include <gtest/gtest.h>

#include <string>

#include "records/ObjectText.h"
#include "records/RecordTables.h"
#include "records/tests/SampleTable.h"

namespace
{

const bool told = TellSampleTable();

std::wstring Object(const std::wstring& content, const std::wstring& type = L" type=\"6\"")
{
    return L"<vtattr:Object xmlns:vtattr=\"urn:panoramic:attributes\"" + type + L">" + content + L"</vtattr:Object>";
}

std::wstring Attribute(const std::wstring& head, const std::wstring& value)
{
    return L"<vtattr:Attribute " + head + L"><vtattr:value>" + value + L"</vtattr:value></vtattr:Attribute>";
}

// The value as text of the one attribute `name`, or the error.
std::wstring ValueOf(const std::wstring& text, const std::wstring& name)
{
    const VtTParsedObject parsed = ParseObjectText(text);
    if (!parsed.object)
        return L"error " + parsed.error;
    const VtISceneAttribute* attribute = parsed.object->GetAttribute(name);
    return attribute ? attribute->GetTypeName() + L"=" + attribute->GetValueText() : L"missing";
}

struct Reading
{
    const char* what;
    std::wstring text;
    const wchar_t* name;
    const wchar_t* value;
};

TEST(ObjectText, ReadsWhatModelDescriptionsAndScenesHold)
{
    const Reading readings[] = {
        {"a road texture", Object(Attribute(L"name=\"basetexture\" type=\"string\"", L"uniform,sampler2D,0")),
         L"basetexture", L"string=uniform,sampler2D,0"},
        {"a known name without a type", Object(Attribute(L"name=\"position\"", L"1 -2.5 3e1")), L"position",
         L"floatTupel3=1 -2.5 30"},
        {"an unknown name without a type", Object(Attribute(L"name=\"recalc_normals\"", L"45")), L"recalc_normals",
         L"string=45"},
        {"a part's attribute", Object(Attribute(L"name=\"p1_scale_orient\"", L"0 0 1")), L"p1_scale_orient",
         L"floatTupel3=0 0 1"},
        {"a part's channel", Object(Attribute(L"name=\"p1_simulation_data_stream\"", L"7")),
         L"p1_simulation_data_stream", L"int=7"},
        {"attributes without a root", Attribute(L"name=\"dye_color\"", L"1 2 255") + Attribute(L"name=\"name\"", L"A"),
         L"dye_color", L"intTupel3=1 2 255"},
        {"blanks of a text", Object(Attribute(L"name=\"name\"", L"  two  ")), L"name", L"string=  two  "},
        {"a text of blanks", Object(Attribute(L"name=\"name\"", L" ")), L"name", L"string= "},
        {"no text", Object(Attribute(L"name=\"name\"", L"")), L"name", L"string="},
        {"entities", Object(Attribute(L"name=\"name\"", L"&lt;&#228;&amp;&gt;")), L"name", L"string=<\u00e4&>"},
        {"CDATA and comments", Object(Attribute(L"name=\"name\"", L"a<!-- no --><![CDATA[<b>]]>")), L"name",
         L"string=a<b>"},
        {"an unknown entity stays text", Object(Attribute(L"name=\"name\"", L"&bomb;")), L"name", L"string=&bomb;"},
        {"a list of texts",
         Object(L"<vtattr:Attribute name=\"child_ids\"><vtattr:value>a b</vtattr:value><vtattr:value/>"
                L"</vtattr:Attribute>"),
         L"child_ids", L"stringList=a b\n"},
        {"an empty list", Object(L"<vtattr:Attribute name=\"child_ids\"/>"), L"child_ids", L"stringList="},
        {"the type of the object", Object(L"", L" type=\"7\""), L"object_type", L"int=7"},
        {"its default", Object(L"", L""), L"object_type", L"int=6"},
        {"its attribute", Object(Attribute(L"name=\"object_type\"", L"7"), L""), L"object_type", L"int=7"},
    };
    for (const Reading& reading : readings)
    {
        SCOPED_TRACE(reading.what);
        EXPECT_EQ(ValueOf(reading.text, reading.name), reading.value);
    }
}

struct Refusal
{
    std::wstring text;
    const wchar_t* reason; ///< a part of the error
};

TEST(ObjectText, TellsWhatIsWrongAndWhere)
{
    std::wstring nested;
    for (int i = 0; i < 10000; ++i)
        nested += L"<vtattr:Object>";
    const Refusal refusals[] = {
        {L"", L"line 1"},
        {L"no markup", L"line 1"},
        {L"<!-- nothing -->", L"line 1"},
        {Object(L"\n\n<vtattr:Attribute name=\"a\">"), L"line 3"},
        {Object(L"\n" + Attribute(L"type=\"int\"", L"1")), L"line 2: an attribute has no name"},
        {Object(Attribute(L"name=\"x\" type=\"vector\"", L"1")), L"\"vector\" is not a type"},
        {Object(Attribute(L"name=\"position\" type=\"string\"", L"1 2 3")), L"floatTupel3, not string"},
        {Object(Attribute(L"name=\"position\"", L"1 2")), L"holds 2 numbers, not 3"},
        {Object(Attribute(L"name=\"position\"", L"1 2 nan")), L"\"nan\" is not a number"},
        {Object(Attribute(L"name=\"scale\"", L"1 1 1e99")), L"\"1e99\" is not a number"},
        {Object(Attribute(L"name=\"visible\"", L"2147483648")), L"does not fit into 32 bits"},
        {Object(Attribute(L"name=\"visible\"", L"0,5")), L"\"0,5\" is not an integer"},
        {Object(Attribute(L"name=\"visible\"", L"")), L"is not an integer"},
        {Object(L"<vtattr:Attribute name=\"visible\"/>"), L"it has 0 values, not 1"},
        {Object(Attribute(L"name=\"a\"", L"1") + Attribute(L"name=\"a\"", L"2")), L"\"a\" is there twice"},
        {Object(L"<vtattr:Atribute/>"), L"<vtattr:Atribute> is not expected"},
        {Object(L"loose"), L"\"loose\" is not expected"},
        {Object(L"") + Object(L""), L"<vtattr:Object> is not expected"},
        {Object(Attribute(L"name=\"object_type\"", L"7")), L"object_type is 7"},
        {Object(L"", L" type=\"-1\""), L"not a type of objects"},
        {L"<!DOCTYPE x [<!ENTITY a \"aaaa\"><!ENTITY b \"&a;&a;\">]>" + Object(L""), L"document type"},
        {nested, L"line 1"},
    };
    for (const Refusal& refusal : refusals)
    {
        const VtTParsedObject parsed = ParseObjectText(refusal.text);
        EXPECT_FALSE(parsed.object);
        EXPECT_NE(parsed.error.find(refusal.reason), std::wstring::npos)
            << "error: " << std::string(parsed.error.begin(), parsed.error.end()) << " for "
            << std::string(refusal.text.begin(),
                           refusal.text.begin() + static_cast<long>(std::min<std::size_t>(refusal.text.size(), 100)));
    }
}

TEST(ObjectText, KeepsEveryTypeOverWritingAndReading)
{
    const osg::ref_ptr<VtISceneObject> object = new VtISceneObject(4);
    object->AddAttribute(L"object_type", 4);
    object->AddAttribute(L"smallest", std::int32_t{-2147483647 - 1});
    object->AddAttribute(L"third", 1.0F / 3.0F);
    object->AddAttribute(L"t\u00e4xt <&\"'>", std::wstring(L"\u00e4\U0001F697 <&> \"\t\n'"));
    object->AddAttribute(L"tuple", VtTFloatTupel3{1e-30F, -0.1F, 3e38F});
    object->AddAttribute(L"colour", VtTIntTupel3{-1, 0, 255});
    object->AddAttribute(L"none", std::vector<float>());
    object->AddAttribute(L"texts", std::vector<std::wstring>{L"", L"line\nbreak", L" "});

    const VtTParsedObject parsed = ParseObjectText(WriteObjectText(*object));
    ASSERT_TRUE(parsed.object);
    EXPECT_EQ(parsed.object->GetObjectType(), 4);
    ASSERT_EQ(parsed.object->GetAttributes().size(), object->GetAttributes().size());
    for (std::size_t i = 0; i < object->GetAttributes().size(); ++i)
    {
        EXPECT_EQ(parsed.object->GetAttributes()[i]->GetName(), object->GetAttributes()[i]->GetName());
        EXPECT_EQ(parsed.object->GetAttributes()[i]->GetValue(), object->GetAttributes()[i]->GetValue()) << i;
    }
}

TEST(ObjectText, ANewRecordHoldsTheDefaultsInTheOrderOfItsTable)
{
    const VtCSceneObjectStore store;
    EXPECT_EQ(store.GetDefaultText(objectTypeStaticBody).find(L"object_type") <
                  store.GetDefaultText(objectTypeStaticBody).find(L"dye_color"),
              true);
    EXPECT_EQ(ValueOf(store.GetDefaultText(objectTypeStaticBody), L"visible"), L"int=1");
    EXPECT_EQ(ValueOf(store.GetDefaultText(objectTypeStaticBody), L"child_ids"), L"missing") << "it is optional";
    EXPECT_EQ(store.GetDefaultText(objectTypeTrack), L"");
    EXPECT_EQ(store.GetDefaultText(77), L"");
}

} // namespace
