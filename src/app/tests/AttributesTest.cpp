// What is stored, over every class and every attribute: each test walks the tables of the classes.
#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <fstream>
#include <functional>
#include <iterator>
#include <map>
#include <set>

#include "app/tests/AppFixture.h"
#include "base/Paths.h"
#include "base/Text.h"
#include "interaction/Observer.h"
#include "interaction/Observers.h"
#include "records/AttributeNames.h"
#include "records/RecordTables.h"
#include "render/ChildFrame.h"
#include "render/PanoramicView.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "scene/StaticBody.h"
#include "tests/support/FakeViews.h"
#include "tests/support/HeapCount.h"
#include "tests/support/TemporaryFolder.h"

namespace
{

/// An object of each class that stores something, with its record.
struct Subject
{
    std::string what;
    VtIRecordOwner* owner;
    osg::ref_ptr<VtISceneObject> record;
};

/// Counts what it is told, by name.
class Listener : public IPropertyChangedCOMEvents
{
public:
    explicit Listener(VtISceneObject& heardRecord) : record(&heardRecord) { record->Advise(*this); }
    ~Listener() override { record->Unadvise(*this); }

    void OnPropertyChanged(VtISceneObject&, VtISceneAttribute& attribute) override
    {
        ++heard[attribute.GetName()];
        if (react)
            react(attribute);
    }
    void OnPropertyRemoved(VtISceneObject&, VtISceneAttribute& attribute) override { ++removed[attribute.GetName()]; }

    std::map<std::wstring, int, std::less<>> heard;
    std::map<std::wstring, int, std::less<>> removed;
    std::function<void(VtISceneAttribute&)> react;

private:
    osg::ref_ptr<VtISceneObject> record;
};

bool Near(const VtTAttributeValue& a, const VtTAttributeValue& b)
{
    const auto near = [](float x, float y) { return std::abs(x - y) <= 1e-5F * std::max(1.0F, std::abs(x)); };
    const auto all = [&](const auto& x, const auto& y)
    { return std::equal(x.begin(), x.end(), y.begin(), y.end(), near); };
    if (a.index() != b.index())
        return false;
    if (const auto* real = std::get_if<float>(&a))
        return near(*real, std::get<float>(b));
    if (const auto* tupel = std::get_if<VtTFloatTupel3>(&a))
        return all(*tupel, std::get<VtTFloatTupel3>(b));
    if (const auto* list = std::get_if<std::vector<float>>(&a))
        return all(*list, std::get<std::vector<float>>(b));
    if (const auto* text = std::get_if<std::wstring>(&a))
        return base::EqualsNoCase(*text, std::get<std::wstring>(b));
    return a == b;
}

/// A value of the attribute that is neither its default nor an extreme one.
VtTAttributeValue SampleOf(const VtTAttributeRow& row)
{
    static const std::map<std::wstring_view, VtTAttributeValue> named = {
        {attribute::renderMode, 3},
        {attribute::globalRenderMode, 2},
        {attribute::behaviour, 4},
        {attribute::viewPos, 4},
        {attribute::channelIndex, 2},
        {attribute::attachedTo, std::wstring(L"Leader")},
        {attribute::observer, std::wstring(L"Watcher")},
        {attribute::splitterPosition, std::vector<float>{0.25F, 0.75F}},
        {attribute::lastTransformMatrix, std::vector<float>{0, 1, 0, 0, -1, 0, 0, 0, 0, 0, 1, 0, 5, 6, 7, 1}},
        {attribute::insertTransformMatrix, std::vector<float>{0, 1, 0, 0, -1, 0, 0, 0, 0, 0, 1, 0, 5, 6, 7, 1}},
        {attribute::dyeColor, VtTIntTupel3{255, 51, 128}},
    };
    if (const auto at = named.find(*row.name); at != named.end())
        return at->second;
    switch (row.GetType())
    {
    case VtEAttributeType::integer:
        return 1 - std::get<std::int32_t>(row.defaultValue);
    case VtEAttributeType::real:
        return std::get<float>(row.defaultValue) * 2 + 0.25F;
    case VtEAttributeType::floatTupel3:
        return VtTFloatTupel3{10, -20, 30.5F};
    default:
        return std::wstring(L"Another ") + *row.name;
    }
}

/// One scene with all there is, in four panes.
class Attributes : public AppFixture
{
protected:
    Attributes()
    {
        host.viewWindows = &windows;
        host.texts.known[6221] = L"free|fixed|Fixed_to_Object|heading|smooth|look at|position|along x|along y";
        Start();
        document = NewDocument();
        windows.Fire();
        VtCScene3D& scene = *document->GetScene();
        movable = &MakeMovable(L"Follower");
        MakeMovable(L"Leader");
        fixed = new VtC3DStaticBody(*document, *scene.GetStaticBodies(), L"House", L"", osg::Matrixd(), true, {});
        observer = &document->GetObservers().CreateObserver(L"Watcher", true);
        document->SetModified(false);
    }
    ~Attributes() override { Stop(); }

    VtC3DMovableBody& MakeMovable(const std::wstring& name)
    {
        return *new VtC3DMovableBody(*document, *document->GetScene()->GetMovableBodies(0), name, L"", osg::Matrixd(),
                                     true, nullptr, {});
    }

    VtCPanoramicView& View() const { return *document->GetChildFrame()->getSplitter().getView(2); }

    std::vector<Subject> Subjects() const
    {
        VtC3DObserver& free = *document->GetObservers().GetFree1();
        VtCSplitterEx& splitter = document->GetChildFrame()->getSplitter();
        VtCScene3D& scene = *document->GetScene();
        return {{"movable body", movable, movable->GetAttributeObject()},
                {"static body", fixed, fixed->GetAttributeObject()},
                {"observer", observer, observer->GetAttributeObject()},
                {"free observer", &free, free.GetAttributeObject()},
                {"view", &View(), View().getSceneObject()},
                {"layout", &splitter, splitter.getWindowLayout()},
                {"render settings", &scene, scene.GetRenderSettings()}};
    }

    /// Calls `visit` for each attribute of each object that a value reaches.
    void ForEachTaken(const std::function<void(const Subject&, const VtTAttributeRow&)>& visit) const
    {
        for (const Subject& subject : Subjects())
            for (const VtTAttributeRow& row : subject.owner->GetAttributeTable().GetRows())
                if (row.take)
                {
                    SCOPED_TRACE(subject.what + ", " + base::Utf8(*row.name));
                    visit(subject, row);
                }
    }

    /// Whatever has happened: what the record holds is what the object has.
    void ExpectAgreement() const
    {
        movable->StoreLastTransform();
        ForEachTaken(
            [](const Subject& subject, const VtTAttributeRow& row)
            {
                const VtISceneAttribute* stored = subject.record->GetAttribute(*row.name);
                const std::optional<VtTAttributeValue> present = row.give(*subject.owner);
                EXPECT_TRUE(!stored || !present || Near(stored->GetValue(), *present)) << base::Utf8(
                    AttributeValueToText(stored->GetValue()) + L" against " + AttributeValueToText(*present));
            });
    }

    /// Each listener of a record was told of `name` once, and of nothing twice.
    static void ExpectOnce(const Listener& listener, std::wstring_view name)
    {
        EXPECT_TRUE(listener.heard.contains(name));
        for (const auto& [attribute, times] : listener.heard)
            EXPECT_EQ(times, 1) << base::Utf8(attribute);
    }

    fake::ViewWindows windows;
    TemporaryFolder folder;
    VtCPanoramicDocument* document = nullptr;
    VtC3DMovableBody* movable = nullptr;
    VtC3DStaticBody* fixed = nullptr;
    VtC3DObserver* observer = nullptr;
};

TEST_F(Attributes, EveryTableHasAnObjectInTheseTests)
{
    std::set<const VtCAttributeTable*> walked;
    for (const Subject& subject : Subjects())
        walked.insert(&subject.owner->GetAttributeTable());
    for (const VtCAttributeTable* table : GetAttributeTables())
        EXPECT_TRUE(!table->MakeRecord() || walked.contains(table)) << table->GetObjectType();
}

TEST_F(Attributes, AWriteToTheRecordReachesTheObjectOnce)
{
    observer->SetFollowModeIndex(followFree); // else the rules of the mode place the eye
    ForEachTaken(
        [this](const Subject& subject, const VtTAttributeRow& row)
        {
            if (subject.owner == observer && *row.name == attribute::behaviour)
                return; // below
            const std::wstring* formerName = subject.record->Find<std::wstring>(attribute::name);
            const std::wstring name = formerName ? *formerName : std::wstring();
            const Listener listener(*subject.record);
            document->SetModified(false);
            const VtTAttributeValue sample = SampleOf(row);
            subject.record->Write(*row.name, sample);
            const std::optional<VtTAttributeValue> present = row.give(*subject.owner);
            EXPECT_TRUE(!present || Near(*present, sample)) << base::Utf8(AttributeValueToText(*present));
            ExpectOnce(listener, *row.name);
            EXPECT_TRUE(document->IsModified());

            document->SetModified(false);
            subject.record->Write(*row.name, sample);
            ExpectOnce(listener, *row.name);
            EXPECT_FALSE(document->IsModified()) << "nothing has changed";
            ExpectAgreement();
            if (*row.name == attribute::name)
                subject.record->Write(attribute::name, name); // others are found by it
        });
    observer->GetAttributeObject()->Write(attribute::behaviour, 4);
    ExpectAgreement();
}

TEST_F(Attributes, ARemovedAttributeFallsBackToItsDefault)
{
    observer->SetFollowModeIndex(followFree);
    ForEachTaken(
        [this](const Subject& subject, const VtTAttributeRow& row)
        {
            subject.record->Write(*row.name, SampleOf(row));
            const Listener listener(*subject.record);
            document->SetModified(false);
            subject.record->RemoveAttribute(*row.name);
            EXPECT_EQ(listener.removed.size(), 1U);
            EXPECT_TRUE(document->IsModified());
            const std::optional<VtTAttributeValue> present = row.give(*subject.owner);
            // No observer and no pane is what a view can't have.
            EXPECT_TRUE(!present || *row.name == attribute::observer || Near(*present, row.defaultValue))
                << base::Utf8(AttributeValueToText(*present));
        });
}

/// What sets a value besides its record.
struct Setter
{
    const char* what;
    std::vector<std::wstring_view> stores;
    std::function<void()> set;
};

TEST_F(Attributes, ASetterWritesTheRecordOnce)
{
    VtC3DObserver& free = *document->GetObservers().GetFree1();
    VtCSplitterEx& splitter = document->GetChildFrame()->getSplitter();
    VtCScene3D& scene = *document->GetScene();
    VtC3DMovableBody* leader = scene.FindMovableByName(L"Leader");
    std::vector<std::pair<std::size_t, Setter>> setters;
    const auto add = [&](std::size_t subject, const char* what, std::vector<std::wstring_view> stores,
                         std::function<void()> set) {
        setters.push_back({subject, {what, std::move(stores), std::move(set)}});
    };
    VtC3DBody* bodies[] = {movable, fixed};
    for (std::size_t i = 0; i < 2; ++i)
    {
        VtC3DBody& body = *bodies[i];
        const std::wstring_view center = i == 0 ? attribute::position : attribute::center;
        add(i, "center x", {center}, [&] { body.SetCenterX(5); });
        add(i, "center y", {center}, [&] { body.SetCenterY(-6); });
        add(i, "center z", {center}, [&] { body.SetCenterZ(7); });
        add(i, "rotation x", {attribute::rotation}, [&] { body.SetRotationX(30); });
        add(i, "rotation y", {attribute::rotation}, [&] { body.SetRotationY(40); });
        add(i, "rotation z", {attribute::rotation}, [&] { body.SetRotationZ(-50); });
        add(i, "scale x", {attribute::scale}, [&] { body.SetScaleX(150); });
        add(i, "scale y", {attribute::scale}, [&] { body.SetScaleY(250); });
        add(i, "scale z", {attribute::scale}, [&] { body.SetScaleZ(50); });
        add(i, "visible", {attribute::visible}, [&] { body.SetVisible(false); });
        add(i, "mode", {attribute::renderMode}, [&] { body.SetRenderMode(VtERenderMode::Transparent); });
        add(i, "transparency", {attribute::transparency}, [&] { body.SetTransparency(0.5F); });
        add(i, "dye", {attribute::dyeColor, attribute::dyeEnabled}, [&] { body.SetDyeBytes(255, 128, 1); });
        add(i, "no dye", {attribute::dyeEnabled}, [&] { body.ClearDye(); });
    }
    add(0, "a channel", {attribute::channelIndex, attribute::channelName},
        [&] { movable->ConnectChannel(3, L"Axle"); });
    add(0, "insert", {attribute::insertTransformMatrix},
        [&] { movable->SetInsertMatrix(osg::Matrixd::translate(1, 2, 3)); });
    add(0, "a frame and a save", {attribute::lastTransformMatrix},
        [&]
        {
            movable->SetLastTransformMatrix(osg::Matrixd::translate(1, 2, 3));
            movable->StoreLastTransform();
        });
    add(1, "position x", {attribute::position}, [&] { fixed->SetPositionX(1); });
    add(1, "position y", {attribute::position}, [&] { fixed->SetPositionY(2); });
    add(1, "position z", {attribute::position}, [&] { fixed->SetPositionZ(3); });
    add(1, "scaling axes", {attribute::scaleOrient}, [&] { fixed->SetScaleOrientation(osg::Vec3f(1, 2, 3)); });
    add(2, "name", {attribute::name}, [&] { observer->SetName(L"Eye"); });
    add(2, "mode by name", {attribute::behaviour}, [&] { observer->SetFollowMode(L"Fixed_to_Body"); });
    // One that becomes free keeps looking from where it was.
    add(2, "mode by number", {attribute::behaviour, attribute::position, attribute::orientation},
        [&] { observer->SetFollowModeIndex(followFree); });
    add(2, "body", {attribute::attachedTo}, [&] { observer->SetConnectedBody(leader); });
    add(2, "no body", {attribute::attachedTo}, [&] { observer->Disconnect(); });
    add(2, "offset", {attribute::translation}, [&] { observer->SetTranslationOffset(osg::Vec3f(1, 2, 3)); });
    add(2, "turn", {attribute::rotation}, [&] { observer->SetRotationOffset(osg::Vec3f(10, 20, 30)); });
    add(3, "eye", {attribute::position}, [&] { free.setPosition(osg::Vec3f(1, 2, 3), true); });
    add(3, "look", {attribute::orientation}, [&] { free.setRotation(osg::Quat(0.5, osg::Vec3d(0, 0, 1)), true); });
    add(3, "the mouse", {attribute::position, attribute::orientation},
        [&] { free.StoreFreeView(osg::Vec3f(4, 5, 6), osg::Quat(1.0, osg::Vec3d(1, 0, 0))); });
    add(4, "name of a view", {attribute::name}, [&] { View().setName(L"Left"); });
    add(4, "near plane", {attribute::frontClipPlane}, [&] { View().setNearClipPlane(0.5F); });
    add(4, "far plane", {attribute::backClipPlane}, [&] { View().setFarClipPlane(500); });
    add(4, "angle", {attribute::viewAngle}, [&] { View().setViewAngle(30); });
    add(4, "observer", {attribute::observer}, [&] { View().assignObserver(observer); });
    add(4, "observer by name", {attribute::observer}, [&] { View().assignObserverByName(L"Free2"); });
    add(4, "pane", {attribute::viewPos}, [&] { View().setViewPosition(4); });
    add(5, "bars", {attribute::splitterPosition}, [&] { splitter.setSplitterPosition(0.25, 0.75); });
    add(5, "a dragged bar", {attribute::splitterPosition}, [&] { splitter.OnColumnBarMoved(500); });
    add(5, "a layout", {attribute::splitterPosition}, [&] { splitter.setLayout(layoutTwoColumns); });
    add(6, "the scene's mode", {attribute::globalRenderMode},
        [&] { scene.ChangeGlobalRenderMode(VtERenderMode::Flat, false); });

    std::vector<std::set<std::wstring_view>> set(Subjects().size());
    for (const auto& [index, setter] : setters)
    {
        const Subject subject = Subjects()[index];
        SCOPED_TRACE(subject.what + ", " + setter.what);
        const Listener listener(*subject.record);
        document->SetModified(false);
        setter.set();
        for (const std::wstring_view name : setter.stores)
            ExpectOnce(listener, name);
        EXPECT_EQ(listener.heard.size(), setter.stores.size());
        EXPECT_TRUE(document->IsModified());
        ExpectAgreement();

        document->SetModified(false);
        setter.set();
        for (const std::wstring_view name : setter.stores)
            ExpectOnce(listener, name);
        EXPECT_FALSE(document->IsModified()) << "nothing has changed";
        set[index].insert(setter.stores.begin(), setter.stores.end());
    }
    // None may come without its setter here. The editor's flags and the names of bodies have none; a free observer is
    // an observer.
    const std::vector<Subject> subjects = Subjects();
    set[2].insert(set[3].begin(), set[3].end());
    set[3] = set[2];
    for (std::size_t i = 0; i < subjects.size(); ++i)
        for (const VtTAttributeRow& row : subjects[i].owner->GetAttributeTable().GetRows())
        {
            const bool hasNone = *row.name == attribute::selectable || *row.name == attribute::fixedToWorld ||
                                 (i < 2 && *row.name == attribute::name);
            EXPECT_TRUE(!row.take || hasNone || set[i].contains(*row.name)) << base::Utf8(*row.name);
        }
}

TEST_F(Attributes, WhatIsWrittenWhileTheObjectWritesIsHeardToo)
{
    Listener listener(*movable->GetAttributeObject());
    listener.react = [&](VtISceneAttribute& changed)
    {
        if (changed.GetName() == attribute::visible)
            movable->GetAttributeObject()->Write(attribute::selectable, 0);
        if (changed.GetName() == attribute::channelIndex)
            movable->GetAttributeObject()->Write(attribute::name, std::wstring(L"Renamed"));
    };
    movable->SetVisible(false);
    EXPECT_FALSE(movable->IsSelectable());
    movable->ConnectChannel(2, L"Given");
    EXPECT_EQ(movable->GetName(), L"Renamed");
    EXPECT_EQ(movable->GetSimulationDataStream(), L"Given") << "what the body writes itself doesn't come back";

    Listener contrary(*movable->GetAttributeObject());
    contrary.react = [&](VtISceneAttribute& changed)
    {
        if (changed.GetName() == attribute::visible)
            movable->GetAttributeObject()->Write(attribute::visible, 0);
    };
    movable->SetVisible(true);
    EXPECT_FALSE(movable->IsVisible()) << "somebody wants it hidden";
    ExpectAgreement();
}

TEST_F(Attributes, RecordsThatNameAnotherObjectFollowItsName)
{
    observer->SetConnectedBody(movable);
    View().assignObserver(observer);
    movable->GetAttributeObject()->Write(attribute::name, std::wstring(L"Front"));
    observer->SetName(L"Over the front");
    EXPECT_EQ(*observer->GetAttributeObject()->Find<std::wstring>(attribute::attachedTo), L"Front");
    EXPECT_EQ(*View().getSceneObject()->Find<std::wstring>(attribute::observer), L"Over the front");
}

TEST_F(Attributes, ATransparencyWaitsWhileTheSceneHasAMode)
{
    VtCScene3D& scene = *document->GetScene();
    scene.ChangeGlobalRenderMode(VtERenderMode::Gouraud, false);
    fixed->GetAttributeObject()->Write(attribute::transparency, 0.5F);
    EXPECT_EQ(fixed->GetTransparency(), 0);
    scene.ChangeGlobalRenderMode(VtERenderMode::Mixed, true);
    EXPECT_EQ(fixed->GetTransparency(), 0.5F);
    ExpectAgreement();
}

TEST_F(Attributes, ADispatchTakesNothingFromTheHeap)
{
    const osg::ref_ptr<VtISceneObject> record = fixed->GetAttributeObject();
    const VtTFloatTupel3 places[] = {{1, 2, 3}, {4, 5, 6}};
    record->Write(attribute::position, places[0]);
    heap::Count count;
    for (int i = 0; i < 100; ++i)
    {
        record->Write(attribute::position, places[i % 2]);
        fixed->SetPositionX(static_cast<float>(i));
    }
    EXPECT_EQ(count.Stop(), 0);
}

/// The values of all objects, by record and name.
std::map<std::wstring, std::wstring> ValuesOf(const std::vector<Subject>& subjects)
{
    std::map<std::wstring, std::wstring> values;
    for (const Subject& subject : subjects)
        for (const VtTAttributeRow& row : subject.owner->GetAttributeTable().GetRows())
            if (row.take)
                if (const std::optional<VtTAttributeValue> value = row.give(*subject.owner))
                    values[base::Wide(subject.what) + L"." + *row.name] = AttributeValueToText(*value);
    return values;
}

std::string Content(const std::filesystem::path& file)
{
    std::ifstream stream(file, std::ios::binary);
    return {std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>()};
}

/// The same scene with the attributes of each record the other way round.
std::string Reversed(const std::string& scene)
{
    std::string result;
    std::vector<std::string> attributes;
    for (std::size_t begin = 0; begin < scene.size();)
    {
        const std::size_t end = scene.find('\n', begin) + 1;
        const std::string line = scene.substr(begin, end - begin);
        if (line.find("<vtattr:Attribute") != std::string::npos)
            attributes.push_back(line);
        else
        {
            for (; !attributes.empty(); attributes.pop_back())
                result += attributes.back();
            result += line;
        }
        begin = end;
    }
    return result;
}

TEST_F(Attributes, ASceneComesBackWholeInWhateverOrderItsAttributesStand)
{
    observer->SetFollowModeIndex(followFree);
    ForEachTaken(
        [this](const Subject& subject, const VtTAttributeRow& row)
        {
            if (*row.name != attribute::globalRenderMode && *row.name != attribute::viewPos &&
                *row.name != attribute::name && subject.owner != observer)
                subject.record->Write(*row.name, SampleOf(row));
        });
    movable->SetRenderMode(VtERenderMode::Transparent);
    movable->GetAttributeObject()->Write(L"of_a_later_version", 42);
    observer->GetAttributeObject()->Write(attribute::position, VtTFloatTupel3{1, 2, 3});
    observer->GetAttributeObject()->Write(attribute::orientation, VtTFloatTupel3{0, 80, 20});
    observer->SetRotationOffset(osg::Vec3f(10, 20, 30));
    ASSERT_TRUE(document->OnSaveDocument(base::InnerPath(folder.path / "first.xml")));
    const std::map<std::wstring, std::wstring> stored = ValuesOf(Subjects());
    const std::string first = Content(folder.path / "first.xml");
    EXPECT_NE(first.find("of_a_later_version"), std::string::npos);

    // A record that an object had before the file came keeps its own place, so the bytes are those of a loaded scene.
    std::string saved;
    for (const std::string& text : {first, Reversed(first), std::string()})
    {
        host.documentManager.CloseActiveDocument();
        document = dynamic_cast<VtCPanoramicDocument*>(
            host.documentManager.OpenDocument(base::InnerPath(folder.Write("again.xml", text.empty() ? saved : text))));
        ASSERT_TRUE(document);
        windows.Fire();
        movable = document->GetScene()->FindMovableByName(L"Follower");
        fixed = dynamic_cast<VtC3DStaticBody*>(document->GetScene()->GetStaticBodies()->FindByName(L"House"));
        observer = document->GetObservers().FindObserverByName(L"Watcher");
        ASSERT_TRUE(movable && fixed && observer);
        EXPECT_FALSE(document->IsModified());
        ExpectAgreement();
        EXPECT_EQ(ValuesOf(Subjects()), stored);
        ASSERT_TRUE(document->OnSaveDocument(base::InnerPath(folder.path / "saved.xml")));
        EXPECT_TRUE(!text.empty() || Content(folder.path / "saved.xml") == saved);
        saved = Content(folder.path / "saved.xml");
    }
}

/// The table of docs/attribute-objects.md.
std::string DescribeTables()
{
    struct Line
    {
        std::set<std::int32_t> types;
        const VtTAttributeRow* row;
    };
    std::vector<std::pair<std::string, Line>> lines;
    for (const VtCAttributeTable* table : GetAttributeTables())
        for (const VtTAttributeRow& row : table->GetRows())
        {
            std::string rest = " | " + std::string(AttributeTypeName(row.GetType())) + " | ";
            const std::string text = AttributeValueToUtf8(row.defaultValue);
            const std::string end = std::string(" | ") +
                                    (!row.inNewRecords ? "none"
                                     : text.empty()    ? "empty"
                                                       : text) +
                                    " | " + std::string(row.meaning) + " |\n";
            std::string start = "| `" + base::Utf8(*row.name) + "`" + rest + '\v' + end;
            if (*row.name == attribute::objectType)
                start = "| `object_type` | int | \v | the type | " + std::string(row.meaning) + " |\n";
            const auto at =
                std::find_if(lines.begin(), lines.end(), [&](const auto& line) { return line.first == start; });
            if (at == lines.end())
                lines.push_back({start, {{table->GetObjectType()}, &row}});
            else
                at->second.types.insert(table->GetObjectType());
        }
    std::string text = "| Attribute | Type | Objects | In a new record | Meaning |\n|---|---|---|---|---|\n";
    for (const auto& [line, about] : lines)
    {
        std::string types;
        for (const std::int32_t type : about.types)
            types += (types.empty() ? "" : ", ") + std::to_string(type);
        std::string whole = line;
        text += whole.replace(whole.find('\v'), 1, types);
    }
    return text;
}

TEST_F(Attributes, TheDocumentationHoldsTheTables)
{
    const std::string begin =
        "<!-- From the tables of the classes; the test of this name writes it with PANORAMIC_WRITE=1. -->\n\n";
    const std::string end = "\n<!-- End of the tables. -->\n";
    const std::filesystem::path file = std::filesystem::path(PANORAMIC_DOCS) / "attribute-objects.md";
    std::string page = Content(file);
    const std::size_t from = page.find(begin);
    const std::size_t to = page.find(end);
    ASSERT_TRUE(from != std::string::npos && to != std::string::npos);
    const std::string table = DescribeTables();
    const std::string found = page.substr(from + begin.size(), to - from - begin.size());
    if (std::getenv("PANORAMIC_WRITE"))
        std::ofstream(file, std::ios::binary) << page.replace(from + begin.size(), found.size(), table);
    else
        EXPECT_EQ(found, table);
}

} // namespace
