#include <set>

#include <osg/Stats>

#include "render/tests/TestScenes.h"
#include "tests/support/OffscreenFixture.h"

namespace
{

using ViewerStatistics = OffscreenFixture;

/// One geometry of 30 vertices around the origin, drawn as `sets`.
osg::ref_ptr<osg::Geode> Geometry(const std::vector<std::pair<GLenum, int>>& sets)
{
    osg::ref_ptr<osg::Geometry> geometry = new osg::Geometry;
    osg::ref_ptr<osg::Vec3Array> vertices = new osg::Vec3Array;
    for (int index = 0; index < 30; ++index)
        vertices->push_back(osg::Vec3(std::sin(float(index)), 0, std::cos(float(index))));
    geometry->setVertexArray(vertices);
    for (const auto& [mode, count] : sets)
        geometry->addPrimitiveSet(new osg::DrawArrays(mode, 0, count));
    osg::ref_ptr<osg::Geode> geode = new osg::Geode;
    geode->addDrawable(geometry);
    return geode;
}

// Vertices of each set and the primitives they make, by the rules of OpenGL; of a polygon the library counts the
// corners.
struct Expected
{
    const char* name;
    GLenum mode;
    int vertices;
    double primitives;
};

const Expected expected[] = {
    {"Visible number of GL_POINTS", GL_POINTS, 5, 5},
    {"Visible number of GL_LINES", GL_LINES, 6, 3},
    {"Visible number of GL_LINE_STRIP", GL_LINE_STRIP, 7, 6},
    {"Visible number of GL_LINE_LOOP", GL_LINE_LOOP, 4, 4},
    {"Visible number of GL_TRIANGLES", GL_TRIANGLES, 12, 4},
    {"Visible number of GL_TRIANGLE_STRIP", GL_TRIANGLE_STRIP, 9, 7},
    {"Visible number of GL_TRIANGLE_FAN", GL_TRIANGLE_FAN, 8, 6},
    {"Visible number of GL_QUADS", GL_QUADS, 20, 5},
    {"Visible number of GL_QUAD_STRIP", GL_QUAD_STRIP, 10, 4},
    {"Visible number of GL_POLYGON", GL_POLYGON, 11, 11},
};
constexpr int polygons = 4 + 7 + 6 + 5 + 4 + 11;

osg::ref_ptr<osg::Group> KnownScene()
{
    std::vector<std::pair<GLenum, int>> sets;
    for (const Expected& entry : expected)
        sets.emplace_back(entry.mode, entry.vertices);
    osg::ref_ptr<osg::Group> scene = new osg::Group;
    scene->addChild(Geometry(sets));
    osg::ref_ptr<osg::MatrixTransform> behind = new osg::MatrixTransform;
    behind->setMatrix(osg::Matrixd::translate(0, -100, 0));
    behind->addChild(Geometry({{GL_TRIANGLES, 30}}));
    scene->addChild(behind);
    return scene;
}

TEST_F(ViewerStatistics, CountsWhatIsInSight)
{
    osgViewer::View& view = AddView(KnownScene(), 64, 64);
    LookAt(view, osg::Vec3d(0, -5, 0), osg::Vec3d());
    osg::Stats& stats = *view.getCamera()->getStats();
    RenderViewerFrame();
    EXPECT_TRUE(stats.getAttributeMap(stats.getLatestFrameNumber()).empty()) << "nothing is counted unasked";

    stats.collectStats("scene", true);
    stats.collectStats("rendering", true);
    RenderViewerFrame();
    const osg::Stats::AttributeMap& counted = stats.getAttributeMap(stats.getLatestFrameNumber());
    for (const Expected& entry : expected)
    {
        ASSERT_TRUE(counted.contains(entry.name)) << entry.name;
        EXPECT_EQ(entry.primitives, counted.at(entry.name)) << entry.name;
    }
    const std::pair<const char*, double> others[] = {
        {"Visible vertex count", 30},        {"Visible number of drawables", 1},
        {"Visible number of impostors", 0},  {"Visible number of PrimitiveSets", 10},
        {"Number of StateGraphs", 1},        {"Number of ordered leaves", 0},
        {"Visible number of render bins", 1}};
    for (const auto& [name, value] : others)
    {
        ASSERT_TRUE(counted.contains(name)) << name;
        EXPECT_EQ(value, counted.at(name)) << name;
    }
    for (const char* name : {"Visible number of lights", "Visible depth", "Cull traversal begin time",
                             "Cull traversal end time", "Draw traversal begin time", "Draw traversal end time"})
        EXPECT_TRUE(counted.contains(name)) << name;
    EXPECT_EQ(25u, counted.size());
    EXPECT_NEAR(counted.at("Cull traversal end time") - counted.at("Cull traversal begin time"),
                counted.at("Cull traversal time taken"), 1e-9);
    EXPECT_NEAR(counted.at("Draw traversal end time") - counted.at("Draw traversal begin time"),
                counted.at("Draw traversal time taken"), 1e-9);
}

TEST_F(ViewerStatistics, CountsPolygonsInOneFrameAndSwitchesTheCountOff)
{
    osgViewer::View& view = AddView(KnownScene(), 64, 64);
    LookAt(view, osg::Vec3d(0, -5, 0), osg::Vec3d());
    RenderViewerFrame();
    EXPECT_EQ(polygons, getVisiblePolygonCount(&view, 7));
    EXPECT_FALSE(view.getCamera()->getStats()->collectStats("scene"));
    EXPECT_TRUE(renderingEnabled);
    EXPECT_EQ(std::vector<std::uint32_t>(4, 100), clock.sleeps);

    EXPECT_EQ(7, getVisiblePolygonCount(nullptr, 7));
}

TEST_F(ViewerStatistics, TellsTheFrameRateOfTheLastFramesInARow)
{
    EXPECT_EQ(0.0, getFrameRate());
    AddView(scenes::Boxes(), 64, 64);
    RenderViewerFrame();
    EXPECT_EQ(0.0, getFrameRate()) << "one frame has no rate";
    for (int frame = 0; frame < 5; ++frame)
        RenderViewerFrame();
    const double rate = getFrameRate();
    EXPECT_FALSE(isViewerFrameDue());
    EXPECT_EQ(rate, getFrameRate()) << "while nothing is drawn it stays";
    RenderViewerFrame();
    EXPECT_EQ(rate, getFrameRate()) << "the time of a rest is no frame's";
    RenderViewerFrame();

    double sum = 0.0;
    for (const unsigned int frame : {1, 2, 3, 4, 5, 7})
    {
        double duration = 0.0;
        ASSERT_TRUE(getViewerStats()->getAttribute(frame, "Frame duration", duration)) << frame;
        sum += 1.0 / duration;
    }
    EXPECT_NEAR(sum / 6, getFrameRate(), 1e-6 * sum);
    EXPECT_TRUE(getViewerStats()->collectStats("frame_rate"));
    EXPECT_EQ("Glide Panel", getViewerStats()->getName());
}

} // namespace
