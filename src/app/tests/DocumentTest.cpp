#include "app/tests/AppFixture.h"

#include "base/Paths.h"
#include "base/Text.h"
#include "interaction/Observer.h"
#include "interaction/Observers.h"
#include "records/SceneObjectStore.h"
#include "render/ChildFrame.h"
#include "render/PanoramicView.h"
#include "render/ViewCommandsHandler.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "tests/support/FakeViews.h"
#include "tests/support/TemporaryFolder.h"

namespace
{

std::string Attribute(const std::string& name, const std::string& type, const std::string& value)
{
    return "<vtattr:Attribute name=\"" + name + "\" type=\"" + type + "\"><vtattr:value>" + value +
           "</vtattr:value></vtattr:Attribute>";
}

std::string Record(int type, const std::string& id, const std::string& name, const std::string& further)
{
    return "<vtattr:Object type=\"" + std::to_string(type) + "\">" +
           Attribute("object_type", "int", std::to_string(type)) + Attribute("internal_id", "string", id) +
           Attribute("name", "string", name) + further + "</vtattr:Object>\n";
}

std::string Scene(const std::string& records)
{
    return "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<vtattr:Scene xmlns:vtattr=\"urn:panoramic:attributes\" "
           "version=\"1\">\n" +
           records + "</vtattr:Scene>\n";
}

/// A car, an observer on it, one on a body that isn't there, a view through the first, and a record of nobody's.
std::string RichScene()
{
    return Scene(
        Record(7, "car", "Car", Attribute("file_path", "string", "\\none.dae")) +
        Record(5, "ride", "Ride", Attribute("behaviour", "int", "2") + Attribute("attached_to", "string", "Car")) +
        Record(5, "lost", "Lost", Attribute("behaviour", "int", "5") + Attribute("attached_to", "string", "Truck")) +
        Record(3, "second", "Second",
               Attribute("view_pos", "int", "2") + Attribute("observer", "string", "Ride") +
                   Attribute("front_clip_plane", "float", "0.5")) +
        Record(1, "layout", "Window_Layout", Attribute("splitter_position", "floatList", "0.25 0.5")) +
        Record(55, "odd", "Odd", ""));
}

struct Document : AppFixture
{
    Document()
    {
        host.viewWindows = &windows;
        Start();
    }
    ~Document() override { Stop(); }

    VtCPanoramicDocument* Open(const std::string& text)
    {
        host.messages.shown.clear();
        return dynamic_cast<VtCPanoramicDocument*>(
            host.documentManager.OpenDocument(base::InnerPath(folder.Write("scene.xml", text))));
    }

    fake::ViewWindows windows;
    TemporaryFolder folder;
};

TEST_F(Document, AnOpenedSceneIsLookedAtAsItsFileSays)
{
    VtCPanoramicDocument* document = Open(RichScene());
    ASSERT_NE(document, nullptr);
    EXPECT_FALSE(document->IsModified());
    const VtC3DObserver* ride = document->GetObservers().FindObserverByName(L"ride");
    ASSERT_NE(ride, nullptr);
    const VtCPanoramicView& second = *document->GetChildFrame()->getSplitter().getView(2);
    EXPECT_EQ(second.getObserver(), ride);
    EXPECT_NEAR(document->GetChildFrame()->getSplitter().getFirstPaneRatios()[0], 0.25, 0.01);

    windows.Fire();
    EXPECT_TRUE(document->GetChildFrame()->areViewsCreated());
    EXPECT_EQ(second.getObserver(), ride);
    EXPECT_FLOAT_EQ(second.getNearClipPlane(), 0.5f) << "a new view's own clip planes don't stand for the stored ones";
    EXPECT_TRUE(ride->HasCamera(second.getView()->getCamera()));

    // The frame's step moves the eye with the body.
    VtC3DMovableBody* car = document->GetScene()->FindMovableByName(L"Car");
    ASSERT_NE(car, nullptr);
    car->SetLastTransformMatrix(osg::Matrixd::translate(30, 0, 0));
    app.RedrawNow();
    EXPECT_NEAR(ride->GetPosition().x(), 30.0f, 0.01f);
}

TEST_F(Document, TheUserChoosesForObserversWhoseBodyIsMissing)
{
    host.questions.chosen = 0;
    VtCPanoramicDocument* document = Open(RichScene());
    ASSERT_NE(document, nullptr);
    ASSERT_EQ(host.questions.replacements.size(), 1U);
    EXPECT_EQ(host.questions.replacements[0].missing, L"Truck");
    EXPECT_EQ(document->GetObservers().FindObserverByName(L"Lost")->GetConnectedBodyName(), L"Car");
}

TEST_F(Document, WhatHasGoneIsNotSelectedAnyMore)
{
    VtCPanoramicDocument* document = Open(RichScene());
    ASSERT_NE(document, nullptr);
    host.selection.selected = {L"ride", L"car", L"lost"};
    document->GetObservers().RemoveObserver(L"Ride");
    document->GetScene()->GetMovableBodies(0)->RemoveBody(L"CAR");
    EXPECT_EQ(host.selection.selected, std::vector<std::wstring>{L"lost"});
    CloseDocuments();
    EXPECT_TRUE(host.selection.selected.empty());
}

TEST_F(Document, TheSceneKnowsItsActiveViewAndItsObserver)
{
    VtCPanoramicDocument* document = Open(RichScene());
    ASSERT_NE(document, nullptr);
    const VtCScene3D& scene = *document->GetScene();
    VtCPanoramicView& second = *document->GetChildFrame()->getSplitter().getView(2);
    document->GetChildFrame()->activateView(second);
    EXPECT_EQ(scene.GetActiveView(), &second);
    EXPECT_EQ(scene.GetActiveObserver()->GetName(), L"Ride");
    second.assignObserverByName(L"Free2");
    EXPECT_EQ(scene.GetActiveObserver(), document->GetObservers().GetFree2());
}

TEST_F(Document, ASceneThatEndsInTheMiddleOfItsLoadIsNotOpened)
{
    EXPECT_EQ(Open(Scene(Record(7, "car", "Car", ""))), nullptr) << "a body without its file";
    EXPECT_TRUE(WasShown(host::Severity::error, 496));
    ASSERT_FALSE(host.messages.shown.empty());
    EXPECT_NE(host.messages.shown.back().second.find(L"Car"), std::wstring::npos) << "names the record";
    EXPECT_FALSE(app.IsSceneLoaded());
    EXPECT_EQ(app.GetActiveView(), nullptr);
}

TEST_F(Document, WhatAClosedSceneOnlyKeptDoesNotComeIntoTheNext)
{
    ASSERT_NE(Open(RichScene()), nullptr);
    CloseDocuments();
    VtCPanoramicDocument* next = NewDocument();
    const auto file = folder.path / "next.xml";
    ASSERT_TRUE(next->OnSaveDocument(base::InnerPath(file)));
    EXPECT_EQ(TemporaryFolder::Read(file).find("\"odd\""), std::string::npos);
    EXPECT_EQ(TemporaryFolder::Read(file).find(">odd<"), std::string::npos);
}

TEST_F(Document, ASaveThatFailsLeavesTheSceneModified)
{
    VtCPanoramicDocument* document = Open(RichScene());
    ASSERT_NE(document, nullptr);
    document->SetModified(true);
    host.messages.shown.clear();
    EXPECT_FALSE(document->OnSaveDocument(base::InnerPath(folder.path / "none" / "s.xml")));
    EXPECT_TRUE(WasShown(host::Severity::error, 525));
    EXPECT_TRUE(document->IsModified());

    EXPECT_TRUE(document->OnSaveDocument(base::InnerPath(folder.path / "s.xml")));
    EXPECT_TRUE(WasShown(host::Severity::information, 524));
    EXPECT_FALSE(host.messages.shown.back().interrupts);
    EXPECT_FALSE(document->IsModified());
}

TEST_F(Document, CommandsGoToTheViewsFirstAndThenToTheController)
{
    EXPECT_FALSE(app.OnCmdMsg(commandTwoColumns)) << "no scene, no views";
    VtCPanoramicDocument* document = NewDocument();
    EXPECT_TRUE(app.OnCmdMsg(commandTwoColumns));
    EXPECT_EQ(document->GetChildFrame()->getSplitter().getLayout(), layoutTwoColumns);
    AddPoint({0.0, 1.0, 2.0});
    app.GetController()->ChoosePoint(L"Bench");
    app.GetController()->GotoFirst();
    EXPECT_TRUE(app.GetMenuState(38751)->enabled) << "play once";
    EXPECT_TRUE(app.OnCmdMsg(38751));
    EXPECT_TRUE(app.GetController()->IsPlaying());
    app.GetController()->StopPlay();
    EXPECT_FALSE(app.OnCmdMsg(1));
    EXPECT_FALSE(app.GetMenuState(1));
}

TEST_F(Document, ALiveRunForgetsWhatCamerasRememberedOfTheLast)
{
    VtCPanoramicDocument* document = Open(Scene(
        Record(7, "car", "Car", Attribute("file_path", "string", "\\none.dae")) +
        Record(5, "chase", "Chase", Attribute("behaviour", "int", "4") + Attribute("attached_to", "string", "Car")) +
        Record(3, "first", "First", Attribute("view_pos", "int", "1") + Attribute("observer", "string", "Chase"))));
    ASSERT_NE(document, nullptr);
    windows.Fire();
    AddPoint({0.0, 1.0});
    VtC3DMovableBody* car = document->GetScene()->FindMovableByName(L"Car");
    const VtC3DObserver* chase = document->GetObservers().FindObserverByName(L"Chase");

    // Four seconds turned by 90 degrees fill the memory; then the body points ahead.
    car->SetLastTransformMatrix(osg::Matrixd::rotate(osg::PI_2, osg::Z_AXIS));
    for (int step = 0; step < 40; ++step)
    {
        host.clock.Advance(0.1);
        app.RedrawNow();
    }
    car->SetLastTransformMatrix(osg::Matrixd());
    app.RedrawNow();
    const osg::Matrixd remembering = chase->GetViewMatrix();
    app.StartSimulation();
    app.RedrawNow();
    EXPECT_NE(chase->GetViewMatrix(), remembering) << "it leaned towards where the body had pointed";
    app.StopSimulation();
}

} // namespace
