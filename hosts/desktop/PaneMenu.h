#pragma once

class QMenu;
class QWidget;
class VtCPanoramicDocument;
class VtCPanoramicView;

namespace host
{
class Texts;
}

namespace desktop
{

class CommandActions;

/// The menu of a pane: the observers that it may look through, then the commands of the views. It deletes itself when
/// it closes.
QMenu* MakePaneMenu(QWidget& parent, VtCPanoramicDocument& document, VtCPanoramicView& view, CommandActions& actions,
                    const host::Texts& texts);

} // namespace desktop
