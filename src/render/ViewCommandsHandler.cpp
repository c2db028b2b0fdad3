#include "render/ViewCommandsHandler.h"

#include <optional>

#include "render/Base3DView.h"
#include "render/SplitterEx.h"
#include "scene/Scene3D.h"
#include "scene/SceneServices.h"

namespace
{

std::optional<std::int32_t> LayoutOf(std::uint32_t command)
{
    switch (command)
    {
    case commandSingleView:
        return layoutSingle;
    case commandTwoColumns:
        return layoutTwoColumns;
    case commandTwoRows:
        return layoutTwoRows;
    case commandFourViews:
        return layoutFour;
    default:
        return std::nullopt;
    }
}

std::optional<VtERenderMode> RenderModeOf(std::uint32_t command)
{
    switch (command)
    {
    case commandGouraud:
        return VtERenderMode::Gouraud;
    case commandTextured:
        return VtERenderMode::Textured;
    case commandFlat:
        return VtERenderMode::Flat;
    case commandWireFrame:
        return VtERenderMode::WireFrame;
    case commandMixed:
        return VtERenderMode::Mixed;
    default:
        return std::nullopt;
    }
}

} // namespace

VtCScene3D* VtCVisualizationViewCommandsHandler::Scene() const
{
    return frame.GetDocument().GetScene();
}

bool VtCVisualizationViewCommandsHandler::GetState(std::uint32_t command, VtTCommandState& state) const
{
    if (LayoutOf(command) || command == commandStraighten)
        state = {true, false};
    else if (const std::optional<VtERenderMode> mode = RenderModeOf(command))
        state = {Scene() != nullptr, Scene() && Scene()->GetGlobalRenderMode() == *mode};
    else if (command == commandFileClose || command == commandFileSave || command == commandFileSaveAs)
        state = {false, false}; // the host's own file menu serves a scene
    else
        return false;
    return true;
}

bool VtCVisualizationViewCommandsHandler::Execute(std::uint32_t command)
{
    VtTCommandState state;
    if (!GetState(command, state))
        return false;
    if (!state.enabled)
        return true;

    if (const std::optional<std::int32_t> layout = LayoutOf(command))
        frame.ApplyLayout(*layout);
    else if (const std::optional<VtERenderMode> mode = RenderModeOf(command))
        Scene()->ChangeGlobalRenderMode(*mode, *mode == VtERenderMode::Mixed);
    else if (command == commandStraighten && frame.GetActiveView())
        frame.GetActiveView()->straightenCamera();
    return true;
}
