#pragma once

#include <QIcon>
#include <QString>

namespace desktop
{

/// An icon from a drawing in one colour: wherever the file says "currentColor" it takes the colour of button texts in
/// the palette of the moment, so that it can be seen on light and on dark windows. Drawn anew for each size.
QIcon MakeThemedIcon(const QString& file);

} // namespace desktop
