#include "hosts/console/ConsoleView.h"

#include <osg/Light>
#include <osg/LightSource>

#include "hosts/common/EglGraphics.h"
#include "hosts/common/Picture.h"
#include "hosts/console/ConsoleHost.h"
#include "render/Viewer.h"
#include "scene/Scene3D.h"

namespace console
{

namespace
{

constexpr std::uint32_t messageNoContext = 532; // %1 the reason

const osg::Vec4 skyBlue(200 / 255.0F, 230 / 255.0F, 1.0F, 1.0F);

osg::ref_ptr<osg::Light> HeadLight()
{
    osg::ref_ptr<osg::Light> light = new osg::Light;
    light->setLightNum(0);
    light->setAmbient(osg::Vec4(0.0F, 0.0F, 0.0F, 1.0F));
    light->setDiffuse(osg::Vec4(0.25F, 0.25F, 0.28F, 1.0F));
    light->setSpecular(osg::Vec4(0.0F, 0.0F, 0.0F, 1.0F));
    return light;
}

osg::ref_ptr<osg::LightSource> Sun()
{
    osg::ref_ptr<osg::Light> light = new osg::Light;
    light->setLightNum(1);
    light->setPosition(osg::Vec4(-0.45F, -0.6F, 0.66F, 0.0F)); // a direction: the last is 0
    light->setAmbient(osg::Vec4(0.50F, 0.52F, 0.56F, 1.0F));
    light->setDiffuse(osg::Vec4(1.00F, 0.97F, 0.90F, 1.0F));
    light->setSpecular(osg::Vec4(0.6F, 0.6F, 0.55F, 1.0F));
    osg::ref_ptr<osg::LightSource> source = new osg::LightSource;
    source->setLight(light);
    return source;
}

} // namespace

std::unique_ptr<ConsoleView> ConsoleView::Create(ConsoleHost& host, VtCScene3D& scene, const Size& size)
{
    std::unique_ptr<ConsoleView> made(new ConsoleView(size));
    createViewer();
    createSharedContext(made->window);
    if (getSharedContext())
        made->view = createView(made->window, made->window.GetClientRectangle());
    if (!made->view || !made->view->getCamera()->getGraphicsContext())
    {
        host.GetMessages().Show({.number = messageNoContext,
                                 .first = host.GetGraphics()->GetLastError(),
                                 .severity = host::Severity::error});
        return nullptr;
    }
    made->Light(scene);
    addViewToViewer(made->view.get());
    renderingEnabled = true;
    return made;
}

ConsoleView::~ConsoleView()
{
    removeViewFromViewer(view.get());
}

void ConsoleView::Light(VtCScene3D& scene)
{
    view->setLightingMode(osg::View::HEADLIGHT);
    view->setLight(HeadLight().get());
    view->getCamera()->setClearColor(skyBlue);

    const osg::ref_ptr<osg::Group> lit = new osg::Group;
    lit->addChild(scene.GetRootNode());
    lit->addChild(Sun());
    view->setSceneData(lit.get());
}

void ConsoleView::LookAt(const Triple& eye, const Triple& look)
{
    const osg::Vec3d from(eye[0], eye[1], eye[2]);
    const osg::Vec3d to(look[0], look[1], look[2]);
    // Straight up or down there is no "up" by z; then north is.
    const bool upright = (to - from) * osg::Vec3d(0, 0, 1) != (to - from).length() &&
                         (to - from) * osg::Vec3d(0, 0, 1) != -(to - from).length();
    view->getCamera()->setViewMatrixAsLookAt(from, to, upright ? osg::Vec3d(0, 0, 1) : osg::Vec3d(0, 1, 0));
}

osg::ref_ptr<osg::Image> ConsoleView::Read()
{
    return hosts::ReadPicture(*view->getCamera());
}

} // namespace console
