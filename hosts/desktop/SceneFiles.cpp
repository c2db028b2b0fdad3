#include "hosts/desktop/SceneFiles.h"

#include <malloc.h>

#include <QMessageBox>

#include "app/PanoramicApp.h"
#include "app/PanoramicDocument.h"
#include "assets/AssetManager.h"
#include "base/AtomicFile.h"
#include "base/FrameSuspension.h"
#include "base/Paths.h"
#include "base/Text.h"
#include "hosts/common/HostTexts.h"
#include "hosts/desktop/DesktopHost.h"
#include "hosts/desktop/StateFile.h"
#include "hosts/desktop/WindowCommands.h"
#include "hosts/desktop/Wording.h"
#include "records/SceneObjectStore.h"
#include "simdata/SimulationDataController.h"

namespace desktop
{

namespace
{

constexpr std::uint32_t messageSceneNotReadable = 496; // %1 the file, %2 the reason
constexpr std::uint32_t messageIsInput = 9126;         // %1 the file
constexpr std::uint32_t textOtherSceneType = 9014;

constexpr std::uint32_t textLoadingScene = 7002;

// Numbers of the progress activities.
constexpr long loadingScene = 40;
constexpr long loadingRecords = 51;
constexpr long loadingBody = 50;

const std::wstring sceneFilter = L"Scene Config Files (*.xml)|*.xml||";

bool HasExtension(const std::wstring& path, const wchar_t* extension)
{
    return base::EqualsNoCase(base::Wide(base::NativePath(path).extension().string()), extension);
}

} // namespace

SceneFiles::SceneFiles(VtCPanoramicApp& application, DesktopHost& desktopHost, StateFile& stateFile,
                       QWidget& parentWindow, std::function<void()> changedFiles)
    : app(application), host(desktopHost), state(stateFile), window(parentWindow), changed(std::move(changedFiles))
{
    host.GetFileQuestions().SetRefusal([this](const std::wstring& path, const std::wstring& extension)
                                       { return RefuseInput(path, extension); });
}

bool SceneFiles::IsModified() const
{
    const VtCPanoramicDocument* document = app.GetActiveDocument();
    return document && document->IsModified();
}

std::wstring SceneFiles::GetSceneName() const
{
    return scenePath.empty() ? host.GetTexts().GetText(textUntitled)
                             : base::Wide(base::NativePath(scenePath).filename().string());
}

void SceneFiles::New()
{
    if (!MayClose())
        return;
    const VtCFrameSuspension suspended; // a step or a picture would find half a scene
    CloseScene();
    host.GetDocumentManager()->NewDocument();
    changed();
}

void SceneFiles::Open()
{
    if (const auto path = host.GetQuestions()->AskOpenFile(
            {FromQt(Part(host.GetTexts(), commandOpenScene, 1)), sceneFilter, L"xml", scenePath}))
        OpenScene(*path);
}

void SceneFiles::OpenData()
{
    if (const auto path = host.GetQuestions()->AskOpenFile({FromQt(Part(host.GetTexts(), commandOpenData, 1)),
                                                            host.GetTexts().GetText(textDataFilter), L"mdf", dataPath}))
        LoadData(*path);
}

bool SceneFiles::OpenFile(const std::wstring& path)
{
    if (HasExtension(path, L".xml"))
        return OpenScene(path);
    if (HasExtension(path, L".mdf"))
        return LoadData(path);
    app.GetMessageHandler().ShowWarning(messageOtherFile, FromQt(ShownPath(path)));
    return false;
}

bool SceneFiles::CanRead(const std::wstring& path)
{
    std::wstring reason;
    if (!HasExtension(path, L".xml"))
        reason = host.GetTexts().GetText(textOtherSceneType);
    else
    {
        VtCSceneObjectStore trial;
        if (trial.LoadFile(path))
            return true;
        reason = trial.GetFileError();
    }
    app.GetMessageHandler().ShowError(messageSceneNotReadable, FromQt(ShownPath(path)), reason);
    return false;
}

bool SceneFiles::OpenScene(const std::wstring& path)
{
    if (!CanRead(path) || !MayClose())
        return false;
    const VtCFrameSuspension suspended; // a step or a picture would find half a scene
    // A scene takes its data with it when it closes; the source that the user chose serves the next one too.
    VtCSimulationDataController* controller = app.GetController();
    const std::wstring source = controller ? controller->GetRouter().GetActivePointName(0) : std::wstring();
    CloseScene();
    if (controller && !source.empty())
        controller->ChoosePoint(source);
    host::Progress& progress = *host.GetProgress();
    const std::wstring title = host.GetTexts().GetText(textLoadingScene);
    for (const long activity : {loadingScene, loadingRecords, loadingBody})
        progress.ConnectProgressActivity(activity, title, {});
    const bool opened = host.GetDocumentManager()->OpenDocument(path) != nullptr;
    for (const long activity : {loadingBody, loadingRecords, loadingScene})
        progress.DisconnectProgressActivity(activity);
    if (opened)
    {
        scenePath = path;
        Remember(path);
    }
    else
        host.GetDocumentManager()->NewDocument();
    if (controller && !source.empty())
        controller->GotoFirst();
    changed();
    return opened;
}

void SceneFiles::CloseScene()
{
    if (VtCSimulationDataController* controller = app.GetController())
    {
        controller->StopPlay();
        controller->Stop();
        controller->Reset();
    }
    while (host.GetDocumentManager()->GetActiveDocument())
        host.GetDocumentManager()->CloseActiveDocument();
    scenePath.clear();
    // Models are read by several threads, and the allocator keeps what each of them has needed at most.
    malloc_trim(0);
}

bool SceneFiles::LoadData(const std::wstring& path)
{
    VtCSimulationDataController* controller = app.GetController();
    const VtCFrameSuspension suspended(VtCFrameSuspension::Extent::steps);
    if (!controller || !controller->LoadMotionData(path))
        return false;
    dataPath = path;
    Remember(path);
    changed();
    return true;
}

bool SceneFiles::Save()
{
    return scenePath.empty() ? SaveAs() : SaveTo(scenePath);
}

bool SceneFiles::SaveAs()
{
    const auto path = host.GetQuestions()->AskSaveFile(
        {FromQt(Part(host.GetTexts(), commandSaveAs, 1)), sceneFilter, L"xml", scenePath});
    return path && SaveTo(*path);
}

bool SceneFiles::RefuseInput(const std::wstring& path, const std::wstring& extension)
{
    const std::filesystem::path output = base::NativePath(path);
    const auto isSame = [&](const std::wstring& input)
    { return !input.empty() && base::IsSameFile(output, base::NativePath(input)); };
    const bool isOwnScene = extension == L"xml" && isSame(scenePath);
    if (isOwnScene || !(isSame(scenePath) || isSame(dataPath) || VtCOsgAssetManager::getInstance().hasRead(output)))
        return false;
    app.GetMessageHandler().ShowError(messageIsInput, FromQt(ShownPath(path)));
    return true;
}

bool SceneFiles::SaveTo(const std::wstring& path)
{
    VtCPanoramicDocument* document = app.GetActiveDocument();
    if (!document || !document->OnSaveDocument(path))
        return false;
    scenePath = path;
    Remember(path);
    changed();
    return true;
}

bool SceneFiles::MayClose()
{
    if (!IsModified())
        return true;
    QMessageBox question(QMessageBox::Question, ToQt(app.GetName()),
                         ToQt(hosts::IniTexts::Format(host.GetTexts(), textSaveChanges, GetSceneName(), {})),
                         QMessageBox::Save | QMessageBox::Discard | QMessageBox::Cancel, &window);
    question.setDefaultButton(QMessageBox::Save);
    switch (question.exec())
    {
    case QMessageBox::Save:
        return Save();
    case QMessageBox::Discard:
        return true;
    default:
        return false;
    }
}

void SceneFiles::Remember(const std::wstring& path)
{
    state.AddRecentFile(base::NativePath(path).string());
}

} // namespace desktop
