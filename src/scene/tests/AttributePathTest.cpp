#include "base/Text.h"
#include "scene/tests/SceneFixture.h"
#include "scene/UserData.h"

namespace
{

class Listener : public IPropertyChangedCOMEvents
{
public:
    void OnPropertyChanged(VtISceneObject& object, VtISceneAttribute& attribute) override
    {
        heard.push_back(attribute.GetName() + L"=" + attribute.GetValueText());
        if (leaves)
            object.Unadvise(*this);
    }

    std::vector<std::wstring> heard;
    bool leaves = false;
};

class AttributePath : public SceneFixture
{
};

TEST_F(AttributePath, ListenersMayLeaveWhileTheyAreTold)
{
    VtC3DMovableBody& body = AddMovable(L"Car");
    Listener first;
    Listener second;
    first.leaves = true;
    body.GetAttributeObject()->Advise(first);
    body.GetAttributeObject()->Advise(second);
    Write(body, L"visible", 0);
    Write(body, L"visible", 1);
    EXPECT_EQ(first.heard.size(), 1U);
    EXPECT_EQ(second.heard.size(), 2U);
    body.GetAttributeObject()->Unadvise(second);
}

TEST_F(AttributePath, LoadingReplaysARecordAndTakesItOver)
{
    VtTParsedObject stored = document.store.ParseObject(LR"(<vtattr:Object type="6">
        <vtattr:Attribute name="internal_id"><vtattr:value>ID-1</vtattr:value></vtattr:Attribute>
        <vtattr:Attribute name="name"><vtattr:value>Tower</vtattr:value></vtattr:Attribute>
        <vtattr:Attribute name="file_path"><vtattr:value>\lib\Customer_Objects\$T\T.dae</vtattr:value></vtattr:Attribute>
        <vtattr:Attribute name="position"><vtattr:value>1 2 3</vtattr:value></vtattr:Attribute>
        <vtattr:Attribute name="unheard_of" type="float"><vtattr:value>0.5</vtattr:value></vtattr:Attribute>
        </vtattr:Object>)");
    ASSERT_TRUE(stored.object) << base::Utf8(stored.error);
    document.store.AddObject(L"ID-1", stored.object);

    VtC3DStaticBody& body = AddStatic(L"new");
    const std::wstring firstId = body.GetInternalId();
    body.ApplyAttributes(*stored.object);
    EXPECT_EQ(body.GetName(), L"Tower");
    ExpectNear(Placed(body, {0, 0, 0}), {1, 3, -2});
    EXPECT_EQ(Stored(body, L"unheard_of"), L"0.5");
    EXPECT_NE(body.GetAttributeObject(), stored.object);

    body.FinishLoad(L"ID-1");
    EXPECT_EQ(body.GetInternalId(), L"ID-1");
    EXPECT_EQ(body.GetAttributeObject(), stored.object);
    EXPECT_EQ(document.store.GetObject(firstId), nullptr);
    EXPECT_EQ(document.store.GetObject(L"id-1"), stored.object.get());
    EXPECT_EQ(Stored(body, L"file_path"), L"%Customer_Objects%\\$T\\T.dae");
    EXPECT_EQ(Stored(body, L"dye_enabled"), L"0");
    EXPECT_EQ(Stored(body, L"dye_color"), L"0 0 0");

    stored.object->Write(L"position", VtTFloatTupel3{4, 5, 6});
    ExpectNear(Placed(body, {0, 0, 0}), {4, 6, -5});
}

TEST_F(AttributePath, RebindingToNothingLeavesABodyWithoutRecord)
{
    VtC3DMovableBody& body = AddMovable(L"Car");
    body.FinishLoad(L"nowhere");
    EXPECT_FALSE(body.GetAttributeObject());
    body.SetVisible(false);
    body.ConnectChannel(3, L"");
    body.StoreLastTransform();
    EXPECT_EQ(body.GetSimulationDataStream(), L"Body_3");

    VtC3DMovableBody& other = AddMovable(L"Other");
    const std::wstring id = other.GetInternalId();
    other.RebindAttributes(id);
    EXPECT_EQ(document.store.GetObject(id), other.GetAttributeObject().get());
}

TEST_F(AttributePath, CopiesHoldWhatANewRecordHasRoomFor)
{
    VtC3DMovableBody& body = AddMovable(L"Car");
    Write(body, L"render_mode", 3);
    Write(body, L"private", std::wstring(L"x"));
    const osg::ref_ptr<VtISceneObject> copy = body.CopyAttributes(*body.GetAttributeObject());
    ASSERT_TRUE(copy);
    EXPECT_EQ(*copy->Find<std::int32_t>(L"render_mode"), 3);
    EXPECT_EQ(*copy->Find<std::wstring>(L"name"), L"Car");
    EXPECT_EQ(copy->GetAttribute(L"private"), nullptr);
}

TEST_F(AttributePath, ARecordRefusesWhatItCouldNotGiveBack)
{
    const osg::ref_ptr<VtISceneObject> object = new VtISceneObject;
    object->AddAttribute(L"float", L"0.5", L"transparency");
    object->Write(L"transparency", 1);
    EXPECT_EQ(*object->Find<float>(L"transparency"), 1.0F);
    EXPECT_THROW(object->Write(L"transparency", std::wstring(L"1")), VtCAttributeError);
    EXPECT_THROW(object->Write(L"transparency", std::nanf("")), VtCAttributeError);
    EXPECT_THROW(object->AddAttribute(L"float", L"much", L"other"), VtCAttributeError);
    EXPECT_THROW(object->AddAttribute(L"double", L"1", L"other"), VtCAttributeError);
    EXPECT_EQ(object->GetAttributes().size(), 1U);

    object->AddAttribute(L"string", L"half", L"transparency");
    EXPECT_EQ(*object->Find<std::wstring>(L"transparency"), L"half");
    EXPECT_EQ(object->GetAttributes().size(), 1U);
}

TEST_F(AttributePath, AnEndedBodyLeavesNoRecordExceptAGroups)
{
    VtC3DMovableBody& single = AddMovable(L"Car");
    VtC3DMovableBody& group = AddMovable(L"Truck");
    const std::wstring singleId = single.GetInternalId();
    const std::wstring groupId = group.GetInternalId();
    Write(group, L"is_grouped", 1);
    osg::ref_ptr<osg::Group> node = single.GetTransformNode();
    single.Destroy();
    group.Destroy();
    EXPECT_EQ(document.store.GetObject(singleId), nullptr);
    EXPECT_NE(document.store.GetObject(groupId), nullptr);
    EXPECT_EQ(node->getUserData(), nullptr) << "a pick must not find a body that is gone";
    EXPECT_EQ(scene.GetMovableBodiesNode()->getNumChildren(), 0U);
    EXPECT_TRUE(scene.GetMovableBodies(0)->GetBodies().empty());
}

TEST_F(AttributePath, ADescriptionThatIsNoRecordIsReported)
{
    document.models.descriptions[L"\\m\\bad.dae"] = "<vtattr:Object><oops/></vtattr:Object>";
    VtC3DStaticBody& body = AddStatic(L"Bad", L"\\m\\bad.dae");
    ASSERT_EQ(document.messages.shown.size(), 1U);
    EXPECT_EQ(document.messages.shown[0].first, L"\\m\\bad.dae");
    EXPECT_NE(document.messages.shown[0].second.find(L"oops"), std::wstring::npos);
    EXPECT_EQ(Stored(body, L"render_mode"), L"1");
}

TEST_F(AttributePath, DescendantsAreFoundDepthFirstInAnyCase)
{
    VtC3DStaticBody& outer = AddStatic(L"Outer");
    auto* inner = new VtC3DStaticBody(document, outer, L"Same", L"\\m\\house.dae", osg::Matrixd(), true, L"Inner-ID");
    AddStatic(L"same");
    const VtCStaticBodies& all = *scene.GetStaticBodies();
    EXPECT_EQ(all.FindByName(L"SAME"), inner);
    EXPECT_EQ(all.FindById(L"inner-id"), inner);
    EXPECT_EQ(all.FindByName(L"none"), nullptr);
    EXPECT_FALSE(all.IsNameFree(L"oUTER"));
    EXPECT_EQ(Stored(*inner, L"parent_object_id"), outer.GetInternalId());
    VtCGlidePanelAbstractNavigatorObject::Objects found = {nullptr};
    all.CollectDescendants(found);
    ASSERT_EQ(found.size(), 3U);
    EXPECT_EQ(found[0], &outer);
    EXPECT_EQ(found[1], inner);
    EXPECT_EQ(static_cast<VtCOsgUserData*>(inner->GetTransformNode()->getUserData())->owner, inner);
    EXPECT_EQ(inner->GetRefCount(), 1U);

    scene.GetStaticBodies()->RemoveBody(outer.GetInternalId());
    EXPECT_EQ(all.GetChildren().size(), 1U);
    EXPECT_EQ(scene.GetStaticBodiesNode()->getNumChildren(), 1U);
    EXPECT_EQ(document.store.GetObject(L"Inner-ID"), nullptr);
}

} // namespace
