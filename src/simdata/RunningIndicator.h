#pragma once

namespace host
{
class Variables;
}

/// The object tree as the simulation sees it. The navigator implements it.
class VtINavigatorState
{
public:
    virtual ~VtINavigatorState() = default;

    /// Is the current item that of a track?
    virtual bool IsTrackCurrent() const = 0;
};

/// Tells the host whether a run is on that the track chosen in the tree takes part in, by its variable
/// "simulationRunning". The host guards the commands of tracks with it.
class VtCRunningIndicator
{
public:
    /// Either may be null: without variables nothing is told, without a navigator no track is chosen.
    VtCRunningIndicator(host::Variables* hostVariables, const VtINavigatorState* tree)
        : variables(hostVariables), navigator(tree)
    {
    }

    /// `running`: online, or a replay plays.
    void Update(bool running) const;

private:
    host::Variables* variables;
    const VtINavigatorState* navigator;
};
