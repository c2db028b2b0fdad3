#include <gtest/gtest.h>

#include "app/PanoramicDocument.h"
#include "base/IniFile.h"
#include "base/Paths.h"
#include "base/Text.h"
#include "hosts/common/EglGraphics.h"
#include "interaction/Observer.h"
#include "interaction/Observers.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "tests/support/AppStages.h"
#include "tests/support/FakeHost.h"

namespace
{

constexpr std::uint32_t textFollowModes = 6221;

// Where `point` of the scene is for the observer: to the right, up, and behind the eye.
osg::Vec3d Seen(const VtC3DObserver& observer, const osg::Vec3d& point)
{
    return point * observer.GetViewMatrix();
}

} // namespace

TEST(DefaultObservers, EveryOneThatIsShippedRidesOnItsVehicleAndLooksAtItOrAhead)
{
    fake::Host host;
    hosts::EglGraphics graphics;
    host.graphics = &graphics;
    host.paths.module = base::InnerPath(PANORAMIC_BIN) + L"\\";
    const base::IniFile texts(std::filesystem::path(PANORAMIC_SHARE) / "texts" / "en.ini");
    host.texts.known[textFollowModes] = base::Wide(texts.Find("texts", std::to_string(textFollowModes)).value_or(""));
    VtCPanoramicApp app(host);
    fake::StartApplication(app);
    auto* document = dynamic_cast<VtCPanoramicDocument*>(host.documentManager.NewDocument());
    ASSERT_TRUE(document);

    auto* car = new VtC3DMovableBody(*document, *document->GetScene()->GetMovableBodies(0), L"Sedan.dae", L"",
                                     osg::Matrixd(), true, nullptr, {});
    const osg::Vec3d place(100, 50, 0);
    car->SetLastTransformMatrix(osg::Matrixd::translate(place));
    VtC3DObservers& observers = document->GetObservers();
    observers.GenerateDefaultObservers(L"Sedan.dae");
    const std::vector<VtC3DObserver*> all = observers.GetObservers();
    ASSERT_EQ(all.size(), 2u + 6u);

    const osg::ref_ptr<osg::Camera> camera = new osg::Camera;
    const osg::Vec3d middle = place + osg::Vec3d(0, 0, 0.7);
    const osg::Vec3d farAhead = place + osg::Vec3d(1000, 0, 0);
    for (VtC3DObserver* observer : all)
    {
        if (observers.IsFreeObserver(*observer))
            continue;
        SCOPED_TRACE(base::Utf8(observer->GetName()));
        EXPECT_TRUE(observer->GetName().starts_with(L"Sedan "));
        EXPECT_TRUE(observer->IsValidConfiguration());
        EXPECT_EQ(observer->GetConnectedBody(), car);

        observer->AddCamera(camera.get());
        observer->SetAssigned(true);
        observer->Update();
        observer->RemoveCamera(camera.get());
        EXPECT_LT((osg::Vec3d(observer->GetPosition()) - place).length(), 50.0);
        const osg::Vec3d target = Seen(*observer, observer->GetName() == L"Sedan Driver" ? farAhead : middle);
        EXPECT_LT(target.z(), -2.0) << "in front of the eye";
        EXPECT_LT(std::abs(target.x() / target.z()), 0.45);
        EXPECT_LT(std::abs(target.y() / target.z()), 0.2);
    }

    host.documentManager.CloseActiveDocument();
    fake::StopApplication(app);
}
