#pragma once

#include <cstdint>
#include <string>

#include <QString>

namespace host
{
class Texts;
}

/// Texts of the desktop program by their number, and text on its way to the toolkit and back. Those of commands have
/// the number of the command.
namespace desktop
{

enum WordingNumber : std::uint32_t
{
    textApplication = 101,
    textSimulationDock = 6247,
    textFrame = 6279,
    textTime = 6280,
    textFileMenu = 9131,
    textViewMenu = 9132,
    textSimulationMenu = 9133,
    textRecent = 9137, ///< the sub-menu, and its last entry
    textHelpMenu = 9141,
    textPaneKeys = 9142, ///< a heading, and the keys that work in a pane
    textDataPoint = 9164,
    textObserver = 9166,
    textLog = 9167,         ///< the dock, and what its menu has
    textToolBars = 9168,    ///< one name for each
    textSaveChanges = 9169, ///< %1 the scene
    textSelected = 9170,    ///< %1 the body
    textSettingLabels = 9171,
    textUntitled = 9172,
    textRenderMode = 9173,
    textFrameRate = 9174,    ///< %1 frames a second
    messageOtherFile = 9175, ///< %1 the file
    textDataFilter = 9176,
    textReplacement = 9177,  ///< %1 the body, %2 the observers
    textSeverities = 9178,   ///< information, warning, error, log
    textMoreMessages = 9179, ///< %1 their number
    textPosition = 9185,
    textCount = 9186,    ///< %1 frames
    textSeconds = 9187,  ///< %1 seconds
    textViewName = 9010, ///< of pane 1, the others following
};

QString ToQt(const std::wstring& text);
std::wstring FromQt(const QString& text);

/// A path of the file system in the inner form.
std::wstring InnerPath(const QString& path);

/// The path of the inner form as users see it.
QString ShownPath(const std::wstring& path);

/// Part `index` of a text whose parts are separated by "|"; empty beyond the last.
QString Part(const host::Texts& texts, std::uint32_t number, int index);

/// The label of a menu as a name: without the mark of its key, and without the dots that announce a dialog.
QString Plain(QString label);

} // namespace desktop
