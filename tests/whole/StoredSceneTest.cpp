#include <algorithm>
#include <cstdlib>
#include <fstream>
#include <iterator>

#include <gtest/gtest.h>
#include <osg/Image>

#include "app/PanoramicDocument.h"
#include "base/Paths.h"
#include "hosts/common/EglGraphics.h"
#include "hosts/common/Picture.h"
#include "interaction/Observer.h"
#include "interaction/Observers.h"
#include "records/AttributeNames.h"
#include "render/ChildFrame.h"
#include "render/PanoramicView.h"
#include "render/Viewer.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "scene/StaticBody.h"
#include "tests/support/AppStages.h"
#include "tests/support/FakeHost.h"
#include "tests/support/FakeViews.h"
#include "tests/support/TemporaryFolder.h"

namespace
{

/// The application with the models of the example, drawing the first pane.
class StoredScene : public testing::Test
{
protected:
    StoredScene()
    {
        host.graphics = &graphics;
        host.viewWindows = &windows;
        windows.splitter.width = 644;
        windows.splitter.height = 484;
        const std::filesystem::path example = std::filesystem::path(PANORAMIC_SHARE) / "example";
        host.paths.module = base::InnerPath(PANORAMIC_BIN) + L"\\";
        host.paths.objects = base::InnerPath(example / "Vantor Objects" / "advanced");
        host.paths.customer = base::InnerPath(example / "Customer_Objects");
        fake::StartApplication(app);
    }
    ~StoredScene() override
    {
        host.documentManager.CloseActiveDocument();
        fake::StopApplication(app);
    }

    std::wstring Model(const char* file) const { return base::InnerPath(base::NativePath(host.paths.objects) / file); }

    osg::ref_ptr<osg::Image> Draw()
    {
        windows.Fire();
        renderingEnabled = true;
        app.RedrawNow();
        RenderViewerFrame();
        RenderViewerFrame();
        return hosts::ReadPicture(*document->GetChildFrame()->getSplitter().getView(1)->getView()->getCamera());
    }

    std::string Save(const char* name)
    {
        EXPECT_TRUE(document->OnSaveDocument(base::InnerPath(folder.path / name)));
        return TemporaryFolder::Read(folder.path / name);
    }

    fake::Host host;
    hosts::EglGraphics graphics;
    fake::ViewWindows windows;
    VtCPanoramicApp app{host};
    TemporaryFolder folder;
    VtCPanoramicDocument* document = nullptr;
};

/// How many of 1000 pixels differ by more than an eye could see.
double Difference(const osg::Image& a, const osg::Image& b)
{
    int differing = 0;
    for (int y = 0; y < a.t(); ++y)
        for (int x = 0; x < a.s(); ++x)
        {
            const auto at = [&](const osg::Image& image)
            { return image.getColor(static_cast<unsigned>(x), static_cast<unsigned>(y)); };
            differing += (at(a) - at(b)).length() > 0.03F;
        }
    return 1000.0 * differing / (a.s() * a.t());
}

} // namespace

TEST_F(StoredScene, LooksAsItLookedWhenItWasStored)
{
    document = dynamic_cast<VtCPanoramicDocument*>(host.documentManager.NewDocument());
    ASSERT_TRUE(document);
    VtCScene3D& scene = *document->GetScene();
    const auto make = [&](const wchar_t* name, float x, float y)
    {
        auto* car = new VtC3DMovableBody(*document, *scene.GetMovableBodies(0), name,
                                         Model("Vehicles/$Sedan/Sedan.dae"), osg::Matrixd(), true, nullptr, {});
        car->SetLastTransformMatrix(osg::Matrixd::translate(x, y, 0));
        return car;
    };
    make(L"gouraud", 0, 0)->SetRenderMode(VtERenderMode::Gouraud);
    make(L"flat", 0, 3)->SetRenderMode(VtERenderMode::Flat);
    make(L"wire", 0, 6)->SetRenderMode(VtERenderMode::WireFrame);
    VtC3DMovableBody& glassy = *make(L"glassy", 6, 0);
    glassy.GetAttributeObject()->Write(attribute::transparency, 0.6F); // in the wrong order
    glassy.SetRenderMode(VtERenderMode::Transparent);
    make(L"green", 6, 3)->SetDye(0, 1, 0);
    VtC3DMovableBody& turned = *make(L"turned", 6, 6);
    turned.SetRotationZ(40);
    turned.SetScaleX(130);
    turned.SetCenterZ(0.5F);
    turned.SetLastTransformMatrix(osg::Matrixd::translate(6, 6, 0));
    auto* house = new VtC3DStaticBody(*document, *scene.GetStaticBodies(), L"House",
                                      Model("Buildings/$House/House.dae"), osg::Matrixd(), true, {});
    house->SetScaleOrientation(osg::Vec3f(10, 0, 20));
    house->SetScaleX(60);
    house->SetRotationY(25);
    house->SetPositionX(18);
    house->SetTransparency(0.4F);
    house->SetRenderMode(VtERenderMode::Transparent);
    VtC3DObserver& free = *document->GetObservers().GetFree1();
    const osg::Matrixd look = osg::Matrixd::lookAt(osg::Vec3d(-12, 2, 9), osg::Vec3d(6, 3, 0), osg::Vec3d(0, 0, 1));
    free.StoreFreeView(osg::Vec3f(-12, 2, 9), osg::Matrixd::inverse(look).getRotate());
    free.PushViewMatrix();
    document->GetChildFrame()->getSplitter().getView(1)->setViewAngle(30);
    document->GetChildFrame()->getSplitter().getView(1)->setFarClipPlane(200);

    const osg::ref_ptr<osg::Image> before = Draw();
    ASSERT_TRUE(before);
    const std::string first = Save("first.xml");
    host.documentManager.CloseActiveDocument();
    document = dynamic_cast<VtCPanoramicDocument*>(
        host.documentManager.OpenDocument(base::InnerPath(folder.path / "first.xml")));
    ASSERT_TRUE(document);
    const osg::ref_ptr<osg::Image> after = Draw();
    ASSERT_TRUE(after);
    if (const char* shots = std::getenv("PANORAMIC_SHOTS"))
    {
        hosts::WritePicture(*before, std::filesystem::path(shots) / "before.png");
        hosts::WritePicture(*after, std::filesystem::path(shots) / "after.png");
    }
    EXPECT_LT(Difference(*before, *after), 1.0);
    EXPECT_EQ(Save("second.xml"), first);
}
