#pragma once

class QWidget;
class VtCPanoramicApp;

namespace desktop
{

class StateFile;

/// Keys of the program's own settings in the state file.
inline constexpr const char* desktopSection = "Desktop";
inline constexpr const char* pacedKey = "Paced";

/// Are pictures paced to the screen? They are unless the user has turned that off.
bool IsPaced(const StateFile& state);

/// Shows the settings and takes them over when the user agrees; true then.
bool EditSettings(QWidget& parent, VtCPanoramicApp& app, StateFile& state);

} // namespace desktop
