#include "assets/AssetManager.h"

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <set>
#include <sstream>
#include <sys/stat.h>
#include <unistd.h>

#include <osg/LightModel>
#include <osgDB/Options>
#include <osgDB/ReaderWriter>
#include <osgUtil/Optimizer>
#include <osgUtil/SmoothingVisitor>

#include "assets/DrawableCollector.h"
#include "assets/ModelNormals.h"
#include "assets/models/ModelReader.h"
#include "assets/TextureCollector.h"
#include "base/AtomicFile.h"
#include "base/Paths.h"
#include "base/Text.h"
#include "host/LibraryPaths.h"
#include "host/Messages.h"

namespace
{

constexpr std::uint32_t textModelNotRead = 9001;  ///< "The model %1 could not be read: %2"
constexpr std::uint32_t textModelLosses = 9002;   ///< "The model %1 was read with losses: %2"
constexpr std::uint32_t textLessProtected = 9003; ///< "Models are read with less protection on this machine: %1"

constexpr unsigned optimizations = 0x110F9;
static_assert(optimizations ==
              (osgUtil::Optimizer::FLATTEN_STATIC_TRANSFORMS | osgUtil::Optimizer::COMBINE_ADJACENT_LODS |
               osgUtil::Optimizer::SHARE_DUPLICATE_STATE | osgUtil::Optimizer::MERGE_GEOMETRY |
               osgUtil::Optimizer::CHECK_GEOMETRY | osgUtil::Optimizer::MAKE_FAST_GEOMETRY |
               osgUtil::Optimizer::OPTIMIZE_TEXTURE_SETTINGS | osgUtil::Optimizer::STATIC_OBJECT_DETECTION));

constexpr unsigned copyFlags = 0x59F;
static_assert(copyFlags ==
              (osg::CopyOp::DEEP_COPY_OBJECTS | osg::CopyOp::DEEP_COPY_NODES | osg::CopyOp::DEEP_COPY_DRAWABLES |
               osg::CopyOp::DEEP_COPY_STATESETS | osg::CopyOp::DEEP_COPY_STATEATTRIBUTES |
               osg::CopyOp::DEEP_COPY_ARRAYS | osg::CopyOp::DEEP_COPY_PRIMITIVES | osg::CopyOp::DEEP_COPY_UNIFORMS));

constexpr unsigned tangentLocation = 6;
constexpr unsigned binormalLocation = 7;

constexpr std::uintmax_t maxShaderBytes = 1 << 20;

/// Models of this library have faces that look the wrong way.
constexpr const wchar_t* twoSidedLibrary = L"vantor objects\\old(prior gld 2.3)";

using ShaderNodes = std::map<osg::Drawable*, std::string>;

VtTAssetServices givenServices;
VtCOsgAssetManager* instance = nullptr;

/// Asks the instance of the moment, so that a reference to it holds when the instance changes.
class CurrentLibrary : public VtIModelLibrary
{
public:
    osg::Group* loadModel(const std::wstring& path, bool useVrmlTransform) override
    {
        return VtCOsgAssetManager::getInstance().loadModel(path, useVrmlTransform);
    }
    std::string getXmlAttributes(const std::wstring& path) override
    {
        return VtCOsgAssetManager::getInstance().getXmlAttributes(path);
    }
    osg::Node* clone(const osg::Node* node) override { return VtCOsgAssetManager::cloneNode(node); }
    void assignShader(osg::Node* node, const std::wstring& shaderName, const std::wstring& vertexPath,
                      const std::wstring& fragmentPath) override
    {
        VtCOsgAssetManager::getInstance().assignShader(node, shaderName, vertexPath, fragmentPath);
    }
    void assignDrawableShader(osg::Drawable* drawable, const std::wstring& shaderName, const std::wstring& vertexPath,
                              const std::wstring& fragmentPath) override
    {
        VtCOsgAssetManager::getInstance().assignDrawableShader(drawable, shaderName, vertexPath, fragmentPath);
    }
    void setShaderParameter(osg::Node* node, const std::wstring& kind, const std::wstring& name,
                            const std::wstring& type, const std::wstring& value,
                            const std::wstring& shaderName) override
    {
        VtCOsgAssetManager::getInstance().setShaderParameter(node, kind, name, type, value, shaderName);
    }
    std::wstring getShaderDirectory() const override { return VtCOsgAssetManager::getInstance().getShaderDirectory(); }
    void emptyCache() override { VtCOsgAssetManager::destroyInstance(); }
    void preloadModels(const std::vector<std::wstring>& paths, bool useVrmlTransform) override
    {
        VtCOsgAssetManager::getInstance().preloadModels(paths, useVrmlTransform);
    }
    std::vector<std::wstring> collectTextureFiles(osg::Node& node) const override
    {
        return VtCOsgAssetManager::getInstance().collectTextureFiles(node);
    }
};

/// Drawables that want a shader must still be there when it is assigned, with a state set that is theirs.
class KeepShaderNodes : public osgUtil::Optimizer::IsOperationPermissibleForObjectCallback
{
public:
    explicit KeepShaderNodes(const ShaderNodes& nodes) : shaderNodes(nodes)
    {
        for (const auto& [drawable, name] : nodes)
            states.insert(drawable->getStateSet());
    }

    using IsOperationPermissibleForObjectCallback::isOperationPermissibleForObjectImplementation;

    bool isOperationPermissibleForObjectImplementation(const osgUtil::Optimizer* optimizer, const osg::StateSet* state,
                                                       unsigned option) const override
    {
        return !states.contains(state) &&
               IsOperationPermissibleForObjectCallback::isOperationPermissibleForObjectImplementation(optimizer, state,
                                                                                                      option);
    }

    bool isOperationPermissibleForObjectImplementation(const osgUtil::Optimizer* optimizer,
                                                       const osg::Drawable* drawable, unsigned option) const override
    {
        return !(option == osgUtil::Optimizer::MERGE_GEOMETRY &&
                 shaderNodes.contains(const_cast<osg::Drawable*>(drawable))) &&
               IsOperationPermissibleForObjectCallback::isOperationPermissibleForObjectImplementation(optimizer,
                                                                                                      drawable, option);
    }

private:
    const ShaderNodes& shaderNodes;
    std::set<const osg::StateSet*> states;
};

/// Last write in whole seconds, the low 32 bits; 0 for a file that can't be opened.
std::uint32_t FileTime(const std::wstring& path)
{
    const std::string native = base::NativePath(path).string();
    struct stat status = {};
    if (::access(native.c_str(), R_OK) != 0 || ::stat(native.c_str(), &status) != 0)
        return 0;
    return static_cast<std::uint32_t>(status.st_mtim.tv_sec);
}

void MakeTwoSided(osg::Node& root)
{
    osg::ref_ptr<osg::LightModel> lightModel = new osg::LightModel;
    lightModel->setTwoSided(true);
    osg::StateSet& state = *root.getOrCreateStateSet();
    state.setMode(GL_CULL_FACE, osg::StateAttribute::OFF | osg::StateAttribute::OVERRIDE);
    state.setAttributeAndModes(lightModel, osg::StateAttribute::ON | osg::StateAttribute::OVERRIDE);
}

/// The whole of a shader file; empty without one, or for one that is none by its size.
std::string ReadShaderText(const std::string& path)
{
    std::error_code failed;
    if (!std::filesystem::is_regular_file(path, failed) || std::filesystem::file_size(path, failed) > maxShaderBytes)
        return {};
    std::ifstream file(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(file), {}};
}

/// The number at the start of `text`, 0 without one.
int LeadingInteger(const std::wstring& text)
{
    return static_cast<int>(std::wcstol(text.c_str(), nullptr, 10));
}

} // namespace

void VtCOsgAssetManager::setServices(const VtTAssetServices& services)
{
    givenServices = services;
}

VtCOsgAssetManager& VtCOsgAssetManager::getInstance()
{
    if (!instance)
        instance = new VtCOsgAssetManager(givenServices);
    return *instance;
}

void VtCOsgAssetManager::destroyInstance()
{
    delete instance;
    instance = nullptr;
}

void VtCOsgAssetManager::emptyCache()
{
    models.clear();
    modelTimes.clear();
    xmlAttributes.clear();
    programs.clear();
    shaders.clear();
}

std::vector<std::wstring> VtCOsgAssetManager::collectTextureFiles(osg::Node& node) const
{
    VtCOsgTextureCollector collector;
    node.accept(collector);
    return collector.fileNames;
}

VtIModelLibrary& VtCOsgAssetManager::getLibrary()
{
    static CurrentLibrary library;
    return library;
}

VtCOsgAssetManager::VtCOsgAssetManager(const VtTAssetServices& services)
    : messages(*services.messages),
      reader(new VtCModelReader(services.reader)),
      noOptimizeFiles{L"groupelement.wrl", L"groupelement.dae"},
      textureAttributeNames{
          L"basetexture",     L"decalMap",       L"batterTexture", L"roadSurfaceTexture", L"roadFrictionMapTexture",
          L"roadSurfaceTexX", L"roadSurfaceTexY"},
      shaderDirectory(services.paths->GetModuleDirectory() + L"..\\Assets\\"),
      customerPath(base::Utf8(services.paths->GetCustomerPath())),
      objectsPath(base::Utf8(services.paths->GetObjectsPath()))
{
}

VtCOsgAssetManager::~VtCOsgAssetManager()
{
    models.clear();
    xmlAttributes.clear();
    modelTimes.clear();
    programs.clear();
    for (auto& [path, shader] : shaders)
    {
        if (!shader)
            continue;
        shader->setShaderSource("");
        shader->releaseGLObjects(nullptr);
        shader = nullptr;
    }
}

bool VtCOsgAssetManager::isCurrent(const std::wstring& path) const
{
    return models.contains(path) && FileTime(path) <= modelTimes.at(path);
}

osg::Group* VtCOsgAssetManager::loadModel(const std::wstring& path, bool useVrmlTransform)
{
    return isCurrent(path) ? models[path].get() : readModel(path, useVrmlTransform);
}

osg::ref_ptr<osgDB::Options> VtCOsgAssetManager::makeOptions(bool useVrmlTransform) const
{
    osg::ref_ptr<osgDB::Options> options = new osgDB::Options;
    options->setPluginStringData("useShininess", "30.0");
    options->setPluginStringData("useAmbientIntensity", "0.7");
    options->setPluginStringData("useSpecularity", "1.0");
    options->setPluginStringData("autoloadProxies", "0");
    options->setPluginStringData("glidePanelAssignsShaders", "1");
    options->setPluginStringData("vtCustomerPath", customerPath);
    options->setPluginStringData("vtObjectsPath", objectsPath);
    if (!useVrmlTransform)
        options->setPluginStringData("useVrmlTransform", "0");
    if (maxTexAnisotropy > 1.0f)
    {
        std::ostringstream text;
        text.imbue(std::locale::classic());
        text << maxTexAnisotropy;
        options->setPluginStringData("useMaxTexAnisotropy", text.str());
    }
    return options;
}

osg::Group* VtCOsgAssetManager::readModel(const std::wstring& path, bool useVrmlTransform)
{
    const std::string nativePath = base::NativePath(path).string();
    const std::wstring lowerPath = base::ToLower(path);
    osg::ref_ptr<osg::Group> root = new osg::Group;
    osg::ref_ptr<osgDB::Options> options = makeOptions(useVrmlTransform);

    // Not by the library's registry: its plug-ins would parse, or run, whatever a file's ending asks for in here.
    osgDB::ReaderWriter::ReadResult result = reader->readNode(nativePath, options);
    const osg::ref_ptr<osg::Node> node = result.getNode();
    if (!node)
        messages.ShowError(textModelNotRead, path, base::Wide(result.message()));
    else if (const std::string warnings = options->getPluginStringData("readWarnings"); !warnings.empty())
        messages.ShowWarning(textModelLosses, path, base::Wide(warnings));

    if (const std::string notes = options->getPluginStringData("readNotes"); !notes.empty() && !toldProtection)
    {
        messages.Log(textLessProtected, base::Wide(notes));
        toldProtection = true;
    }

    polygonCount += std::atoi(options->getPluginStringData("polygonCount").c_str());
    vertexCount += std::atoi(options->getPluginStringData("vertexCount").c_str());
    textureMemoryUsed += std::atoi(options->getPluginStringData("textureMemoryUsed").c_str());

    const std::string description = options->getPluginStringData("xmlAttributes");
    if (node)
    {
        optimize(*node, lowerPath, *options);
        if (const std::optional<float> creaseAngle = GetRecalculationAngle(description))
        {
            osgUtil::SmoothingVisitor smoother;
            smoother.setCreaseAngle(*creaseAngle);
            node->accept(smoother);
        }
        root->addChild(node);
    }
    if (lowerPath.find(twoSidedLibrary) != std::wstring::npos)
        MakeTwoSided(*root);

    models[path] = root;
    xmlAttributes[path] = description;
    modelTimes[path] = FileTime(path);

    if (const auto* shaderNodes = static_cast<const ShaderNodes*>(options->getPluginData("shaderNodes")))
        for (const auto& [drawable, name] : *shaderNodes)
        {
            const std::wstring shader = base::Wide(name);
            assignDrawableShader(drawable, shader, shaderDirectory + shader + L".vert",
                                 shaderDirectory + shader + L".frag");
        }
    return root.get();
}

void VtCOsgAssetManager::optimize(osg::Node& node, const std::wstring& lowerPath, osgDB::Options& options) const
{
    for (const std::wstring& file : noOptimizeFiles)
        if (lowerPath.find(file) != std::wstring::npos)
            return;
    osgUtil::Optimizer optimizer;
    if (const auto* shaderNodes = static_cast<const ShaderNodes*>(options.getPluginData("shaderNodes")))
        optimizer.setIsOperationPermissibleForObjectCallback(new KeepShaderNodes(*shaderNodes));
    optimizer.optimize(&node, optimizations);
}

void VtCOsgAssetManager::preloadModels(const std::vector<std::wstring>& paths, bool useVrmlTransform)
{
    std::vector<std::string> missing;
    for (const std::wstring& path : paths)
        if (!isCurrent(path))
            missing.push_back(base::NativePath(path).string());
    reader->Preload(missing, makeOptions(useVrmlTransform));
}

std::string VtCOsgAssetManager::getXmlAttributes(const std::wstring& path)
{
    const auto at = xmlAttributes.find(path);
    return at == xmlAttributes.end() ? std::string() : at->second;
}

osg::Node* VtCOsgAssetManager::cloneNode(const osg::Node* node)
{
    return node ? static_cast<osg::Node*>(node->clone(osg::CopyOp(copyFlags))) : nullptr;
}

osg::Shader* VtCOsgAssetManager::getShader(const std::wstring& path, osg::Shader::Type type)
{
    osg::ref_ptr<osg::Shader>& shader = shaders[path];
    if (!shader)
    {
        const std::string file = base::NativePath(path).string();
        if (const std::string source = ReadShaderText(file); !source.empty())
        {
            shader = new osg::Shader(type, source);
            shader->setFileName(file);
        }
    }
    return shader.get();
}

void VtCOsgAssetManager::createProgram(const std::wstring& name, const std::wstring& vertexPath,
                                       const std::wstring& fragmentPath)
{
    if (programs[name])
        return;
    osg::ref_ptr<osg::Program> program = new osg::Program;
    program->setName(base::Utf8(name)); // the scene finds the files of a program by this name again
    osg::Shader* vertexShader = getShader(vertexPath, osg::Shader::VERTEX);
    osg::Shader* fragmentShader = getShader(fragmentPath, osg::Shader::FRAGMENT);
    if (!vertexShader || !fragmentShader)
        return;
    program->addBindAttribLocation("Tangent", tangentLocation);
    program->addBindAttribLocation("Binormal", binormalLocation);
    program->addShader(vertexShader);
    program->addShader(fragmentShader);
    programs[name] = program;
}

bool VtCOsgAssetManager::hasRead(const std::filesystem::path& file) const
{
    const std::set<std::string>& all = reader->GetFiles();
    return std::any_of(all.begin(), all.end(), [&](const std::string& one) { return base::IsSameFile(file, one); });
}

osg::Program* VtCOsgAssetManager::getProgram(const std::wstring& name) const
{
    const auto at = programs.find(name);
    return at == programs.end() ? nullptr : at->second.get();
}

void VtCOsgAssetManager::assignShader(osg::Node* node, const std::wstring& shaderName, const std::wstring& vertexPath,
                                      const std::wstring& fragmentPath)
{
    if (!node)
        return;
    createProgram(shaderName, vertexPath, fragmentPath);
    osg::Program* program = getProgram(shaderName);
    if (!program)
        return;
    if (shaderName == L"streetShader")
        node->getOrCreateStateSet()->setAttributeAndModes(program, osg::StateAttribute::ON);
    else if (shaderName == L"bumpBaseShader")
        node->getOrCreateStateSet()->setAttributeAndModes(program,
                                                          osg::StateAttribute::ON | osg::StateAttribute::OVERRIDE);
    else
    {
        VtCOsgDrawableCollector collector;
        node->accept(collector);
        for (osg::Drawable* drawable : collector.drawables)
            drawable->getOrCreateStateSet()->setAttributeAndModes(program, osg::StateAttribute::ON);
    }
}

void VtCOsgAssetManager::assignDrawableShader(osg::Drawable* drawable, const std::wstring& shaderName,
                                              const std::wstring& vertexPath, const std::wstring& fragmentPath)
{
    if (!drawable)
        return;
    createProgram(shaderName, vertexPath, fragmentPath);
    if (osg::Program* program = getProgram(shaderName))
        drawable->getOrCreateStateSet()->setAttributeAndModes(program,
                                                              osg::StateAttribute::ON | osg::StateAttribute::OVERRIDE);
}

void VtCOsgAssetManager::setShaderParameter(osg::Node* node, const std::wstring& kind, const std::wstring& name,
                                            const std::wstring& type, const std::wstring& value,
                                            const std::wstring& shaderName)
{
    if (!node)
        return;
    if (kind == L"uniform" && (type == L"sampler2D" || type == L"int"))
        node->getOrCreateStateSet()->addUniform(new osg::Uniform(base::Utf8(name).c_str(), LeadingInteger(value)),
                                                osg::StateAttribute::ON | osg::StateAttribute::OVERRIDE);
    else if (kind == L"varying" && !shaderName.empty() && type == L"vertexAttribBinding")
        if (osg::Program* program = getProgram(shaderName))
            program->addBindAttribLocation(base::Utf8(name), static_cast<GLuint>(LeadingInteger(value)));
}

void VtCOsgAssetManager::dirtyPrograms()
{
    for (auto& [name, program] : programs)
        if (program)
            program->dirtyProgram();
}
