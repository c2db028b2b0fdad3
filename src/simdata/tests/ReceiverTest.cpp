#include "simdata/SimulationDataReceiver.h"

#include <osg/ProxyNode>

#include "base/Text.h"
#include "records/ObjectText.h"
#include "scene/MovableBodies.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "simdata/tests/SimulationFixture.h"
#include "tests/support/FakeScene.h"
#include "tests/support/HeapCount.h"

using namespace simtest;
using SimulationDataPoints::VtCFrameRecord;
using SimulationDataPoints::VtCSimulationDataFrame;
using SimulationDataPoints::VtCSimulationDataTracker;

namespace
{

/// "Live" is the active point; its frame n has its bodies at x = n and the stream "Speed" at n.
class Receiver : public SimulationTest
{
protected:
    Receiver() : scene3D(document), receiver(scene), listener(log)
    {
        document.services.channels = &router;
        scene.scene = &scene3D;
        scene.instruments = &instruments;
        router.AddReceiver(&receiver);
        router.SelectPoint(L"Live");
        router.AddChangeObject(&listener);
        log.clear();
    }
    ~Receiver() override
    {
        router.RemoveChangeObject(&listener);
        router.RemoveReceiver(&receiver);
    }

    VtC3DMovableBody& AddBody(std::int32_t channel, std::int32_t collection = 0, const std::wstring& path = L"car")
    {
        auto* body = new VtC3DMovableBody(document, *scene3D.GetMovableBodies(collection), L"Body", path,
                                          osg::Matrixd(), true, nullptr, L"");
        body->ConnectChannel(channel, L"");
        return *body;
    }

    /// A body whose model is a group of two parts.
    VtC3DMovableBody& AddGroup()
    {
        osg::ref_ptr<osg::ProxyNode> proxy = new osg::ProxyNode;
        for (unsigned part = 0; part < 2; ++part)
        {
            proxy->addChild(new osg::Group);
            proxy->getChild(part)->setName(part == 0 ? "left" : "right");
            proxy->setFileName(part, "/lib/part.dae");
        }
        const auto record = document.store.ParseObject(document.store.GetDefaultText(7)).object;
        record->Write(L"is_grouped", std::int32_t{1});
        record->Write(L"child_count", std::int32_t{2});
        record->Write(L"child_ids", std::vector<std::wstring>{L"left", L"right"});
        document.models.models[L"group"] = fake::MakeModel(proxy);
        document.models.descriptions[L"group"] = base::Utf8(WriteObjectText(*record));
        return AddBody(-1, 0, L"group");
    }

    /// The one frame of a new buffer of poses alone, with m[row][column] = 100 pose + 10 row + column.
    VtCSimulationDataFrame* NumberedFrame(std::size_t poses)
    {
        std::vector<std::wstring> names;
        for (std::size_t i = 0; i < poses; ++i)
            names.push_back(L"Pose " + std::to_wstring(i));
        live.SetChannels(names);
        live.StartBuffer();
        VtCFrameRecord record = live.AppendFrame(0.0);
        for (std::size_t pose = 0; pose < poses; ++pose)
        {
            float m[4][4];
            for (int row = 0; row < 4; ++row)
                for (int column = 0; column < 4; ++column)
                    m[row][column] = static_cast<float>(100 * static_cast<int>(pose) + 10 * row + column);
            record.SetPose(pose, m);
        }
        unsigned long number = 0;
        return live.GetRecent(number);
    }

    void Apply(std::initializer_list<VtCSimulationDataFrame*> frames, const VtTChannelLists& channels = {})
    {
        VtCSimulationDataTracker tracker;
        for (VtCSimulationDataFrame* frame : frames)
            tracker.AddTail(frame);
        receiver.ApplyFrames(tracker, channels);
    }

    static double X(const VtC3DMovableBody& body) { return body.GetLastTransformMatrix()(3, 0); }

    fake::SceneDocument document;
    VtCScene3D scene3D;
    Instruments instruments;
    VtCSimulationDataReceiver receiver;
    Listener listener;
};

TEST_F(Receiver, TransposesTheMatrix)
{
    VtC3DMovableBody& body = AddBody(1);
    Apply({NumberedFrame(2)});
    // Column c of the data is row c here, so 101 stands in the second row; the last element counts as 1.
    const osg::Matrixd expected(100, 110, 120, 130, 101, 111, 121, 131, 102, 112, 122, 132, 103, 113, 123, 1);
    EXPECT_EQ(body.GetLastTransformMatrix(), expected);
    EXPECT_EQ(body.GetTransform().getTrans(), osg::Vec3d(103, 113, 123)) << "it arrives at the node";
}

TEST_F(Receiver, LeavesBodiesWithoutDataWhereTheyAre)
{
    VtC3DMovableBody& unbound = AddBody(-1);
    VtC3DMovableBody& beyond = AddBody(3);
    VtC3DMovableBody& bound = AddBody(0);
    router.GotoFrame({}, 2);
    EXPECT_EQ(X(unbound), 0.0);
    EXPECT_EQ(X(beyond), 0.0) << "the frame has three channels";
    EXPECT_EQ(X(bound), 2.0);
    scene.scene = nullptr;
    EXPECT_TRUE(router.GotoFirst()) << "without a scene there is nothing to do";
    EXPECT_EQ(X(bound), 2.0);
}

TEST_F(Receiver, MovesThePartsOfAGroupAndNotTheGroup)
{
    VtC3DMovableBody& group = AddGroup();
    ASSERT_EQ(group.GetParts().size(), 2U);
    group.GetParts()[1]->ConnectChannel(0, L"");
    router.GotoFrame({}, 3);
    EXPECT_EQ(X(*group.GetParts()[0]), 0.0);
    EXPECT_EQ(X(*group.GetParts()[1]), 3.0);
    EXPECT_TRUE(group.GetTransform().isIdentity());
}

TEST_F(Receiver, MovesEachTrackByItsOwnFrame)
{
    ASSERT_NE(scene3D.AddTrackBodies(false, nullptr, 1), nullptr);
    VtC3DMovableBody& own = AddBody(0);
    VtC3DMovableBody& clone = AddBody(0, 1);
    VtC3DMovableBody& unbound = AddBody(-1, 1);
    Instrument& speed = instruments.Add(L"Speed");

    const auto frame = [&](unsigned long number, unsigned long track)
    {
        live.SetRecent(number);
        VtCSimulationDataFrame* found = live.GetRecent(number);
        found->SetTrackID(track);
        return found;
    };
    const VtTChannelLists& channels = router.GetActiveChannels();
    Apply({frame(1, 0), frame(2, 1)}, channels);
    EXPECT_EQ(X(own), 1.0);
    EXPECT_EQ(X(clone), 2.0);
    EXPECT_EQ(X(unbound), 0.0);
    EXPECT_EQ(speed.value.value, 1.0) << "fed by the head frame alone";

    Apply({frame(3, 0), frame(1, 7), frame(4, 1)}, channels);
    EXPECT_EQ(X(own), 3.0);
    EXPECT_EQ(X(clone), 2.0) << "the track 7 doesn't exist, and what stands behind it isn't reached";
    EXPECT_EQ(speed.value.value, 3.0) << "instruments are served all the same";
}

TEST_F(Receiver, FeedsInstrumentsByName)
{
    Instrument& speed = instruments.Add(L"sPEED");
    Instrument& unknown = instruments.Add(L"Fuel");
    router.GotoFrame({}, 4);
    EXPECT_EQ(speed.value.value, 4.0);
    EXPECT_EQ(speed.value.type, 10);
    EXPECT_EQ(unknown.value.value, 0.0) << "at once, not its last value";
    EXPECT_EQ(unknown.value.type, 10);

    // What was found by name is looked for again when a name or the streams change.
    speed.signal = L"Fuel";
    unknown.signal = L"Speed";
    router.GotoFrame({}, 3);
    EXPECT_EQ(speed.value.value, 0.0);
    EXPECT_EQ(unknown.value.value, 3.0);

    live.SetChannels({L"Body"}, {L"Other", L"Fuel"});
    live.Fill({0.0, 0.1});
    router.GotoFrame({}, 2); // nobody told the router: the frame itself shows that it is another
    EXPECT_EQ(speed.value.value, 2.0);
    EXPECT_EQ(unknown.value.value, 0.0);
    unknown.signal = L"Pose";
    Apply({NumberedFrame(2)}, VtTChannelLists{{}, {{L"Pose", {}}}, 77});
    EXPECT_EQ(unknown.value.value, 0.0) << "a stream that is a pose";
    EXPECT_EQ(unknown.value.type, 10);
}

TEST_F(Receiver, FeedsOlderInstrumentsFromTheLastTwoChannels)
{
    struct Case
    {
        std::int32_t stream;
        double ofThree, ofOne; ///< values for a frame of three channels, and of one
    };
    // The channels 1 and 2 hold 100 and 200 plus ten times the row plus the column; three columns are counted.
    const Case cases[] = {
        {1, 100, 0},   {2, 101, 0},  {5, 111, 0},    {12, 132, 0}, {13, 200, 0}, {14, 201, 1},
        {24, 232, 32}, {25, 200, 0}, {26, 0.0, 0.0}, {0, 0, 0},    {-7, 0, 0},
    };
    for (const Case& c : cases)
        instruments.Add(L"", c.stream);
    instruments.mode = VtEInstrumentDataMode::LegacyStreams;

    Apply({NumberedFrame(3)});
    for (std::size_t i = 0; i < std::size(cases); ++i)
        EXPECT_EQ(instruments.owned[i]->value.value, cases[i].ofThree) << "stream " << cases[i].stream;
    Apply({NumberedFrame(1)});
    for (std::size_t i = 0; i < std::size(cases); ++i)
        EXPECT_EQ(instruments.owned[i]->value.value, cases[i].ofOne) << "stream " << cases[i].stream;

    const int writes = instruments.owned[0]->writes;
    instruments.mode = VtEInstrumentDataMode::SignalNames;
    Apply({NumberedFrame(3)});
    EXPECT_EQ(instruments.owned[0]->writes, writes) << "without names they keep their values";
}

TEST_F(Receiver, IsServedBeforeTheListenersInReplayAndAfterThemOnline)
{
    instruments.Add(L"Speed").log = &log;
    router.GotoFrame({}, 2);
    EXPECT_EQ(Taken(), (Log{"apply 2", "frame 2 1.01"}));
    router.StepBack();
    EXPECT_EQ(Taken(), (Log{"apply 1", "frame 1"}));
    router.FetchFrames();
    EXPECT_EQ(Taken(), (Log{"frame 4 1.04", "apply 4"}));
    live.AppendAt(1.05);
    router.FetchFrames();
    EXPECT_EQ(Taken(), (Log{"frame 5 1.05", "apply 5"})) << "the newest frame heads the delivery, not an older one";
    live.streams = false;
    router.FetchFrames();
    EXPECT_EQ(Taken(), (Log{"no frame"}));

    VtCSimulationDataReceiver second(scene);
    router.AddReceiver(&second);
    router.GotoFrame({}, 3);
    EXPECT_EQ(Taken(), (Log{"apply 3", "apply 3", "frame 3 1.02"})) << "once for each document";
    EXPECT_EQ(router.GetPointNames(VtCSimulationDataRouter::scene), (std::vector<std::wstring>{L"Scene3D"}));
    router.RemoveReceiver(&second);
}

TEST_F(Receiver, HasLinkStatesFollowTheDataPoint)
{
    VtC3DMovableBody& body = AddBody(1);
    EXPECT_EQ(body.GetConnectionState(), VtC3DMovableBody::connected);
    Add(L"Small").SetChannels({L"Body"});
    router.SelectPoint(L"Small");
    EXPECT_EQ(body.GetConnectionState(), VtC3DMovableBody::channelMissing) << "it has the channel 0 alone";
    router.SelectPoint(L"Live");
    EXPECT_EQ(body.GetConnectionState(), VtC3DMovableBody::connected);
    live.SetChannels({L"Body"});
    router.RefreshChannelLists(1);
    EXPECT_EQ(body.GetConnectionState(), VtC3DMovableBody::channelMissing) << "refreshed by hand";
    router.Clear();
    EXPECT_EQ(body.GetConnectionState(), VtC3DMovableBody::channelMissing);
}

TEST_F(Receiver, StepsWithoutTheHeap)
{
    for (const std::int32_t channel : {0, 1, -1})
        AddBody(channel);
    AddGroup();
    instruments.Add(L"Speed");
    instruments.Add(L"Unknown");
    router.RemoveChangeObject(&listener); // it writes texts

    const auto count = [&]
    {
        controller.Step();
        heap::Count allocations;
        for (int i = 0; i < 50; ++i)
        {
            clock.Advance(0.003);
            controller.Step();
        }
        return allocations.Stop();
    };
    controller.PlayLoop();
    EXPECT_EQ(count(), 0) << "in a loop";
    controller.StopPlay();
    controller.Start();
    EXPECT_EQ(count(), 0) << "online";
}

} // namespace
