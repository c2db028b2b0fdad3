#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "records/RecordTables.h"
#include "records/tests/SceneFileFixture.h"
#include "scene/SceneParts.h"
#include "scene/tests/SceneFixture.h"

using namespace scenefile;

namespace
{

/// An observer reduced to its record and the body that it found when it was loaded.
class Observer : public VtCGlidePanelAbstractNavigatorObject
{
public:
    Observer(VtISceneDocument& owner, const std::wstring& name, std::int32_t type, const std::wstring& id)
        : VtCGlidePanelAbstractNavigatorObject(owner, nullptr, name, true, id)
    {
        attributeObject = new VtISceneObject(type);
        WriteAttribute(L"object_type", type);
        WriteAttribute(L"internal_id", GetInternalId());
        PublishAttributes();
    }

    void OnAttributeChanged(const std::wstring& id, const std::wstring& name, const VtTAttributeValue& value) override
    {
        VtCGlidePanelAbstractNavigatorObject::OnAttributeChanged(id, name, value);
        if (name != L"attached_to")
            return;
        target = std::get<std::wstring>(value);
        body = GetDocument().GetScene()->FindMovableByName(target);
    }

    std::wstring target;
    VtC3DMovableBody* body = nullptr;
};

/// Observers and panes that remember what the loader gave them.
class Parts : public VtISceneObservers, public VtIObserverRecords, public VtISceneViews
{
public:
    explicit Parts(VtISceneDocument& owner) : document(owner)
    {
        for (const wchar_t* id : {L"Free1", L"Free2"})
            free.push_back(new Observer(document, id, objectTypeDefaultObserver, id));
    }
    ~Parts() override
    {
        for (auto* list : {&free, &made})
            for (Observer* observer : *list)
                observer->Release();
    }

    void UpdateObservers() override {}
    void ReleaseBody(VtC3DMovableBody&) override {}
    VtIObserverRecords* GetRecords() override { return this; }
    VtCGlidePanelAbstractNavigatorObject* GetDefaultObserver(int index) const override
    {
        return free[static_cast<std::size_t>(index)];
    }
    VtCGlidePanelAbstractNavigatorObject& MakeObserver(const std::wstring& name, const std::wstring& id) override
    {
        made.push_back(new Observer(document, name, objectTypeObserver, id));
        return *made.back();
    }
    std::vector<VtTMissingTarget> GetMissingTargets() const override
    {
        std::vector<VtTMissingTarget> missing;
        for (Observer* observer : made)
            if (!observer->body && observer->target != L"Not connected")
                missing.push_back({observer->target, {observer}});
        return missing;
    }
    void SetTarget(const VtTMissingTarget& missing, VtC3DMovableBody& body) override
    {
        static_cast<Observer*>(missing.observers.front())->body = &body;
    }

    void ApplyViewRecord(std::int32_t pane, VtISceneObject& record, const std::wstring&) override
    {
        views.emplace_back(pane, *record.Find<std::wstring>(L"observer"), made.size());
    }
    void ApplyLayoutRecord(const std::wstring& id) override { layout = id; }
    void ActivateObserver() override { activeAfterViews = static_cast<int>(views.size()); }

    VtISceneDocument& document;
    std::vector<Observer*> free;
    std::vector<Observer*> made;
    std::vector<std::tuple<std::int32_t, std::wstring, std::size_t>> views; ///< with the observers made before it
    std::wstring layout;
    int activeAfterViews = -1;
};

std::string Body(int type, const std::string& id, const std::string& more = {},
                 const std::string& file = "%Vantor_Objects%\\Cars\\$Sedan\\Sedan.dae")
{
    return Object(type, id, "name of " + id, Attribute("file_path", file) + more);
}

std::string ObserverRecord(const std::string& id, const std::string& target, const std::string& more = {})
{
    return Object(5, id, "eye " + id, Attribute("behaviour", "1", "int") + Attribute("attached_to", target) + more);
}

class SceneLoader : public SceneFixture
{
protected:
    SceneLoader()
    {
        document.paths.objects = folder.Inner("objects/advanced");
        document.paths.customer = folder.Inner("customer");
        folder.Write("objects/advanced/Cars/$Sedan/Sedan.dae", "a model");
        scene.SetObservers(&parts);
        scene.SetViews(&parts);
    }
    ~SceneLoader() override
    {
        scene.SetObservers(nullptr);
        scene.SetViews(nullptr);
    }

    bool Load(const std::string& objects)
    {
        return scene.LoadSceneFile(folder.Write("scene.xml", Scene(objects)), false);
    }

    /// The ids of the bodies of the simulation, in their order.
    std::wstring Movables() const
    {
        std::wstring ids;
        for (const VtC3DMovableBody* body : scene.GetMovableBodies(0)->GetBodies())
            ids += body->GetInternalId() + L' ';
        return ids;
    }

    std::string Saved()
    {
        EXPECT_TRUE(scene.SaveScene(folder.Inner("saved.xml"))) << base::Utf8(scene.GetFileError());
        return folder.Read("saved.xml");
    }

    const Folder folder;
    Parts parts{document};
};

TEST_F(SceneLoader, RecordsFindWhatTheyReferToWhateverTheirOrder)
{
    document.models.textureFiles = {L"paint.png"};
    ASSERT_TRUE(Load(Object(3, "v", "Left", Attribute("observer", "eye o") + Attribute("view_pos", "2", "int")) +
                     ObserverRecord("o", "name of CAR") + Body(6, "house") +
                     Body(6, "door", Attribute("parent_object_id", "HOUSE")) +
                     Object(1, "w", "Window_Layout", Attribute("splitter_position", "0.3 0.7", "floatList")) +
                     Body(7, "car", Attribute("position", "1 2 3", "floatTupel3")) +
                     Object(9, "Free1", "Free1", Attribute("behaviour", "3", "int")) +
                     Object(9, "anything", "Free2", Attribute("behaviour", "4", "int"))));

    EXPECT_EQ(Movables(), L"car ");
    const auto* house = scene.GetStaticBodies()->FindById(L"house");
    ASSERT_TRUE(house);
    EXPECT_EQ(scene.GetStaticBodies()->FindById(L"door")->GetParent(), house);
    ASSERT_EQ(parts.made.size(), 1U);
    EXPECT_EQ(parts.made[0]->body, scene.GetMovableBodies(0)->GetBodies()[0]);
    EXPECT_EQ(parts.views, (decltype(parts.views){{2, L"eye o", 1U}}));
    EXPECT_EQ(parts.activeAfterViews, 1);
    EXPECT_EQ(parts.layout, L"w");
    EXPECT_EQ(*parts.free[0]->GetAttributeObject()->Find<std::int32_t>(L"behaviour"), 3);
    EXPECT_EQ(*parts.free[1]->GetAttributeObject()->Find<std::int32_t>(L"behaviour"), 4);
    EXPECT_FALSE(document.store.GetObject(L"anything"));
    EXPECT_FALSE(scene.GetMovableBodies(0)->GetBodies()[0]->IsLoading());

    const auto& steps = document.progress.activities;
    EXPECT_EQ(steps.at(51).count, 8);
    EXPECT_EQ(steps.at(51).steps, 5) << "three bodies, the observer, the view";
    EXPECT_EQ(steps.at(51).text, L"");
    EXPECT_EQ(steps.at(50).text, L"Building object Left");
    EXPECT_EQ(steps.at(40).steps, 1);
    EXPECT_EQ(document.models.emptied, 1);
    EXPECT_EQ(document.models.preloads.size(), 2U) << "one file, for movable and for static bodies";
    EXPECT_EQ(scene.GetTextureFiles(), std::vector<std::wstring>{L"paint.png"});
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
        {"an ordinary body", Body(7, "t-1", Attribute("track_id", "-1", "int")), L"t-1 ", 0, 1},
        {"a clone of a track", Body(7, "t3", Attribute("track_id", "3", "int")), L"", 0, 0},
        {"a group", Body(7, "g", Attribute("is_grouped", "1", "int")), L"", 0, 0},
        {"no group", Body(7, "g0", Attribute("is_grouped", "0", "int")), L"g0 ", 0, 1},
        {"an observer", ObserverRecord("o1", "Not connected", Attribute("cloned", "0", "int")), L"", 1, 1},
        {"a copy of an observer", ObserverRecord("o2", "x", Attribute("cloned", "1", "int")), L"", 0, 0},
        {"a default one among the observers", ObserverRecord("Free1", "x"), L"", 0, 1},
        {"a pane that isn't there", Object(3, "v", "V", Attribute("observer", "") + Attribute("view_pos", "5", "int")),
         L"", 0, 1},
        {"atmospherics", Object(0, "a", "A", Attribute("fog_color", "1 2 3", "intTupel3")), L"", 0, 0},
        {"an instrument", Object(4, "i", "I", Attribute("signal_name", "")), L"", 0, 0},
        {"a track", Object(8, "t", "T", Attribute("mdf_file", "run.mdf")), L"", 0, 0},
        {"an unknown type", Object(77, "u", "U", Attribute("what", "else")), L"", 0, 0},
    };
    for (const Sorting& sorting : sortings)
    {
        SCOPED_TRACE(sorting.what);
        scene.GetMovableBodies(0)->RemoveAllBodies();
        for (Observer* observer : parts.made)
            observer->Release();
        parts.made.clear();
        document.messages.shown.clear();
        document.progress.CleanUp();

        ASSERT_TRUE(Load(sorting.record));
        EXPECT_EQ(Movables(), sorting.movables);
        EXPECT_EQ(parts.made.size(), sorting.observers);
        EXPECT_EQ(document.progress.activities[51].steps, sorting.steps);
        EXPECT_EQ(document.messages.Has(host::Severity::warning, 509),
                  sorting.record.find("\"77\"") != std::string::npos);
        const std::size_t id = sorting.record.find("internal_id");
        EXPECT_NE(Saved().find(sorting.record.substr(id, 80)), std::string::npos);
    }
    EXPECT_TRUE(Load(sortings[11].record));
    EXPECT_EQ(document.messages.shown.back().first, folder.Inner("scene.xml"));
}

TEST_F(SceneLoader, LoadingAndSavingAgainGivesTheSameBytes)
{
    const std::string objects =
        Body(7, "car", Attribute("later_attribute", "kept") + Attribute("transparency", "0.5", "float")) +
        Body(6, "house", Attribute("later_list", "1 2 3 4 5", "floatList")) + ObserverRecord("o", "name of car") +
        Object(2, "any", "Settings", Attribute("global_render_mode", "3", "int") + Attribute("later", "kept too")) +
        Object(55, "u", "U") + Body(7, "clone", Attribute("track_id", "2", "int")) + "  <vtattr:Object type=\"8\">\n" +
        Attribute("object_type", "8", "int") + "  </vtattr:Object>\n";
    ASSERT_TRUE(Load(objects));
    const std::string first = Saved();
    for (const char* kept : {"later_attribute", "later_list", "kept too", "type=\"55\"", "\"clone\"", "cloned_from"})
        EXPECT_EQ(first.find(kept) != std::string::npos,
                  std::string(kept) != "cloned_from" && std::string(kept) != "\"clone\"")
            << kept;
    EXPECT_NE(first.find(">clone<"), std::string::npos);

    for (int again = 0; again < 2; ++again)
    {
        fake::SceneDocument other;
        other.paths = document.paths;
        VtCScene3D otherScene(other);
        Parts otherParts(other);
        otherScene.SetObservers(&otherParts);
        ASSERT_TRUE(otherScene.LoadSceneFile(folder.Inner("saved.xml"), false))
            << base::Utf8(otherScene.GetFileError());
        EXPECT_EQ(otherScene.GetGlobalRenderMode(), VtERenderMode::WireFrame);
        ASSERT_TRUE(otherScene.SaveScene(folder.Inner("saved.xml")));
        EXPECT_EQ(folder.Read("saved.xml"), first);
        otherScene.SetObservers(nullptr);
    }
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
        EXPECT_EQ(scene.GetGlobalRenderMode(), one.mode);
        EXPECT_EQ(document.store.GetObject(L"RenderSettings"), scene.GetRenderSettings());
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
        scene.GetMovableBodies(0)->RemoveAllBodies();
        document.messages.shown.clear();
        ASSERT_TRUE(Load(Body(7, "b", {}, model.stored)));
        ASSERT_EQ(Movables(), L"b ");
        const VtC3DMovableBody& body = *scene.GetMovableBodies(0)->GetBodies()[0];
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
            scene.GetMovableBodies(0)->RemoveAllBodies();
            try
            {
                Load(Body(7, "first") + without(Body(type, "broken"), attribute) + ObserverRecord("o", "x"));
                ADD_FAILURE() << attribute;
            }
            catch (const VtCAttributeError& error)
            {
                const std::string text = error.what();
                EXPECT_NE(text.find("scene.xml"), std::string::npos) << text;
                EXPECT_NE(text.find(std::string("has no ") + attribute), std::string::npos) << text;
            }
            EXPECT_EQ(Movables(), L"first ");
            EXPECT_TRUE(parts.made.empty());
        }
}

TEST_F(SceneLoader, AFileThatCannotBeReadLeavesTheSceneAsItWas)
{
    ASSERT_TRUE(Load(Body(7, "car")));
    const std::string before = Saved();
    EXPECT_FALSE(scene.LoadSceneFile(folder.Inner("none.xml"), false));
    EXPECT_NE(scene.GetFileError().find(L"none.xml: No such file"), std::wstring::npos);
    EXPECT_FALSE(scene.LoadSceneFile(base::InnerPath(folder.path), false));
    EXPECT_FALSE(Load(Body(7, "a") + Body(7, "A")));
    EXPECT_NE(scene.GetFileError().find(L"scene.xml, line 9: "), std::wstring::npos);
    EXPECT_FALSE(scene.LoadSceneFile(folder.Inner("saved.xml"), true)) << "skip";
    EXPECT_EQ(Movables(), L"car ");
    EXPECT_EQ(Saved(), before);
}

TEST_F(SceneLoader, ReloadingTakesBodiesFromOneFileAndTheRestFromAnother)
{
    const std::wstring bodies = folder.Write("bodies.xml", Scene(Body(7, "car", Attribute("track_id", "4", "int")) +
                                                                 Body(6, "house") + ObserverRecord("not taken", "x")));
    const std::wstring rest =
        folder.Write("rest.xml", Scene(Body(7, "old car") + Body(6, "house") + ObserverRecord("o", "gone") +
                                       Object(1, "w", "Window_Layout") + Object(8, "t", "T")));
    scene.LoadBodiesFromFile(bodies);
    scene.LoadObjectsFromFile(rest);
    EXPECT_EQ(Movables(), L"car ");
    ASSERT_EQ(parts.made.size(), 1U);
    EXPECT_EQ(parts.layout, L"w");
    EXPECT_FALSE(document.store.GetObject(L"old car"));
    EXPECT_FALSE(document.store.GetObject(L"not taken"));
    EXPECT_TRUE(document.store.GetObject(L"t"));
    EXPECT_EQ(document.store.GetObject(L"house"),
              static_cast<VtC3DStaticBody*>(scene.GetStaticBodies()->FindById(L"house"))->GetAttributeObject());

    scene.ResolveObserverTargets();
    EXPECT_FALSE(parts.made[0]->body) << "the user has declined";
    document.questions.chosen = 0;
    scene.ResolveObserverTargets();
    ASSERT_EQ(document.questions.replacements.size(), 2U);
    EXPECT_EQ(document.questions.replacements[1].missing, L"gone");
    EXPECT_EQ(document.questions.replacements[1].observers, std::vector<std::wstring>{L"eye o"});
    EXPECT_EQ(document.questions.replacements[1].candidates, std::vector<std::wstring>{L"name of car"});
    EXPECT_EQ(parts.made[0]->body, scene.GetMovableBodies(0)->GetBodies()[0]);
}

} // namespace
