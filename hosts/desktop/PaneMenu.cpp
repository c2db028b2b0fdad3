#include "hosts/desktop/PaneMenu.h"

#include <QActionGroup>
#include <QMenu>

#include "app/PanoramicDocument.h"
#include "hosts/desktop/CommandActions.h"
#include "hosts/desktop/Wording.h"
#include "interaction/Observer.h"
#include "interaction/Observers.h"
#include "render/ChildFrame.h"
#include "render/PanoramicView.h"
#include "scene/ObjectHandle.h"

namespace desktop
{

QMenu* MakePaneMenu(QWidget& parent, VtCPanoramicDocument& document, VtCPanoramicView& view, CommandActions& actions,
                    const host::Texts& texts)
{
    auto* menu = new QMenu(&parent);
    menu->setAttribute(Qt::WA_DeleteOnClose);
    menu->addSection(ToQt(view.getName()) + " - " + Part(texts, textObserver, 0));
    auto* group = new QActionGroup(menu);
    for (VtC3DObserver* observer : document.GetObservers().GetObservers())
    {
        QAction* choice = menu->addAction(ToQt(observer->GetName()).replace('&', "&&"));
        choice->setCheckable(true);
        choice->setChecked(view.getObserver() == observer);
        choice->setStatusTip(Part(texts, textObserver, 1));
        group->addAction(choice);
        // The observer may have gone by the time the choice is made.
        QObject::connect(choice, &QAction::triggered, menu,
                         [&document, handle = VtCObjectHandle<VtC3DObserver>(observer), pane = view.getViewPosition()]
                         {
                             VtCChildFrame* frame = document.GetChildFrame();
                             VtCPanoramicView* chosen = frame ? frame->getSplitter().getView(pane) : nullptr;
                             const VtC3DObserver* present = handle.Get();
                             if (chosen && present && chosen->assignObserverByName(present->GetName()))
                                 document.SetModified(true);
                         });
    }
    actions.AddGroups(*menu, {host::CommandGroup::camera, host::CommandGroup::layout}, host::inMenu);
    actions.AddGroups(*menu->addMenu(Part(texts, textRenderMode, 0)), {host::CommandGroup::renderMode}, host::inMenu);
    return menu;
}

} // namespace desktop
