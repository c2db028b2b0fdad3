#include <random>

#include <osg/ProxyNode>

#include "scene/Placement.h"
#include "scene/tests/SceneFixture.h"

namespace
{

class MovableBody : public SceneFixture
{
protected:
    static std::vector<float> Rows(const osg::Matrixd& matrix)
    {
        return std::vector<float>(matrix.ptr(), matrix.ptr() + 16);
    }
};

TEST_F(MovableBody, AModelStandsUprightWhereItsRecordPutsIt)
{
    VtC3DMovableBody& body = AddMovable(L"Car");
    // y-up to z-up: a quarter turn about x.
    ExpectNear(Placed(body, {1, 2, 3}), {1, -3, 2});

    Write(body, L"position", VtTFloatTupel3{1, 2, 3});
    EXPECT_EQ(body.GetCenter(), osg::Vec3f(1, 2, 3));
    ExpectNear(Placed(body, {0, 1, 0}), {1, 2, 4});

    Write(body, L"scale", VtTFloatTupel3{1, 2, 3});
    EXPECT_EQ(body.GetScale(), osg::Vec3f(100, 300, 200));
    ExpectNear(Placed(body, {0, 1, 0}), {1, 2, 6});
    ExpectNear(Placed(body, {0, 0, 1}), {1, 0, 3});
}

TEST_F(MovableBody, TheStoredAnglesTurnAboutTheirAxes)
{
    VtC3DMovableBody& body = AddMovable(L"Car");
    const osg::Matrixd upright = osg::Matrixd::rotate(osg::PI_2, 1, 0, 0);
    const VtTFloatTupel3 turns[] = {{0, 0, 0}, {90, 0, 0}, {0, 90, 0}, {0, 0, 90}, {20, -35, 70}};
    for (const VtTFloatTupel3& turn : turns)
    {
        Write(body, L"rotation", turn);
        EXPECT_EQ(body.GetRotation(), osg::Vec3f(turn[0], -turn[1], turn[2]));
        // Elementary turns in the order in which points pass them: the stored y turns about z, the stored z about y.
        const double x = turn[0] * osg::PI / 180, y = -turn[1] * osg::PI / 180, z = turn[2] * osg::PI / 180;
        const osg::Matrixd expected = osg::Matrixd::rotate(y, 0, 0, 1) * osg::Matrixd::rotate(z, 0, 1, 0) *
                                      osg::Matrixd::rotate(x, 1, 0, 0) * upright;
        ExpectNear(Placed(body, {1, 0, 0}), osg::Vec3d(1, 0, 0) * expected);
        ExpectNear(Placed(body, {0, 1, 0}), osg::Vec3d(0, 1, 0) * expected);
    }
}

TEST_F(MovableBody, AFramesMatrixMovesThePlacedModel)
{
    VtC3DMovableBody& body = AddMovable(L"Car");
    Write(body, L"position", VtTFloatTupel3{0, 0, 1});

    // A quarter turn to the left (z-up, right-handed) and a drive to (10, 20, 0), column after column.
    const float columns[16] = {0, -1, 0, 10, 1, 0, 0, 20, 0, 0, 1, 0, 0, 0, 0, 7};
    osg::Matrixd frame;
    for (int row = 0; row < 4; ++row)
        for (int column = 0; column < 4; ++column)
            frame(row, column) = columns[column * 4 + row];

    body.SetLastTransformMatrix(frame);
    EXPECT_EQ(body.GetLastTransformMatrix()(3, 3), 1.0);
    ExpectNear(Placed(body, {2, 0, 0}), {10, 22, 1});
    ExpectNear(Placed(body, {0, 3, 0}), {10, 20, 4});

    const osg::Matrixd byMatrix = body.GetTransform();
    body.SetLastTransformMatrix(osg::Matrixd());
    body.GetMotion().SetLastTransformColumns(columns);
    EXPECT_EQ(body.GetTransform(), byMatrix);
    EXPECT_EQ(body.GetLastTransformMatrix()(3, 3), 1.0);
}

TEST_F(MovableBody, TheQuickWayOfAFrameGivesTheWholeProduct)
{
    std::mt19937 random(1);
    std::uniform_real_distribution<float> number(-100, 100);
    const auto vector = [&] { return VtTFloatTupel3{number(random), number(random), number(random)}; };
    VtC3DMovableBody& body = AddMovable(L"Car");
    for (int round = 0; round < 200; ++round)
    {
        Write(body, L"position", vector());
        Write(body, L"rotation", vector());
        Write(body, L"scale", vector());
        float columns[16];
        for (float& value : columns)
            value = number(random);
        const bool affine = round % 2 == 0;
        if (affine)
            columns[12] = columns[13] = columns[14] = 0;

        osg::Matrixd frame;
        for (int i = 0; i < 16; ++i)
            frame(i % 4, i / 4) = columns[i];
        frame(3, 3) = 1;
        const osg::Matrixd expected = body.GetBaseMatrix() * frame;
        body.GetMotion().SetLastTransformColumns(columns);
        EXPECT_EQ(body.GetTransform(), expected);
        EXPECT_EQ(body.GetLastTransformMatrix(), frame);
        body.SetLastTransformMatrix(osg::Matrixd());
        body.SetLastTransformMatrix(frame);
        EXPECT_EQ(body.GetTransform(), expected);
        if (!affine)
            continue;
        body.SetLastTransformMatrix(osg::Matrixd());
        MoveByColumnsPortable(body.GetMotion(), columns);
        EXPECT_EQ(body.GetTransform(), expected);
        EXPECT_EQ(body.GetLastTransformMatrix(), frame);
    }
}

TEST_F(MovableBody, ChannelsAreBoundByIndexAndByName)
{
    document.texts.known[6239] = L"unbound";
    document.channels.channels = {L"Chassis", L"", L"Wheel"};
    VtC3DMovableBody& body = AddMovable(L"Car");

    struct Case
    {
        const char* what;
        std::int32_t index;
        const wchar_t* stream;
        const wchar_t* name;
        std::int32_t state;
    };
    const Case cases[] = {
        {"the data point names it", 2, L"", L"Wheel", VtC3DMovableBody::connected},
        {"over a given name", 0, L"Given", L"Chassis", VtC3DMovableBody::connected},
        {"an empty name doesn't", 1, L"", L"Body_1", VtC3DMovableBody::connected},
        {"beyond the channels the given text stays", 3, L"Given", L"Given", VtC3DMovableBody::channelMissing},
        {"below them too", -7, L"", L"Body_-7", VtC3DMovableBody::channelMissing},
        {"none", -1, L"", L"unbound", VtC3DMovableBody::notConnected},
    };
    for (const Case& entry : cases)
    {
        SCOPED_TRACE(entry.what);
        document.modified = false;
        body.ConnectChannel(entry.index, entry.stream);
        EXPECT_EQ(body.GetSimulationDataStream(), entry.name);
        EXPECT_EQ(body.GetConnectionState(), entry.state);
        EXPECT_EQ(body.IsConnected(), entry.index != -1);
        EXPECT_EQ(Stored(body, L"simulation_data_stream"), std::to_wstring(entry.index));
        EXPECT_EQ(Stored(body, L"simulation_data_index"), entry.name);
        EXPECT_TRUE(document.modified);
    }

    Write(body, L"simulation_data_index", std::wstring(L"Wheel"));
    EXPECT_EQ(body.GetSimulationDataIndex(), 2);
    Write(body, L"simulation_data_index", std::wstring(L"wheel"));
    EXPECT_EQ(body.GetSimulationDataIndex(), 2) << "names of channels compare exactly here";
    Write(body, L"simulation_data_index", std::wstring(L"Not connected"));
    EXPECT_EQ(body.GetSimulationDataIndex(), -1);
    EXPECT_EQ(body.GetSimulationDataStream(), L"Not connected");
    Write(body, L"simulation_data_stream", 0);
    EXPECT_EQ(body.GetSimulationDataStream(), L"Chassis");

    document.channels.selected = false;
    body.ConnectChannel(5, L"");
    EXPECT_EQ(body.GetSimulationDataStream(), L"Body_5");
    EXPECT_EQ(body.GetConnectionState(), VtC3DMovableBody::channelMissing);
    Write(body, L"simulation_data_index", std::wstring(L"Wheel"));
    EXPECT_EQ(body.GetSimulationDataIndex(), 5);
}

TEST_F(MovableBody, ASavedPlaceComesBack)
{
    VtC3DMovableBody& body = AddMovable(L"Car");
    const osg::Matrixd place = osg::Matrixd::rotate(0.3, 0, 0, 1) * osg::Matrixd::translate(1, 2, 3);
    body.SetLastTransformMatrix(place);
    const osg::Matrixd shown = body.GetTransform();
    body.StoreLastTransform();
    const osg::ref_ptr<VtISceneObject> record = body.CopyAttributes(*body.GetAttributeObject());

    VtC3DMovableBody& loaded = AddMovable(L"Again");
    loaded.ApplyAttributes(*record);
    for (int i = 0; i < 16; ++i)
        EXPECT_NEAR(loaded.GetTransform().ptr()[i], shown.ptr()[i], 1e-6);

    // Numbers that no record can hold leave the record as it was.
    body.SetTransform(osg::Matrixd::translate(std::nan(""), 0, 0));
    body.StoreLastTransform();
    EXPECT_EQ(Stored(body, L"last_transform_matrix"), Stored(loaded, L"last_transform_matrix"));
}

TEST_F(MovableBody, AMissingModelLeavesABodyThatCanBeMoved)
{
    VtC3DMovableBody& body = AddMovable(L"Ghost", L"\\m\\none.dae");
    const std::vector<std::pair<std::wstring, bool>> loads = {{L"\\m\\none.dae", true}};
    EXPECT_EQ(document.models.loads, loads);
    EXPECT_TRUE(body.GetMaterials().empty());
    body.SetLastTransformMatrix(osg::Matrixd::translate(1, 2, 3));
    ExpectNear(Placed(body, {0, 0, 0}), {1, 2, 3});
    body.SetBoundingBoxVisible(true);
    Write(body, L"render_mode", 4);
    Write(body, L"dye_enabled", 1);
    EXPECT_EQ(body.GetRenderMode(), VtERenderMode::Transparent);
}

TEST_F(MovableBody, ADescriptionMadeForStaticBodiesServesToo)
{
    document.models.descriptions[L"\\m\\d.dae"] =
        "<vtattr:Object type='6'>"
        "<vtattr:Attribute name='parent_object_id'><vtattr:value>p</vtattr:value></vtattr:Attribute>"
        "<vtattr:Attribute name='object_type'><vtattr:value>6</vtattr:value></vtattr:Attribute>"
        "<vtattr:Attribute name='weight'><vtattr:value>1200</vtattr:value></vtattr:Attribute></vtattr:Object>";
    VtC3DMovableBody& body = AddMovable(L"Car", L"\\m\\d.dae");
    EXPECT_EQ(body.GetAttributeObject()->GetObjectType(), 7);
    const std::pair<const wchar_t*, std::wstring> expected[] = {
        {L"object_type", L"7"},
        {L"weight", L"1200"},
        {L"name", L"Car"},
        {L"internal_id", body.GetInternalId()},
        {L"file_path", L"%Vantor_Objects%\\m\\d.dae"},
        {L"simulation_data_index", L""},
        {L"simulation_data_stream", L"-1"},
        {L"last_transform_matrix", L"1 0 0 0 0 1 0 0 0 0 1 0 0 0 0 1"},
        {L"center", L"0 0 0"},
        {L"scale", L"1 1 1"},
        {L"dye_color", L"0 0 0"},
        {L"parent_object_id", L"missing"},
    };
    for (const auto& [name, value] : expected)
        EXPECT_EQ(Stored(body, name), value);
}

// A truck as a group: a proxy with the parts "cab" and "box", whose files lie beside it, and one that is the group.
class MovableGroup : public MovableBody
{
protected:
    MovableGroup()
    {
        osg::ref_ptr<osg::ProxyNode> proxy = new osg::ProxyNode;
        const std::pair<const char*, const char*> parts[] = {
            {"cab", "cab.dae"}, {"box", "../parts/box.dae"}, {"self", "x/../truck.dae"}};
        for (unsigned i = 0; i < 3; ++i)
        {
            osg::ref_ptr<osg::Group> part = new osg::Group;
            part->setName(parts[i].first);
            proxy->addChild(part);
            proxy->setFileName(i, parts[i].second);
        }
        document.models.models[L"\\m\\truck.dae"] = fake::MakeModel(proxy);
        std::string text = "<vtattr:Object type='6'>";
        const auto add = [&](const std::string& head, const std::string& value) {
            text +=
                "<vtattr:Attribute name='" + head + "'><vtattr:value>" + value + "</vtattr:value></vtattr:Attribute>";
        };
        add("is_grouped", "1");
        add("child_count", "3");
        add("cab_name", "Cab");
        add("cab_position", "1 2 3");
        add("cab_rotation", "0 0 90");
        add("cab_scale", "1 2 3");
        add("cab_simulation_data_stream", "4");
        add("box_name", "Box");
        text += "<vtattr:Attribute name='child_ids'><vtattr:value>cab</vtattr:value><vtattr:value>box</vtattr:value>"
                "<vtattr:value>self</vtattr:value><vtattr:value>gone</vtattr:value></vtattr:Attribute>";
        document.models.descriptions[L"\\m\\truck.dae"] = text + "</vtattr:Object>";
    }

    VtC3DMovableBody& AddTruck()
    {
        return *new VtC3DMovableBody(document, *scene.GetMovableBodies(0), L"Truck", L"\\m\\truck.dae",
                                     osg::Matrixd::translate(100, 0, 0), true, nullptr, {});
    }
};

TEST_F(MovableGroup, BecomesPartsWithIdsOfTheirOwn)
{
    VtC3DMovableBody& truck = AddTruck();
    ASSERT_TRUE(truck.IsGrouped());
    ASSERT_EQ(truck.GetParts().size(), 2U) << "a group that holds itself, and a part without a model, have no body";
    VtC3DMovableBody& cab = *truck.GetParts()[0];
    EXPECT_EQ(cab.GetName(), L"Cab");
    EXPECT_EQ(cab.GetFilePath(), L"\\m\\cab.dae");
    EXPECT_EQ(truck.GetParts()[1]->GetFilePath(), L"\\parts\\box.dae");
    EXPECT_TRUE(cab.IsGroupChild());
    ASSERT_EQ(truck.GetChildIds().size(), 4U);
    EXPECT_EQ(truck.GetChildIds()[0], cab.GetInternalId());
    EXPECT_EQ(Stored(cab, L"parent_group_id"), truck.GetInternalId());

    const std::wstring id = cab.GetInternalId();
    EXPECT_EQ(truck.GetAttributeObject()->Find<std::vector<std::wstring>>(L"child_ids")->front(), id);
    EXPECT_EQ(Stored(truck, id + L"_position"), L"1 2 3");
    EXPECT_EQ(Stored(truck, id + L"_simulation_data_stream"), L"4");
    EXPECT_EQ(Stored(truck, id + L"_simulation_data_index"), L"Not connected");
    EXPECT_EQ(Stored(truck, L"cab_position"), L"missing");
    EXPECT_EQ(Stored(truck, L"cab_simulation_data_stream"), L"missing");
}

TEST_F(MovableGroup, PartsStandInTheGroupAndMoveByThemselves)
{
    VtC3DMovableBody& truck = AddTruck();
    VtC3DMovableBody& cab = *truck.GetParts()[0];
    // (1, 2, 3) in scene axes is (1, 3, -2) in the model's; the factors swap y and z; 90 degrees about the scene's z
    // are 90 about the model's y, which takes x to -z.
    ExpectNear(Placed(cab, {0, 0, 0}), {101, 3, -2});
    ExpectNear(Placed(cab, {1, 0, 0}), {101, 3, -3});
    ExpectNear(Placed(cab, {0, 1, 0}), {101, 6, -2});
    EXPECT_EQ(truck.GetTransform(), osg::Matrixd());

    truck.ConnectChannel(1, L"x");
    EXPECT_FALSE(truck.IsConnected());
    cab.ConnectChannel(1, L"x");
    EXPECT_TRUE(cab.IsConnected());

    truck.SetLastTransformMatrix(osg::Matrixd::translate(0, 0, 50));
    ExpectNear(Placed(cab, {0, 0, 0}), {1, 3, 48});
    EXPECT_EQ(truck.GetTransform(), osg::Matrixd());

    document.channels.channels = {L"a", L"b"};
    truck.UpdateConnectionState();
    EXPECT_EQ(cab.GetConnectionState(), VtC3DMovableBody::connected);
}

TEST_F(MovableGroup, AFrameMovesItsPartsInItsPlace)
{
    VtC3DMovableBody& first = AddMovable(L"First");
    VtC3DMovableBody& truck = AddTruck();
    VtC3DMovableBody& last = AddMovable(L"Last");
    const auto motion = [](const VtC3DMovableBody& body) { return &body.GetMotion(); };
    VtCMovableBodies& all = *scene.GetMovableBodies(0);
    EXPECT_EQ(all.GetMotions(), (std::vector<VtTBodyMotion*>{motion(first), motion(*truck.GetParts()[0]),
                                                             motion(*truck.GetParts()[1]), motion(last)}));
    truck.GetParts()[0]->Destroy();
    first.Destroy();
    EXPECT_EQ(all.GetMotions(), (std::vector<VtTBodyMotion*>{motion(*truck.GetParts()[0]), motion(last)}));
}

TEST_F(MovableGroup, EndsWithItsParts)
{
    VtC3DMovableBody& truck = AddTruck();
    const std::wstring cab = truck.GetParts()[0]->GetInternalId();
    const std::wstring id = truck.GetInternalId();
    scene.GetMovableBodies(0)->RemoveBody(id);
    EXPECT_EQ(document.store.GetObject(cab), nullptr);
    EXPECT_NE(document.store.GetObject(id), nullptr);
    EXPECT_EQ(scene.GetMovableBodiesNode()->getNumChildren(), 0U);
}

TEST_F(MovableGroup, WithoutPartsIsNoError)
{
    document.models.descriptions[L"\\m\\truck.dae"] =
        "<vtattr:Attribute name='is_grouped'><vtattr:value>1</vtattr:value></vtattr:Attribute>"
        "<vtattr:Attribute name='child_count'><vtattr:value>0</vtattr:value></vtattr:Attribute>"
        "<vtattr:Attribute name='child_ids'><vtattr:value>cab</vtattr:value></vtattr:Attribute>";
    EXPECT_TRUE(AddTruck().GetParts().empty());
}

} // namespace
