#include "app/tests/LoadFixture.h"
#include "base/Text.h"

using namespace scenefile;

namespace
{

/// With builders of views and layout that remember what they are given.
class SceneLoader : public testing::Test, protected LoadWorld
{
protected:
    SceneLoader()
    {
        builders.Register({objectTypeWindowLayout, phaseLayout, false,
                           [this](VtCSceneLoad&, const VtTRecordBuilder::Records& records)
                           { order += L"layout " + std::to_wstring(records.size()) + L' '; }});
        builders.Register({objectTypeView, phaseViews, false,
                           [this](VtCSceneLoad& load, const VtTRecordBuilder::Records& records)
                           {
                               for (const auto& record : records)
                               {
                                   load.Describe(TextOf(*record, L"name"));
                                   order += L"view of " + TextOf(*record, L"observer") + L' ';
                                   load.Step();
                               }
                           }});
    }

    /// The ids of the bodies of the simulation, in their order.
    std::wstring Ids() const
    {
        std::wstring ids;
        for (const VtC3DMovableBody* body : Movables().GetBodies())
            ids += body->GetInternalId() + L' ';
        return ids;
    }

    /// Those that were made of records.
    std::size_t MadeObservers() const { return observers->GetObservers().size() - 2; }

    std::wstring order; ///< of building
};

TEST_F(SceneLoader, RecordsFindWhatTheyReferToWhateverTheirOrder)
{
    document.models.textureFiles = {L"paint.png"};
    ASSERT_TRUE(Load(Object(3, "v", "Left", Attribute("observer", "eye o")) + ObserverRecord("o", "name of CAR") +
                     BodyRecord(6, "house") + BodyRecord(6, "door", Attribute("parent_object_id", "HOUSE")) +
                     Object(1, "w", "Window_Layout", Attribute("splitter_position", "0.3 0.7", "floatList")) +
                     BodyRecord(7, "car", Attribute("position", "1 2 3", "floatTupel3")) +
                     Object(9, "FREE1", "Free1", Attribute("behaviour", "3", "int")) +
                     Object(9, "anything", "Free2", Attribute("behaviour", "4", "int"))));

    EXPECT_EQ(Ids(), L"car ");
    const auto* house = scene->GetObjects().FindById(L"house");
    ASSERT_TRUE(house);
    EXPECT_EQ(scene->GetObjects().FindById(L"door")->GetParent(), house);
    ASSERT_EQ(MadeObservers(), 1U);
    EXPECT_EQ(observers->FindObserverByName(L"eye o")->GetConnectedBody(), Movables().GetBodies()[0]);
    EXPECT_EQ(order, L"view of eye o layout 1 ");
    EXPECT_EQ(observers->GetFree1()->GetFollowMode(), 3);
    EXPECT_EQ(observers->GetFree2()->GetFollowMode(), 4);
    EXPECT_FALSE(document.store.GetObject(L"anything"));

    const auto& steps = document.progress.activities;
    EXPECT_EQ(steps.at(51).count, 8);
    EXPECT_EQ(steps.at(51).steps, 5) << "three bodies, the observer, the view";
    EXPECT_EQ(steps.at(51).text, L"");
    EXPECT_EQ(steps.at(50).text, L"Building object Left");
    EXPECT_EQ(steps.at(40).steps, 1);
    EXPECT_EQ(document.models.emptied, 1);
    EXPECT_EQ(document.models.preloads.size(), 2U) << "one file, for movable and for static bodies";
    EXPECT_EQ(scene->GetTextureFiles(), std::vector<std::wstring>{L"paint.png"});
    EXPECT_TRUE(document.messages.shown.empty());
}

struct Sorting
{
    const char* what;
    std::string record;
    std::wstring movables; ///< that are built
    std::size_t observers;
    long steps;
};

TEST_F(SceneLoader, RecordsOfNobodyAreKeptAndBuildNothing)
{
    const Sorting sortings[] = {
        {"an ordinary body", BodyRecord(7, "t-1", Attribute("track_id", "-1", "int")), L"t-1 ", 0, 1},
        {"a clone of a track", BodyRecord(7, "t3", Attribute("track_id", "3", "int")), L"", 0, 0},
        {"a group", BodyRecord(7, "g", Attribute("is_grouped", "1", "int")), L"", 0, 0},
        {"no group", BodyRecord(7, "g0", Attribute("is_grouped", "0", "int")), L"g0 ", 0, 1},
        {"an observer", ObserverRecord("o1", "Not connected", Attribute("cloned", "0", "int")), L"", 1, 1},
        {"a copy of an observer", ObserverRecord("o2", "x", Attribute("cloned", "1", "int")), L"", 0, 0},
        {"a default one among the observers", ObserverRecord("FREE1", "x"), L"", 0, 1},
        {"atmospherics", Object(0, "a", "A", Attribute("fog_color", "1 2 3", "intTupel3")), L"", 0, 0},
        {"an instrument", Object(4, "i", "I", Attribute("signal_name", "")), L"", 0, 0},
        {"a track", Object(8, "t", "T", Attribute("mdf_file", "run.mdf")), L"", 0, 0},
        {"an unknown type", Object(77, "u", "U", Attribute("what", "else")), L"", 0, 0},
    };
    for (const Sorting& sorting : sortings)
    {
        SCOPED_TRACE(sorting.what);
        Movables().RemoveAllBodies();
        observers->RemoveNonFreeObservers();
        document.messages.shown.clear();
        document.progress.CleanUp();

        ASSERT_TRUE(Load(sorting.record));
        EXPECT_EQ(Ids(), sorting.movables);
        EXPECT_EQ(MadeObservers(), sorting.observers);
        EXPECT_EQ(document.progress.activities[51].steps, sorting.steps);
        EXPECT_EQ(document.messages.Has(host::Severity::warning, 509),
                  sorting.record.find("\"77\"") != std::string::npos);
        const std::size_t id = sorting.record.find("internal_id");
        EXPECT_NE(Saved().find(sorting.record.substr(id, 80)), std::string::npos);
    }
    EXPECT_TRUE(Load(sortings[10].record));
    EXPECT_EQ(document.messages.shown.back().first, folder.Inner("scene.xml"));
}

// What this version doesn't know is a later version's, or somebody's own: it comes back where it stood, as it was.
TEST_F(SceneLoader, UnknownRecordsAndAttributesAreWrittenAgainAtTheirPlace)
{
    const std::string unknown[] = {
        Object(55, "zebra", "U", Attribute("z", "1", "int") + Attribute("a", "2 3", "floatList")),
        Object(8, "track", "T", Attribute("mdf_file", "run.mdf") + Attribute("later", "x")),
        "  <vtattr:Object type=\"77\">\n" + Attribute("object_type", "77", "int") + Attribute("x", "y") +
            "  </vtattr:Object>\n", // of no id
        Object(4, "apple", "I", Attribute("signal_name", "speed")),
    };
    ASSERT_TRUE(Load(
        unknown[0] + BodyRecord(7, "car", Attribute("later_attribute", "kept")) + unknown[1] + BodyRecord(6, "house") +
        unknown[2] + ObserverRecord("o", "name of car") +
        Object(2, "any", "Settings", Attribute("global_render_mode", "3", "int") + Attribute("later", "kept too")) +
        unknown[3]));
    const std::string saved = Saved();
    std::size_t at = 0;
    for (const std::string& next :
         {unknown[0], std::string(">car<"), std::string("later_attribute"), unknown[1], std::string(">house<"),
          unknown[2], std::string(">o<"), std::string("kept too"), unknown[3]})
    {
        const std::size_t found = saved.find(next, at);
        ASSERT_NE(found, std::string::npos) << next;
        at = found;
    }

    LoadWorld other;
    other.document.paths = document.paths;
    ASSERT_TRUE(other.Loader().Load(folder.Inner("saved.xml"))) << base::Utf8(other.scene->GetFileError());
    EXPECT_EQ(other.scene->GetGlobalRenderMode(), VtERenderMode::WireFrame);
    EXPECT_EQ(other.Saved(), saved);
}

struct Settings
{
    std::string records;
    VtERenderMode mode;
};

TEST_F(SceneLoader, TheLastRenderSettingsCount)
{
    const auto settings = [](const char* id, const char* mode)
    { return Object(2, id, "S", Attribute("global_render_mode", mode, "int")); };
    const Settings cases[] = {
        {settings("a", "2"), VtERenderMode::Flat},
        {settings("a", "2") + settings("render_settings", "0"), VtERenderMode::Gouraud},
        {"", VtERenderMode::Mixed},
        {settings("a", "6"), VtERenderMode::Mixed},
    };
    for (const Settings& one : cases)
    {
        ASSERT_TRUE(Load(one.records));
        EXPECT_EQ(scene->GetGlobalRenderMode(), one.mode);
        EXPECT_EQ(document.store.GetObject(L"RenderSettings"), scene->GetRenderSettings());
        EXPECT_FALSE(document.store.GetObject(L"render_settings"));
    }
}

struct Model
{
    const char* stored;
    const char* file; ///< below the test's folder; null when there is none
};

TEST_F(SceneLoader, ModelsAreFoundInAndBesideTheLibraries)
{
    folder.Write("elsewhere/boat.dae", "a model");
    const std::string whole = base::Utf8(folder.Inner("elsewhere/boat.dae"));
    const std::string token = "%Vantor_Objects%";
    const std::string inToken = token + whole;
    const Model models[] = {
        {"%Vantor_Objects%\\Cars\\$Sedan\\Sedan.dae", "objects/advanced/Cars/$Sedan/Sedan.dae"},
        {whole.c_str(), "elsewhere/boat.dae"},
        {inToken.c_str(), "elsewhere/boat.dae"},
        {"elsewhere\\boat.dae", "elsewhere/boat.dae"},
        {"%Vantor_Objects%\\elsewhere\\boat.dae", "elsewhere/boat.dae"},
        {"%Vantor_Objects%\\Cars\\$Ghost\\Ghost.dae", nullptr},
        {"", nullptr},
    };
    for (const Model& model : models)
    {
        SCOPED_TRACE(model.stored);
        Movables().RemoveAllBodies();
        document.messages.shown.clear();
        ASSERT_TRUE(Load(BodyRecord(7, "b", {}, model.stored)));
        ASSERT_EQ(Ids(), L"b ");
        const VtC3DMovableBody& body = *Movables().GetBodies()[0];
        EXPECT_EQ(document.messages.Has(host::Severity::error, 528), model.file == nullptr);
        if (model.file)
            EXPECT_EQ(body.GetFilePath(), folder.Inner(model.file));
        else
        {
            EXPECT_EQ(document.messages.shown.back().first, L"name of b");
            EXPECT_EQ(document.messages.shown.back().second, body.GetFilePath());
        }
    }
}

TEST_F(SceneLoader, AnIncompleteBodyEndsTheLoadAndWhatStandsStays)
{
    const auto without = [](std::string record, const std::string& attribute)
    {
        const std::size_t at = record.find("    <vtattr:Attribute name=\"" + attribute + '"');
        return record.erase(at, record.find('\n', at) + 1 - at);
    };
    for (const int type : {6, 7})
        for (const char* attribute : {"name", "file_path", "internal_id"})
        {
            Movables().RemoveAllBodies();
            try
            {
                Load(BodyRecord(7, "first") + without(BodyRecord(type, "broken"), attribute) +
                     ObserverRecord("o", "x"));
                ADD_FAILURE() << attribute;
            }
            catch (const VtCAttributeError& error)
            {
                const std::string text = error.what();
                EXPECT_NE(text.find("scene.xml"), std::string::npos) << text;
                EXPECT_NE(text.find(std::string("has no ") + attribute), std::string::npos) << text;
            }
            EXPECT_EQ(Ids(), L"first ");
            EXPECT_EQ(MadeObservers(), 0U);
        }
}

TEST_F(SceneLoader, AFileThatCannotBeReadLeavesTheSceneAsItWas)
{
    ASSERT_TRUE(Load(BodyRecord(7, "car")));
    const std::string before = Saved();
    EXPECT_FALSE(Loader().Load(folder.Inner("none.xml")));
    EXPECT_NE(scene->GetFileError().find(L"none.xml: No such file"), std::wstring::npos);
    EXPECT_FALSE(Loader().Load(base::InnerPath(folder.path)));
    EXPECT_FALSE(Load(BodyRecord(7, "a") + BodyRecord(7, "A")));
    EXPECT_NE(scene->GetFileError().find(L"scene.xml, line 9: "), std::wstring::npos);
    EXPECT_EQ(Ids(), L"car ");
    EXPECT_EQ(Saved(), before);
}

TEST_F(SceneLoader, ReloadingTakesBodiesFromOneFileAndTheRestFromAnother)
{
    const std::wstring bodies =
        folder.Write("bodies.xml", Scene(BodyRecord(7, "car", Attribute("track_id", "4", "int")) +
                                         BodyRecord(6, "house") + ObserverRecord("not taken", "x")));
    const std::wstring rest =
        folder.Write("rest.xml", Scene(BodyRecord(7, "old car") + BodyRecord(6, "house") + ObserverRecord("o", "gone") +
                                       Object(1, "w", "Window_Layout") + Object(8, "t", "T")));
    Loader().LoadBodies(bodies);
    Loader().LoadObjects(rest);
    EXPECT_EQ(Ids(), L"car ");
    EXPECT_EQ(MadeObservers(), 1U);
    EXPECT_EQ(order, L"layout 1 ") << "once, with the rest";
    EXPECT_FALSE(document.store.GetObject(L"old car"));
    EXPECT_FALSE(document.store.GetObject(L"not taken"));
    EXPECT_TRUE(document.store.GetObject(L"t"));
    EXPECT_EQ(document.store.GetObject(L"house"),
              static_cast<VtC3DStaticBody*>(scene->GetStaticBodies()->FindById(L"house"))->GetAttributeObject());

    const VtC3DObserver& eye = *observers->FindObserverByName(L"eye o");
    observers->ResolveTargets();
    EXPECT_FALSE(eye.GetConnectedBody()) << "the user has declined";
    document.questions.chosen = 0;
    observers->ResolveTargets();
    ASSERT_EQ(document.questions.replacements.size(), 2U);
    EXPECT_EQ(document.questions.replacements[1].missing, L"gone");
    EXPECT_EQ(document.questions.replacements[1].observers, std::vector<std::wstring>{L"eye o"});
    EXPECT_EQ(document.questions.replacements[1].candidates, std::vector<std::wstring>{L"name of car"});
    EXPECT_EQ(eye.GetConnectedBody(), Movables().GetBodies()[0]);
}

} // namespace
