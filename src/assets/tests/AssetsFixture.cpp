#include "AssetsFixture.h"

#include <fstream>
#include <iterator>
#include <unistd.h>

#include <osg/Image>
#include <osg/NodeVisitor>
#include <osgDB/WriteFile>

namespace fs = std::filesystem;

namespace
{

const char* const squareMesh = R"(<library_geometries><geometry id="square" name="square"><mesh>
<source id="square-p"><float_array id="square-pa" count="12">0 0 0 1 0 0 1 1 0 0 1 0</float_array><technique_common>
<accessor source="#square-pa" count="4" stride="3"><param name="X" type="float"/><param name="Y" type="float"/><param name="Z" type="float"/></accessor></technique_common></source>
<source id="square-n"><float_array id="square-na" count="3">0 0 1</float_array><technique_common>
<accessor source="#square-na" count="1" stride="3"><param name="X" type="float"/><param name="Y" type="float"/><param name="Z" type="float"/></accessor></technique_common></source>
<source id="square-t"><float_array id="square-ta" count="8">0 0 1 0 1 1 0 1</float_array><technique_common>
<accessor source="#square-ta" count="4" stride="2"><param name="S" type="float"/><param name="T" type="float"/></accessor></technique_common></source>
<vertices id="square-v"><input semantic="POSITION" source="#square-p"/></vertices>
<triangles count="2" material="m"><input semantic="VERTEX" source="#square-v" offset="0"/><input semantic="NORMAL" source="#square-n" offset="1"/>
<input semantic="TEXCOORD" source="#square-t" offset="2" set="0"/><p>0 0 0 1 0 1 2 0 2 0 0 0 2 0 2 3 0 3</p></triangles>
</mesh></geometry></library_geometries>
)";

class Collector : public osg::NodeVisitor
{
public:
    using Action = std::function<void(osg::Geode&, osg::Geometry&, const osg::Matrix&)>;

    explicit Collector(Action what) : osg::NodeVisitor(TRAVERSE_ALL_CHILDREN), action(std::move(what)) {}

    void apply(osg::Geode& geode) override
    {
        for (unsigned i = 0; i < geode.getNumDrawables(); ++i)
            action(geode, *geode.getDrawable(i)->asGeometry(), osg::computeLocalToWorld(getNodePath()));
    }

private:
    Action action;
};

std::string Replaced(std::string text, const std::string& what, const std::string& with)
{
    for (std::size_t at = text.find(what); at != std::string::npos; at = text.find(what, at + with.size()))
        text.replace(at, what.size(), with);
    return text;
}

} // namespace

void AssetsFixture::SetUp()
{
    const testing::TestInfo* test = testing::UnitTest::GetInstance()->current_test_info();
    folder = fs::temp_directory_path() / ("panoramic_assets_" + std::to_string(::getpid()) + "_" + test->name());
    fs::create_directories(folder);
}

void AssetsFixture::TearDown()
{
    fs::remove_all(folder);
}

std::string AssetsFixture::Dae(const File& file)
{
    std::string text = "<?xml version=\"1.0\" encoding=\"utf-8\"?>\n<COLLADA "
                       "xmlns=\"http://www.collada.org/2005/11/COLLADASchema\" version=\"1.4.1\"><asset>"
                       "<created>2020-01-01T00:00:00</created><modified>2020-01-01T00:00:00</modified><unit name=\"u\" "
                       "meter=\"" +
                       file.unit + "\"/><up_axis>" + file.up +
                       "</up_axis></asset>\n<library_images><image id=\"img\"><init_from>tex.png</init_from></image>"
                       "</library_images>\n<library_effects>\n";
    for (const auto& [name, shading] : file.effects)
        text += "<effect id=\"" + name +
                "-fx\"><profile_COMMON><newparam sid=\"sf\"><surface type=\"2D\"><init_from>img</init_from></surface>"
                "</newparam><newparam sid=\"sp\"><sampler2D><source>sf</source></sampler2D></newparam><technique "
                "sid=\"c\">" +
                Replaced(shading, "TEXTURE", "<texture texture=\"sp\" texcoord=\"UV\"/>") +
                "</technique></profile_COMMON></effect>\n";
    text += "</library_effects>\n<library_materials>\n";
    for (const auto& [name, shading] : file.effects)
        text += "<material id=\"" + name + "\" name=\"" + name + "\"><instance_effect url=\"#" + name +
                "-fx\"/></material>\n";
    text += std::string("</library_materials>\n") + squareMesh + "<library_visual_scenes><visual_scene id=\"vs\">\n";
    for (const Square& square : file.squares)
    {
        const std::string bound = square.material.empty()
                                      ? std::string()
                                      : "<bind_material><technique_common><instance_material symbol=\"m\" target=\"#" +
                                            square.material +
                                            "\"><bind_vertex_input semantic=\"UV\" input_semantic=\"TEXCOORD\" "
                                            "input_set=\"0\"/></instance_material></technique_common></bind_material>";
        text += "<node id=\"" + square.name + "-id\" name=\"" + square.name + "\">" + square.transform +
                "<instance_geometry url=\"#square\">" + bound + "</instance_geometry></node>\n";
    }
    return text + file.nodes +
           "</visual_scene></library_visual_scenes><scene><instance_visual_scene url=\"#vs\"/></scene></COLLADA>\n";
}

std::string AssetsFixture::WrlSquare(const std::string& name, const std::string& appearance, const std::string& fields)
{
    return "DEF " + name + " Shape { appearance Appearance { " + appearance +
           " }\n geometry IndexedFaceSet { coord Coordinate { point [ 0 0 0, 1 0 0, 1 1 0, 0 1 0 ] }\n"
           " texCoord TextureCoordinate { point [ 0 0, 1 0, 1 1, 0 1 ] } coordIndex [ 0, 1, 2, 3, -1 ] " +
           fields + " } }\n";
}

std::string AssetsFixture::Write(const std::string& name, const std::string& content) const
{
    const fs::path path = folder / name;
    fs::create_directories(path.parent_path());
    std::ofstream(path, std::ios::binary) << content;
    return path.string();
}

void AssetsFixture::WritePicture(const std::string& name, int size, bool alpha) const
{
    fs::create_directories((folder / name).parent_path());
    osg::ref_ptr<osg::Image> image = new osg::Image;
    image->allocateImage(size, size, 1, alpha ? GL_RGBA : GL_RGB, GL_UNSIGNED_BYTE);
    for (unsigned i = 0; i < image->getTotalSizeInBytes(); ++i)
        image->data()[i] = static_cast<unsigned char>(i * 37);
    ASSERT_TRUE(osgDB::writeImageFile(*image, (folder / name).string()));
}

fs::path AssetsFixture::Script(const std::string& body) const
{
    const fs::path path = Write("reader.sh", "#!/bin/sh\necho start >> '" + (folder / "starts.log").string() +
                                                 "'\nREADER='" + Settings().program.string() + "'\n" + body + "\n");
    fs::permissions(path, fs::perms::owner_all);
    return path;
}

int AssetsFixture::CountStarts() const
{
    std::ifstream log(folder / "starts.log");
    return static_cast<int>(std::distance(std::istream_iterator<std::string>(log), {}));
}

VtTModelReaderSettings AssetsFixture::Settings() const
{
    VtTModelReaderSettings settings;
    settings.program = fs::read_symlink("/proc/self/exe").parent_path() / "panoramic-model-reader";
    settings.parallel = 2;
    settings.limits.seconds = 20;
    return settings;
}

std::vector<AssetsFixture::Placed> AssetsFixture::Geometries(osg::Node& root)
{
    std::vector<Placed> all;
    Collector collector(
        [&](osg::Geode& geode, osg::Geometry& geometry, const osg::Matrix& matrix)
        {
            Placed placed{&geode, &geometry, {}};
            for (const osg::Vec3& vertex : static_cast<const osg::Vec3Array&>(*geometry.getVertexArray()))
                placed.box.expandBy(vertex * matrix);
            all.push_back(placed);
        });
    root.accept(collector);
    return all;
}

const AssetsFixture::Placed* AssetsFixture::Find(const std::vector<Placed>& all, const std::string& geode)
{
    for (const Placed& placed : all)
        if (placed.geode->getName() == geode)
            return &placed;
    return nullptr;
}
