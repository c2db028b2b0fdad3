#include <gtest/gtest.h>

#include <osg/Geode>
#include <osg/ShapeDrawable>

#include "app/PanoramicDocument.h"
#include "base/Paths.h"
#include "hosts/common/EglGraphics.h"
#include "hosts/common/OffscreenViews.h"
#include "hosts/common/Picture.h"
#include "render/Viewer.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "simdata/points/MotionDataReader.h"
#include "simdata/SimulationDataController.h"
#include "simdata/SimulationDataRouter.h"
#include "tests/support/AppStages.h"
#include "tests/support/FakeHost.h"

namespace
{

// The application with the real modules of data points, a real graphics context and a clock that the test moves.
class WholeWay : public testing::Test
{
protected:
    WholeWay()
    {
        host.graphics = &graphics;
        host.paths.module = base::InnerPath(PANORAMIC_BIN) + L"\\";
        fake::StartApplication(app);
        document = dynamic_cast<VtCPanoramicDocument*>(host.documentManager.NewDocument());
    }

    ~WholeWay() override
    {
        if (view)
            removeViewFromViewer(view.get());
        view = nullptr;
        host.documentManager.CloseActiveDocument();
        fake::StopApplication(app);
    }

    // A red box of 4 x 2 x 1 m that follows the first channel.
    VtC3DMovableBody& AddCar()
    {
        osg::ref_ptr<osg::ShapeDrawable> box = new osg::ShapeDrawable(new osg::Box(osg::Vec3(0, 0.5F, 0), 4, 1, 2));
        box->setColor(osg::Vec4(1, 0, 0, 1));
        box->getOrCreateStateSet()->setMode(GL_LIGHTING, osg::StateAttribute::OFF);
        osg::ref_ptr<osg::Geode> geode = new osg::Geode;
        geode->addDrawable(box);
        osg::ref_ptr<osg::Group> model = new osg::Group;
        model->addChild(geode);
        auto* car = new VtC3DMovableBody(*document, *document->GetScene()->GetMovableBodies(0), L"Car", L"",
                                         osg::Matrixd(), true, model.get(), {});
        car->ConnectChannel(0, {});
        return *car;
    }

    void OpenView()
    {
        createViewer();
        createSharedContext(window);
        view = createView(window, window.GetClientRectangle());
        view->setSceneData(document->GetScene()->GetRootNode());
        addViewToViewer(view.get());
        renderingEnabled = true;
    }

    // Is the picture's pixel red, at fractions from the lower left?
    static bool IsRed(const osg::Image& picture, double x, double y)
    {
        const osg::Vec4 colour = picture.getColor(static_cast<unsigned>(x * (picture.s() - 1)),
                                                  static_cast<unsigned>(y * (picture.t() - 1)));
        return colour.r() > 0.8F && colour.g() < 0.3F && colour.b() < 0.3F;
    }

    VtCSimulationDataRouter& Router() { return app.GetController()->GetRouter(); }
    void Step(double seconds)
    {
        host.clock.Advance(seconds);
        host.variables.idle.Raise();
    }

    fake::Host host;
    hosts::EglGraphics graphics;
    hosts::OffscreenWindow window{120, 120};
    VtCPanoramicApp app{host};
    VtCPanoramicDocument* document = nullptr;
    osg::ref_ptr<osgViewer::View> view;
};

} // namespace

TEST_F(WholeWay, ARecordedRunPutsTheCarWhereItsDataSay)
{
    const std::filesystem::path run = std::filesystem::path(PANORAMIC_SHARE) / "example" / "run.mdf";
    SimulationDataPoints::VtCMotionDataReader reader(run);
    ASSERT_TRUE(reader.Open());
    const auto expected = reader.LoadFrames(nullptr, -1);
    ASSERT_TRUE(expected);

    AddCar();
    OpenView();
    Router().SelectPoint(L"File");
    ASSERT_TRUE(Router().FindPoint(L"File")->Configure(L"MDF", base::InnerPath(run), 1, 0));
    app.GetController()->GotoFirst();
    app.GetController()->PlayOnce();

    double now = 0.0;
    for (const double time : {5.0, 20.0, 40.0})
    {
        SCOPED_TRACE(time);
        float at[3];
        float turn[3][3];
        expected->GetAtTime(time + 0.001, 0)->GetSimulationData(0)->GetVector(at);
        expected->GetAtTime(time + 0.001, 0)->GetSimulationData(0)->GetMatrix3x3(turn);
        const osg::Vec3d car(at[0], at[1], at[2]);
        const osg::Vec3d forward(turn[0][0], turn[1][0], 0);
        // From 12 m above, with the car's nose to the top: 4 m of length stand upright in the picture, 2 m of width
        // across.
        view->getCamera()->setViewMatrixAsLookAt(car + osg::Vec3d(0, 0, 12), car, forward);
        Step(time + 0.001 - now);
        now = time + 0.001;
        const osg::ref_ptr<osg::Image> picture = hosts::ReadPicture(*view->getCamera());
        ASSERT_TRUE(picture);
        EXPECT_TRUE(IsRed(*picture, 0.5, 0.5));
        EXPECT_TRUE(IsRed(*picture, 0.5, 0.57)) << "its length lies along its heading";
        EXPECT_FALSE(IsRed(*picture, 0.63, 0.5)) << "its width across";
        EXPECT_FALSE(IsRed(*picture, 0.05, 0.05));
        EXPECT_FALSE(IsRed(*picture, 0.95, 0.95));
    }
    Step(60.0);
    EXPECT_FALSE(app.GetController()->HasPlayState()) << "the run has ended";
}

TEST_F(WholeWay, OnlineASourceThatFailsIsTriedAgainAfterFiveSeconds)
{
    const VtC3DMovableBody& car = AddCar();
    Router().SelectPoint(L"OffSim");
    ASSERT_TRUE(Router().FindPoint(L"OffSim")->Configure(L"OffSim", L"seed=7;fail=3;recover=8", 1, 0));
    app.StartSimulation();
    ASSERT_TRUE(app.IsRunning());
    const auto place = [&] { return car.GetLastTransformMatrix().getTrans(); };

    Step(0.5);
    const osg::Vec3d start = place();
    Step(2.0);
    const osg::Vec3d driving = place();
    EXPECT_GT((driving - start).length(), 0.5) << "the car pulls away";

    Step(1.0); // 3.5 s: the source has failed
    EXPECT_EQ(place(), driving);
    EXPECT_TRUE(app.IsRunning()) << "a failure doesn't end the run";
    Step(5.1); // the source is back, and the retry is due
    EXPECT_GT((place() - driving).length(), 5.0);

    app.StopSimulation();
    EXPECT_FALSE(app.IsRunning());
    const osg::Vec3d stopped = place();
    Step(1.0);
    EXPECT_EQ(place(), stopped);
}
