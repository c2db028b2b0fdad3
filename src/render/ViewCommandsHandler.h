#pragma once

#include <cstdint>

#include "host/Commands.h"

class VtCScene3D;
class VtIViewFrame;

/// Commands of the views, by the numbers of menus and tool bars.
enum VtEViewCommand : std::uint32_t
{
    commandTwoRows = 38706,
    commandTwoColumns = 38707,
    commandFourViews = 38708,
    commandSingleView = 38709,
    commandWireFrame = 38728,
    commandFlat = 38729,
    commandGouraud = 38730,
    commandTextured = 38731,
    commandMixed = 38737,
    commandStraighten = 38738,
    commandFileClose = 57602,
    commandFileSave = 57603,
    commandFileSaveAs = 57604,
};

/// Carries out the commands of the views and tells their states.
class VtCVisualizationViewCommandsHandler
{
public:
    explicit VtCVisualizationViewCommandsHandler(VtIViewFrame& viewFrame) : frame(viewFrame) {}

    static const host::CommandTable<VtCVisualizationViewCommandsHandler>& GetCommands();

    /// True for a command of the views, enabled or not; a disabled one does nothing.
    bool Execute(std::uint32_t command) { return GetCommands().Execute(*this, *this, command); }

    /// Nothing for a number that isn't a command of the views.
    std::optional<VtTCommandState> GetState(std::uint32_t command) const
    {
        return GetCommands().GetState(*this, command);
    }

private:
    VtCScene3D* Scene() const;

    VtIViewFrame& frame;
};
