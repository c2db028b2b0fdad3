#pragma once

#include "hosts/desktop/controller/ThemedIcon.h"

namespace desktop
{

/// An icon of the program's resources by its name: "open", or "controller/play" of those that the controller's dock
/// has too.
inline QIcon MakeIcon(const QString& name)
{
    const auto slash = name.lastIndexOf('/') + 1;
    return MakeThemedIcon(":/" + name.left(slash) + "icons/" + name.mid(slash) + ".svg");
}

} // namespace desktop
