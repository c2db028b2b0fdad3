#pragma once

namespace host
{

class Clock;
class Configuration;
class DocumentManager;
class Graphics;
class LibraryPaths;
class MainWindow;
class MessageService;
class Progress;
class PropertySheets;
class Questions;
class Selection;
class Settings;
class Texts;
class UserInterface;
class Variables;
class ViewWindows;

/// The program around the component, as the application object is given it.
///
/// Services by reference are always there. Those by pointer may be null: the operation that needs one is then left
/// out. The host outlives the component.
class Host
{
public:
    virtual ~Host() = default;

    virtual Clock& GetClock() = 0;
    virtual Texts& GetTexts() = 0;
    virtual LibraryPaths& GetLibraryPaths() = 0;
    virtual Selection& GetSelection() = 0;

    virtual MainWindow* GetMainWindow() = 0;
    virtual Variables* GetVariables() = 0;
    virtual UserInterface* GetUserInterface() = 0;
    virtual DocumentManager* GetDocumentManager() = 0;
    virtual MessageService* GetMessageService() = 0;
    virtual Progress* GetProgress() = 0;
    virtual Configuration* GetConfiguration() = 0;
    virtual Settings* GetSettings() = 0;
    virtual Questions* GetQuestions() = 0;
    virtual Graphics* GetGraphics() = 0;
    virtual ViewWindows* GetViewWindows() = 0;

    /// Null in a host without dialogs.
    virtual PropertySheets* GetPropertySheets() { return nullptr; }
};

} // namespace host
