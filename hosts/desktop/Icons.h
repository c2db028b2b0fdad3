#pragma once

#include <QIcon>
#include <QString>

namespace desktop
{

/// An icon of the program by the name of its drawing: "open", "play". Null for a name without one.
///
/// Drawings have one colour: wherever the file says "currentColor" it takes the colour of button texts in the palette
/// of the moment, so that it can be seen on light and on dark windows. Drawn anew for each size.
QIcon MakeIcon(const QString& name);

} // namespace desktop
