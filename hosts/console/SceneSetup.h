#pragma once

#include <filesystem>
#include <optional>
#include <string>
#include <vector>

#include "hosts/console/Arguments.h"

class VtCPanoramicDocument;

namespace console
{

class Session;

/// The scene that a command shows, and the data that move it.
struct SceneArguments
{
    std::filesystem::path file; ///< empty: the bodies are given one by one
    std::vector<StaticArgument> statics;
    std::vector<MovableArgument> movables;
    std::filesystem::path data; ///< empty: none
    std::string source;         ///< "NAME" or "NAME:OPTIONS" of a live data point in place of `data`; empty: none
};

/// Opens the scene with its data. Null after an error message.
VtCPanoramicDocument* OpenScene(Session& session, const SceneArguments& scene);

/// Makes the bodies of the scene in `document`. A model that isn't there is shown as an error; its body exists
/// without geometry, and the rest is made all the same.
void BuildBodies(Session& session, VtCPanoramicDocument& document, const SceneArguments& scene);

/// Makes a motion data file the active source, with all its frames loaded. False after an error message.
bool LoadData(Session& session, const std::filesystem::path& file);

/// Makes the data point of `source` the active one, with its options if there are any. False after an error message
/// that names the points, or what the point has against the options.
bool ChooseSource(Session& session, const std::string& source);

/// Lets the live source run to `time` without anybody waiting for it, and stops it. False after an error message, also
/// for a source that isn't driven by the clock.
bool RunSourceTo(Session& session, double time);

/// Binds each movable body to its channel of the active source, names compared without regard to case. False after
/// an error message, which names the channels there are.
bool BindChannels(Session& session, VtCPanoramicDocument& document, const std::vector<MovableArgument>& movables);

/// The span of time of the active source, in seconds; nothing when its frames have no time stamps.
struct TimeSpan
{
    double first = 0.0;
    double last = 0.0;
};
std::optional<TimeSpan> GetTimeSpan(Session& session);

/// Is `time` within `span`? False after an error message that names the span.
bool CheckTime(Session& session, double time, const TimeSpan& span);

/// Is `time` within the data? False after an error message that names the span, or says that there are no times.
bool CheckTime(Session& session, double time, const std::filesystem::path& file);

/// Moves the bodies to where they are at `time`, or in frame `number` (from 1). False after an error message.
bool GoToTime(Session& session, double time, const std::filesystem::path& file);
bool GoToFrame(Session& session, long number);

} // namespace console
