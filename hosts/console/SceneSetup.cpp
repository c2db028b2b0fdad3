#include "hosts/console/SceneSetup.h"

#include <algorithm>

#include <fmt/format.h>

#include "app/PanoramicDocument.h"
#include "assets/AssetManager.h"
#include "base/Numbers.h"
#include "base/Paths.h"
#include "base/Text.h"
#include "host/LibraryPaths.h"
#include "hosts/console/ConsoleTexts.h"
#include "hosts/console/Session.h"
#include "records/AttributeNames.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "scene/StaticBody.h"
#include "simdata/SimulationDataController.h"

namespace console
{

namespace
{

constexpr std::uint32_t textLoadingScene = 7002;

// Numbers of the progress activities.
constexpr long loadingScene = 51;

std::filesystem::path Complete(const std::filesystem::path& file)
{
    return std::filesystem::absolute(file).lexically_normal();
}

// A model of a library is stored as one whatever links it was named by, so it gets the name that the library has.
std::wstring ModelPath(Session& session, const std::filesystem::path& file)
{
    const host::LibraryPaths& paths = session.GetHost().GetLibraryPaths();
    std::error_code failed;
    const std::filesystem::path real = std::filesystem::weakly_canonical(file, failed);
    for (const std::wstring& library : {paths.GetObjectsPath(), paths.GetCustomerPath()})
    {
        const std::filesystem::path root = base::NativePath(library);
        const std::filesystem::path inside = real.lexically_relative(std::filesystem::weakly_canonical(root, failed));
        if (!inside.empty() && *inside.begin() != "..")
            return base::InnerPath(root / inside);
    }
    return base::InnerPath(Complete(file));
}

VtTFloatTupel3 Floats(const Triple& numbers)
{
    return {static_cast<float>(numbers[0]), static_cast<float>(numbers[1]), static_cast<float>(numbers[2])};
}

void BuildStatic(Session& session, VtCPanoramicDocument& document, const StaticArgument& argument)
{
    const std::wstring name = base::Wide(argument.model.stem().string());
    // The collection takes the one reference of a new body.
    auto* body = new VtC3DStaticBody(document, *document.GetScene()->GetStaticBodies(), name,
                                     ModelPath(session, argument.model), osg::Matrixd(), true, {});
    if (const osg::ref_ptr<VtISceneObject> record = body->GetAttributeObject())
    {
        record->Write(attribute::position, Floats(argument.position));
        record->Write(attribute::rotation, Floats(argument.rotation));
    }
    body->AssignShaders();
}

void BuildMovable(Session& session, VtCPanoramicDocument& document, const MovableArgument& argument)
{
    const std::wstring name = base::Wide(argument.name);
    new VtC3DMovableBody(document, *document.GetScene()->GetMovableBodies(0), name, ModelPath(session, argument.model),
                         osg::Matrixd(), true, nullptr, {});
}

// Reading models is the long part, and several can be read at a time.
void PreloadModels(Session& session, const SceneArguments& scene)
{
    std::vector<std::wstring> statics, movables;
    for (const StaticArgument& argument : scene.statics)
        statics.push_back(ModelPath(session, argument.model));
    for (const MovableArgument& argument : scene.movables)
        movables.push_back(ModelPath(session, argument.model));
    VtCOsgAssetManager::getInstance().preloadModels(statics, false);
    VtCOsgAssetManager::getInstance().preloadModels(movables, true);
}

std::string SpanText(const TimeSpan& span)
{
    return fmt::format("from {} s to {} s", base::FormatDouble(span.first), base::FormatDouble(span.last));
}

std::string Joined(const std::vector<std::wstring>& names)
{
    std::string text;
    for (const std::wstring& name : names)
        text += (text.empty() ? "" : ", ") + base::Utf8(name);
    return text;
}

} // namespace

VtCPanoramicDocument* OpenScene(Session& session, const SceneArguments& scene)
{
    // The data come first: a body finds its channel by name only where there are channels.
    if (!scene.data.empty() && !LoadData(session, scene.data))
        return nullptr;
    if (!scene.source.empty() && !ChooseSource(session, scene.source))
        return nullptr;
    if (!scene.file.empty())
        return session.OpenDocument(Complete(scene.file));
    VtCPanoramicDocument* document = session.NewDocument();
    if (!document)
        return nullptr;
    BuildBodies(session, *document, scene);
    const bool moves = !scene.data.empty() || !scene.source.empty();
    return !moves || BindChannels(session, *document, scene.movables) ? document : nullptr;
}

void BuildBodies(Session& session, VtCPanoramicDocument& document, const SceneArguments& scene)
{
    host::Progress& progress = *session.GetHost().GetProgress();
    progress.ConnectProgressActivity(loadingScene, session.GetHost().GetTexts().GetText(textLoadingScene), {});
    PreloadModels(session, scene);
    progress.SetProgresStepCount(loadingScene, static_cast<long>(scene.statics.size() + scene.movables.size()));
    for (const StaticArgument& argument : scene.statics)
    {
        progress.SetProgressDescription(loadingScene, base::Wide(argument.model.filename().string()));
        BuildStatic(session, document, argument);
        progress.StepProgressActivity(loadingScene);
    }
    for (const MovableArgument& argument : scene.movables)
    {
        progress.SetProgressDescription(loadingScene, base::Wide(argument.name));
        BuildMovable(session, document, argument);
        progress.StepProgressActivity(loadingScene);
    }
    progress.DisconnectProgressActivity(loadingScene);
}

bool LoadData(Session& session, const std::filesystem::path& file)
{
    return session.GetController().LoadMotionData(base::InnerPath(Complete(file)));
}

bool ChooseSource(Session& session, const std::string& source)
{
    const std::size_t colon = source.find(':');
    const std::string given = source.substr(0, colon);
    const std::wstring name = base::Wide(given);
    VtCSimulationDataController& controller = session.GetController();
    VtCSimulationDataRouter& router = controller.GetRouter();
    SimulationDataPoints::VtCSimulationDataPoint* point = router.FindPoint(name);
    if (!point || !point->IsSource())
    {
        session.GetHost().ShowError(messageNoSource, given,
                                    Joined(router.GetPointNames(VtCSimulationDataRouter::sources)));
        return false;
    }
    if (colon != std::string::npos && !point->Configure(point->GetName(), base::Wide(source.substr(colon + 1)), 1, 0))
    {
        if (SimulationDataPoints::VtCMessageStack* stack = point->GetMessageStack())
        {
            session.GetApp().GetMessageHandler().ReportStack(*stack);
            point->ResetMessageStack();
        }
        else
            session.GetHost().ShowError(messageSourceRefuses, given, source.substr(colon + 1));
        return false;
    }
    controller.ChoosePoint(name);
    return true;
}

bool RunSourceTo(Session& session, double time)
{
    VtCSimulationDataController& controller = session.GetController();
    VtCSimulationDataRouter& router = controller.GetRouter();
    if (!router.GetActivePoint()->IsTimeDriven())
    {
        session.GetHost().ShowError(messageSourceHasOwnTime, base::Utf8(router.GetActivePointName()));
        return false;
    }
    controller.Start();
    if (!controller.IsOnline())
        return false;
    // A clock that knows only what it is told. The source may need several calls to get there.
    router.GetClock().StartScaledClock(0.0, 1.0);
    bool goesOn = true;
    for (double reached = -1.0; goesOn;)
    {
        router.SetCurrentTime(time);
        goesOn = router.FetchFrames() && router.GetCurrentTime() > reached;
        reached = std::max(reached, router.GetCurrentTime());
    }
    controller.Stop();
    return session.GetExitStatus() == 0;
}

bool BindChannels(Session& session, VtCPanoramicDocument& document, const std::vector<MovableArgument>& movables)
{
    const VtTChannelLists& channels = session.GetController().GetRouter().GetActiveChannels();
    const std::vector<VtC3DMovableBody*>& bodies = document.GetScene()->GetMovableBodies(0)->GetBodies();
    bool complete = true;
    for (std::size_t i = 0; i < movables.size() && i < bodies.size(); ++i)
    {
        const std::wstring wanted = base::Wide(movables[i].channel);
        const auto found = std::find_if(channels.poses.begin(), channels.poses.end(),
                                        [&](const std::wstring& name) { return base::EqualsNoCase(name, wanted); });
        if (found == channels.poses.end())
        {
            session.GetHost().ShowError(messageNoChannel, movables[i].name, movables[i].channel);
            complete = false;
            continue;
        }
        const auto index = static_cast<std::int32_t>(found - channels.poses.begin());
        if (const osg::ref_ptr<VtISceneObject> record = bodies[i]->GetAttributeObject())
            record->Write(attribute::channelIndex, index);
    }
    if (!complete)
        session.GetHost().ShowInformation(messageChannelsAre, Joined(channels.poses));
    return complete;
}

std::optional<TimeSpan> GetTimeSpan(Session& session)
{
    const SimulationDataPoints::VtCSimulationDataPoint* point = session.GetController().GetRouter().GetActivePoint(0);
    TimeSpan span;
    if (!point || !point->GetFrameBufferEarliestTime(span.first) || !point->GetFrameBufferLatestTime(span.last))
        return std::nullopt;
    return span;
}

bool CheckTime(Session& session, double time, const TimeSpan& span)
{
    if (time >= span.first && time <= span.last)
        return true;
    session.GetHost().ShowError(messageTimeOutside, base::FormatDouble(time) + " s", SpanText(span));
    return false;
}

bool CheckTime(Session& session, double time, const std::filesystem::path& file)
{
    const std::optional<TimeSpan> span = GetTimeSpan(session);
    if (!span)
    {
        session.GetHost().ShowError(messageNoTimeStamps, file.string());
        return false;
    }
    return CheckTime(session, time, *span);
}

bool GoToTime(Session& session, double time, const std::filesystem::path& file)
{
    if (!CheckTime(session, time, file))
        return false;
    SimulationDataPoints::VtCSimulationDataFrame* frame =
        session.GetController().GetRouter().GetActivePoint(0)->GetAtTime(time);
    return frame && GoToFrame(session, frame->GetFrameId());
}

bool GoToFrame(Session& session, long number)
{
    VtCSimulationDataController& controller = session.GetController();
    const unsigned long count = controller.GetRouter().GetBufferedFrames({});
    if (number >= 1 && static_cast<unsigned long>(number) <= count && controller.ShowFrame({}, number))
        return true;
    session.GetHost().ShowError(messageNoSuchFrame, std::to_string(number), fmt::format("from 1 to {}", count));
    return false;
}

} // namespace console
