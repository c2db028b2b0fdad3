#include "render/ViewCommandsHandler.h"

#include "render/Base3DView.h"
#include "render/SplitterEx.h"
#include "scene/Scene3D.h"
#include "scene/SceneServices.h"

VtCScene3D* VtCVisualizationViewCommandsHandler::Scene() const
{
    return frame.GetDocument().GetScene();
}

const host::CommandTable<VtCVisualizationViewCommandsHandler>& VtCVisualizationViewCommandsHandler::GetCommands()
{
    using Views = VtCVisualizationViewCommandsHandler;
    using enum host::CommandGroup;
    constexpr unsigned both = host::inMenu | host::onToolBar;
    constexpr unsigned check = host::hasCheck;

    const auto layoutState = [](const Views& views, int which) -> VtTCommandState {
        return {true, views.frame.GetLayout() == which};
    };
    const auto setLayout = [](Views& views, int which) { views.frame.ApplyLayout(which); };

    const auto modeState = [](const Views& views, int mode) -> VtTCommandState
    {
        const VtCScene3D* scene = views.Scene();
        return {scene != nullptr, scene && scene->GetGlobalRenderMode() == static_cast<VtERenderMode>(mode)};
    };
    const auto setMode = [](Views& views, int number)
    {
        const auto mode = static_cast<VtERenderMode>(number);
        views.Scene()->ChangeGlobalRenderMode(mode, mode == VtERenderMode::Mixed);
    };
    const auto mode = [](VtERenderMode which) { return static_cast<int>(which); };

    // A scene is served by the file menu of the program around.
    const auto never = [](const Views&, int) { return VtTCommandState{}; };
    const auto nothing = [](Views&, int) {};

    static const host::CommandTable<Views> table{
        // number, group, where, icon, shortcut | state | what it does | which
        {{commandSingleView, layout, both | check, "layout-single", "Ctrl+1"}, layoutState, setLayout, layoutSingle},
        {{commandTwoColumns, layout, both | check, "layout-columns", "Ctrl+2"},
         layoutState,
         setLayout,
         layoutTwoColumns},
        {{commandTwoRows, layout, both | check, "layout-rows", "Ctrl+3"}, layoutState, setLayout, layoutTwoRows},
        {{commandFourViews, layout, both | check, "layout-four", "Ctrl+4"}, layoutState, setLayout, layoutFour},

        {{commandGouraud, renderMode, both | check, "mode-gouraud", "Alt+1"},
         modeState,
         setMode,
         mode(VtERenderMode::Gouraud)},
        {{commandTextured, renderMode, both | check, "mode-textured", "Alt+2"},
         modeState,
         setMode,
         mode(VtERenderMode::Textured)},
        {{commandFlat, renderMode, both | check, "mode-flat", "Alt+3"}, modeState, setMode, mode(VtERenderMode::Flat)},
        {{commandWireFrame, renderMode, both | check, "mode-wire", "Alt+4"},
         modeState,
         setMode,
         mode(VtERenderMode::WireFrame)},
        {{commandMixed, renderMode, both | check, "mode-mixed", "Alt+5"},
         modeState,
         setMode,
         mode(VtERenderMode::Mixed)},

        {{commandStraighten, camera, both, "straighten", "Ctrl+T"},
         [](const Views& views, int) { return VtTCommandState{views.frame.GetActiveView() != nullptr}; },
         [](Views& views, int) { views.frame.GetActiveView()->straightenCamera(); }},

        {{commandFileClose}, never, nothing},
        {{commandFileSave}, never, nothing},
        {{commandFileSaveAs}, never, nothing},
    };
    return table;
}
