#pragma once

#include <functional>
#include <optional>
#include <string>

class QWidget;
class VtCPanoramicApp;

namespace desktop
{

class DesktopHost;
class StateFile;

/// The file commands: which scene is open, from which file, and from which file its data come.
///
/// One scene is open at a time, and there always is one; without a file it is an empty one. A scene is closed only when
/// the next can be had.
class SceneFiles
{
public:
    /// All of them outlive this. `changed` is called when another file is open, or the list of recent ones differs.
    SceneFiles(VtCPanoramicApp& application, DesktopHost& desktopHost, StateFile& stateFile, QWidget& parentWindow,
               std::function<void()> changed);

    /// Begins an empty scene.
    void New();

    /// Asks for a file.
    void Open();
    void OpenData();

    /// Opens a file by its kind, which its extension tells: a scene, or data. False after a message. Inner form.
    bool OpenFile(const std::wstring& path);

    /// False when nothing was saved.
    bool Save();
    bool SaveAs();

    /// Asks whether changes are to be saved; false when the scene must stay open.
    bool MayClose();

    void CloseScene();

    /// Inner form; empty without one.
    const std::wstring& GetScenePath() const { return scenePath; }
    const std::wstring& GetDataPath() const { return dataPath; }

    /// Its name for titles and questions.
    std::wstring GetSceneName() const;
    bool IsModified() const;

private:
    bool OpenScene(const std::wstring& path);
    bool LoadData(const std::wstring& path);
    bool SaveTo(const std::wstring& path);

    /// Whether what is loaded was read from this file, after a message. A scene may be saved to its own.
    bool RefuseInput(const std::wstring& path, const std::wstring& extension);
    bool CanRead(const std::wstring& path);
    void Remember(const std::wstring& path);

    VtCPanoramicApp& app;
    DesktopHost& host;
    StateFile& state;
    QWidget& window;
    std::function<void()> changed;
    std::wstring scenePath;
    std::wstring dataPath;
};

} // namespace desktop
