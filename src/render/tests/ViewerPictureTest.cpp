#include <osg/Stencil>

#include "render/tests/TestScenes.h"
#include "tests/support/OffscreenFixture.h"

namespace
{

using ViewerPicture = OffscreenFixture;

const osg::Vec3d eye(0, -6, 2);

TEST_F(ViewerPicture, ShowsLitBoxesWhereTheyStand)
{
    osgViewer::View& view = AddView(scenes::Boxes(), 320, 180);
    LookAt(view, eye, osg::Vec3d());
    view.getCamera()->setClearColor(osg::Vec4(200 / 255.0f, 230 / 255.0f, 1, 1));
    const osg::ref_ptr<osg::Image> picture = Draw(view);
    ASSERT_TRUE(picture);

    const Colour sky = Mean(*picture, 0, 0.8, 1, 1);
    EXPECT_NEAR(200, sky.red, 1);
    EXPECT_NEAR(230, sky.green, 1);
    EXPECT_NEAR(255, sky.blue, 1);
    const Colour red = Mean(*picture, 0.2, 0.4, 0.3, 0.5);
    const Colour green = Mean(*picture, 0.45, 0.4, 0.55, 0.5);
    const Colour blue = Mean(*picture, 0.7, 0.4, 0.8, 0.5);
    EXPECT_TRUE(red.red > 180 && red.green < 30 && red.blue < 30);
    EXPECT_TRUE(green.green > 180 && green.red < 30 && green.blue < 30);
    EXPECT_TRUE(blue.blue > 180 && blue.red < 30 && blue.green < 30);
    const Colour lid = Mean(*picture, 0.45, 0.62, 0.55, 0.65);
    EXPECT_TRUE(lid.green > 20 && lid.green < green.green - 60) << "the light comes from the eye, so the lid is darker";
}

TEST_F(ViewerPicture, IsTheSameForTheSameSceneUnderANewRootContext)
{
    const osg::ref_ptr<osg::Group> scene = scenes::Boxes();
    scene->getOrCreateStateSet()->setAttributeAndModes(
        scenes::Program("#version 120\nvoid main() { gl_FragColor = gl_Color; }"));
    const auto draw = [&]
    {
        osgViewer::View& view = AddView(scene, 320, 180);
        LookAt(view, eye, osg::Vec3d());
        return Draw(view);
    };
    const osg::ref_ptr<osg::Image> first = draw();
    // The models outlive the contexts, as they do from one document to the next.
    destroyViewer();
    views.clear();
    createViewer();
    createSharedContext(rootWindow);
    const osg::ref_ptr<osg::Image> second = draw();
    ASSERT_TRUE(first && second);
    EXPECT_EQ(0, CountDifferent(*first, *second));
    const Colour whole = Mean(*first, 0, 0, 1, 1);
    EXPECT_GT(whole.red, 40) << "there is something to be seen";
}

TEST_F(ViewerPicture, SharesObjectsAmongViewsAndOutlivesAResize)
{
    const osg::ref_ptr<osg::Group> scene = scenes::Boxes();
    scene->getOrCreateStateSet()->setAttributeAndModes(
        scenes::Program("#version 120\nvoid main() { gl_FragColor = gl_Color; }"));
    osgViewer::View& small = AddView(scene, 160, 90);
    osgViewer::View& other = AddView(scene, 160, 90);
    LookAt(small, eye, osg::Vec3d());
    LookAt(other, eye, osg::Vec3d());
    const osg::ref_ptr<osg::Image> before = Draw(small);
    const osg::ref_ptr<osg::Image> beside = Read(other);
    ASSERT_TRUE(before && beside);
    EXPECT_EQ(0, CountDifferent(*before, *beside));
    const auto contextId = [](osgViewer::View& view)
    { return view.getCamera()->getGraphicsContext()->getState()->getContextID(); };
    EXPECT_EQ(getSharedContext()->getState()->getContextID(), contextId(small));
    EXPECT_EQ(contextId(small), contextId(other));

    windows.front()->Resize(320, 180);
    small.getCamera()->setGraphicsContext(createViewContext(*windows.front()).get());
    small.getCamera()->setViewport(0, 0, 320, 180);
    const osg::ref_ptr<osg::Image> after = Draw(small);
    ASSERT_TRUE(after);
    EXPECT_EQ(320, after->s());
    EXPECT_GT(Mean(*after, 0.7, 0.4, 0.8, 0.5).blue, 180);
    EXPECT_EQ(0, CountDifferent(*before, *Read(other))) << "the other pane noticed nothing";
}

TEST_F(ViewerPicture, DrawsAProgramOfTheOldLanguage)
{
    const osg::ref_ptr<osg::Geode> square = scenes::Square(osg::Vec2(), 0, 4, osg::Vec4(1, 1, 1, 1));
    square->getOrCreateStateSet()->setAttributeAndModes(
        scenes::Program("#version 120\nvoid main() { gl_FragColor = vec4(gl_Color.r, 0.0, 0.5, 1.0); }"));
    osgViewer::View& view = AddView(square, 64, 64);
    LookAt(view, osg::Vec3d(0, -4, 0), osg::Vec3d());
    const osg::ref_ptr<osg::Image> picture = Draw(view);
    ASSERT_TRUE(picture);
    const Colour middle = Mean(*picture, 0.4, 0.4, 0.6, 0.6);
    EXPECT_NEAR(255, middle.red, 1);
    EXPECT_NEAR(0, middle.green, 1);
    EXPECT_NEAR(127.5, middle.blue, 1);
}

// A mask that moves from left to right hides the square behind it only where it stands now.
TEST_F(ViewerPicture, ForgetsTheStencilOfTheLastFrame)
{
    osg::ref_ptr<osg::Group> scene = new osg::Group;
    osg::ref_ptr<osg::MatrixTransform> mover = new osg::MatrixTransform;
    const osg::ref_ptr<osg::Geode> mask = scenes::Square(osg::Vec2(), -1, 1, osg::Vec4(1, 0, 0, 1));
    const osg::ref_ptr<osg::Geode> wall = scenes::Square(osg::Vec2(), -2, 8, osg::Vec4(0, 0, 1, 1));
    osg::ref_ptr<osg::Stencil> marks = new osg::Stencil;
    marks->setFunction(osg::Stencil::ALWAYS, 1, ~0u);
    marks->setOperation(osg::Stencil::KEEP, osg::Stencil::KEEP, osg::Stencil::REPLACE);
    mask->getOrCreateStateSet()->setAttributeAndModes(marks);
    mask->getStateSet()->setRenderBinDetails(1, "RenderBin");
    osg::ref_ptr<osg::Stencil> avoids = new osg::Stencil;
    avoids->setFunction(osg::Stencil::EQUAL, 0, ~0u);
    wall->getOrCreateStateSet()->setAttributeAndModes(avoids);
    wall->getStateSet()->setRenderBinDetails(2, "RenderBin");
    mover->addChild(mask);
    scene->addChild(mover);
    scene->addChild(wall);
    osgViewer::View& view = AddView(scene, 100, 100);
    LookAt(view, osg::Vec3d(0, -5, 0), osg::Vec3d());

    mover->setMatrix(osg::Matrixd::translate(-1.5, 0, 0));
    const osg::ref_ptr<osg::Image> left = Draw(view);
    mover->setMatrix(osg::Matrixd::translate(1.5, 0, 0));
    const osg::ref_ptr<osg::Image> right = Draw(view);
    ASSERT_TRUE(left && right);
    EXPECT_GT(Mean(*left, 0.25, 0.48, 0.29, 0.52).red, 250);
    EXPECT_GT(Mean(*right, 0.25, 0.48, 0.29, 0.52).blue, 250);
    EXPECT_GT(Mean(*right, 0.71, 0.48, 0.75, 0.52).red, 250);
}

TEST_F(ViewerPicture, SmoothsEdgesWhenTheHostWantsMultisampling)
{
    for (const bool wanted : {false, true})
    {
        services.multisampling = [wanted] { return wanted; };
        setViewerServices(services);
        createSharedContext(rootWindow);
        osg::ref_ptr<osg::MatrixTransform> turned = new osg::MatrixTransform;
        turned->setMatrix(osg::Matrixd::rotate(0.3, osg::Vec3d(0, 1, 0)));
        turned->addChild(scenes::Square(osg::Vec2(), 0, 3, osg::Vec4(1, 1, 1, 1)));
        osgViewer::View& view = AddView(turned, 100, 100);
        LookAt(view, osg::Vec3d(0, -4, 0), osg::Vec3d());
        view.getCamera()->setClearColor(osg::Vec4(0, 0, 0, 1));
        const osg::ref_ptr<osg::Image> picture = Draw(view);
        ASSERT_TRUE(picture);

        int between = 0;
        for (int pixel = 0; pixel < 100 * 100; ++pixel)
        {
            const int red = picture->data()[pixel * 3];
            between += red > 5 && red < 250;
        }
        if (wanted)
            EXPECT_GT(between, 100) << "four edges of some 45 pixels each";
        else
            EXPECT_EQ(0, between);
    }
}

} // namespace
