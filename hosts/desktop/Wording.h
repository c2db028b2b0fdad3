#pragma once

#include <cstdint>
#include <string>

#include <QString>

namespace host
{
class Texts;
}

/// Texts of the desktop program by their number, and text on its way to the toolkit and back.
namespace desktop
{

enum WordingNumber : std::uint32_t
{
    textApplication = 101,
    textFileMenu = 9131,
    textViewMenu = 9132,
    textSimulationMenu = 9133,
    textNewScene = 9134,
    textOpenScene = 9135,
    textOpenData = 9136,
    textRecent = 9137, ///< the sub-menu, and its last entry
    textSave = 9138,
    textSaveAs = 9139,
    textQuit = 9140,
    textSingleView = 9141,
    textTwoColumns = 9142,
    textTwoRows = 9143,
    textFourViews = 9144,
    textGouraud = 9145,
    textTextured = 9146,
    textFlat = 9147,
    textWireFrame = 9148,
    textMixed = 9149,
    textStraighten = 9150,
    textStart = 9151,
    textStop = 9152,
    textFirstFrame = 9153,
    textPreviousFrame = 9154,
    textStopPlay = 9155,
    textNextFrame = 9156,
    textLastFrame = 9157,
    textPlayOnce = 9158,
    textPlayLoop = 9159,
    textStore = 9160,
    textRefreshData = 9161,
    textRefreshChannels = 9162,
    textNoDataPoint = 9163,
    textDataSource = 9164,
    textSettings = 9165,
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
};

QString ToQt(const std::wstring& text);
std::wstring FromQt(const QString& text);

/// A path of the file system in the inner form.
std::wstring InnerPath(const QString& path);

/// The path of the inner form as users see it.
QString ShownPath(const std::wstring& path);

/// Part `index` of a text whose parts are separated by "|"; empty beyond the last.
QString Part(const host::Texts& texts, std::uint32_t number, int index);

} // namespace desktop
