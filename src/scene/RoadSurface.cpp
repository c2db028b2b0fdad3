#include "scene/RoadSurface.h"

#include "scene/Collectors.h"
#include "scene/SceneServices.h"

#include <algorithm>
#include <string_view>

#include <osg/BlendFunc>
#include <osg/Depth>
#include <osg/Stencil>

namespace
{

using osg::StateAttribute;

constexpr StateAttribute::GLModeValue onAndOverride = StateAttribute::ON | StateAttribute::OVERRIDE;

// Attribute location that the road's program gives to the secondary colour.
constexpr const wchar_t* secondaryColourLocation = L"4";

enum class Role
{
    none,
    bumpBase,
    bump,
    road,
};

Role RoleOf(const osg::Geode& geode)
{
    const std::string& name = geode.getName();
    const auto holds = [&](std::string_view part) { return name.find(part) != std::string::npos; };
    if (holds("_bumpbase_geometry"))
        return Role::bumpBase;
    if (holds("_bump_geometry"))
        return Role::bump;
    return holds("_road_geometry") ? Role::road : Role::none;
}

void SetStencil(osg::Geode& geode, osg::Stencil::Function function, osg::Stencil::Operation onPass)
{
    osg::ref_ptr<osg::Stencil> stencil = new osg::Stencil;
    stencil->setFunction(function, 1, 0xFFFFFFFF);
    stencil->setOperation(osg::Stencil::KEEP, osg::Stencil::KEEP, onPass);
    geode.getOrCreateStateSet()->setAttributeAndModes(stencil, onAndOverride);
}

void SetBlending(osg::Geode& geode, double farthest, StateAttribute::GLModeValue depthTest)
{
    for (unsigned i = 0; i < geode.getNumDrawables(); ++i)
    {
        osg::StateSet& stateSet = *geode.getDrawable(i)->getOrCreateStateSet();
        stateSet.setMode(GL_BLEND, onAndOverride);
        stateSet.setAttributeAndModes(new osg::BlendFunc(GL_SRC_ALPHA, GL_ONE_MINUS_SRC_ALPHA), StateAttribute::ON);
        stateSet.setAttributeAndModes(new osg::Depth(osg::Depth::LESS, 0.0, farthest, true), depthTest);
    }
}

// The stencil buffer has to be marked before the road is drawn.
void PutFirst(osg::Geode& geode)
{
    if (geode.getNumParents() == 0 || geode.getParent(0)->getNumParents() == 0)
        return;
    const osg::ref_ptr<osg::Group> above = geode.getParent(0);
    osg::Group& top = *above->getParent(0);
    top.removeChild(above);
    top.insertChild(0, above);
}

} // namespace

void AssignRoadSurface(osg::Group& road, VtIModelLibrary& models, const std::wstring& moduleDirectory)
{
    const std::wstring assets = moduleDirectory + L"..\\Assets\\";
    models.assignShader(&road, roadShaderName, assets + L"VtxShader.vert", assets + L"PixShader.frag");
    models.setShaderParameter(&road, L"varying", L"SecondaryColor", L"vertexAttribBinding", secondaryColourLocation,
                              roadShaderName);
    // Before all opaque geometry, which lies in bin 0.
    road.getOrCreateStateSet()->setRenderBinDetails(-1, "RenderBin", osg::StateSet::USE_RENDERBIN_DETAILS);

    VtCOsgGeodeCollector collector;
    road.accept(collector);
    const bool hasBumpBase = std::any_of(collector.geodes.begin(), collector.geodes.end(),
                                         [](const osg::Geode* geode) { return RoleOf(*geode) == Role::bumpBase; });
    for (osg::Geode* geode : collector.geodes)
        switch (RoleOf(*geode))
        {
        case Role::bumpBase:
            SetStencil(*geode, osg::Stencil::ALWAYS, osg::Stencil::REPLACE);
            models.assignShader(geode, L"bumpBaseShader", assets + L"BumpBaseShader.vert",
                                assets + L"BumpBaseShader.frag");
            SetBlending(*geode, 0.99996, StateAttribute::OFF);
            PutFirst(*geode);
            break;
        case Role::bump:
            SetBlending(*geode, 1.0, StateAttribute::ON);
            break;
        case Role::road:
            SetBlending(*geode, 1.0, StateAttribute::ON);
            if (hasBumpBase)
                SetStencil(*geode, osg::Stencil::NOTEQUAL, osg::Stencil::KEEP);
            break;
        case Role::none:
            break;
        }
}
