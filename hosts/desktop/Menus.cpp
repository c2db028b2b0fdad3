#include "hosts/desktop/Menus.h"

#include <QAction>
#include <QDialog>
#include <QDockWidget>
#include <QMainWindow>
#include <QMenu>
#include <QMenuBar>
#include <QTextBrowser>
#include <QToolBar>
#include <QToolButton>
#include <QVBoxLayout>

#include "host/Frame.h"
#include "hosts/desktop/CommandActions.h"
#include "hosts/desktop/Icons.h"
#include "hosts/desktop/StateFile.h"
#include "hosts/desktop/WindowCommands.h"
#include "hosts/desktop/Wording.h"
#include "simdata/ControllerCommands.h"

namespace desktop
{

namespace
{

using enum host::CommandGroup;

struct MenuPlan
{
    std::uint32_t title;
    std::initializer_list<host::CommandGroup> groups;
};

const MenuPlan fileMenu{textFileMenu, {file, program}};
const MenuPlan viewMenu{textViewMenu, {layout, renderMode, camera, panes}};
const MenuPlan simulationMenu{textSimulationMenu, {simulation, frames, data}};
const MenuPlan helpMenu{textHelpMenu, {help}};

constexpr QSize helpSize(720, 640);

} // namespace

Menus::Menus(QMainWindow& mainWindow, CommandActions& commandActions, const host::Texts& displayTexts,
             StateFile& stateFile, std::function<void(const QString&)> openFile)
    : window(mainWindow), actions(commandActions), texts(displayTexts), state(stateFile), open(std::move(openFile))
{
}

void Menus::Build()
{
    const auto add = [this](const MenuPlan& plan)
    {
        QMenu* menu = window.menuBar()->addMenu(Part(texts, plan.title, 0));
        actions.AddGroups(*menu, plan.groups, host::inMenu);
        return menu;
    };
    QMenu* files = add(fileMenu);
    recent = new QMenu(Part(texts, textRecent, 0), files);
    recent->setIcon(MakeIcon("recent"));
    files->insertMenu(actions.Get(commandSave), recent);
    files->insertSeparator(actions.Get(commandSave));
    connect(recent, &QMenu::aboutToShow, this, [this] { FillRecent(); });

    QMenu* views = add(viewMenu);

    QMenu* simulations = add(simulationMenu);
    sources = new QMenu(Part(texts, textDataPoint, 0), simulations);
    sources->setIcon(MakeIcon("source"));
    simulations->insertMenu(simulations->actions().front(), sources);
    connect(sources, &QMenu::aboutToShow, this, [this] { FillSources(); });

    add(helpMenu);
    BuildToolBars(*views);
}

QToolBar* Menus::AddBar(const char* name, int title)
{
    QToolBar* bar = window.addToolBar(Part(texts, textToolBars, title));
    bar->setObjectName(name);
    return bar;
}

void Menus::BuildToolBars(QMenu& view)
{
    QToolBar* files = AddBar("files", 0);
    actions.AddGroups(*files, fileMenu.groups, host::onToolBar);
    QToolBar* views = AddBar("views", 1);
    actions.AddGroups(*views, viewMenu.groups, host::onToolBar);

    QToolBar* simulations = AddBar("simulation", 2);
    auto* sourceButton = new QToolButton;
    sourceButton->setObjectName("source");
    sourceButton->setIcon(MakeIcon("source"));
    sourceButton->setMenu(sources);
    sourceButton->setPopupMode(QToolButton::InstantPopup);
    sourceButton->setToolTip(Plain(Part(texts, textDataPoint, 0)));
    sourceButton->setAccessibleName(sourceButton->toolTip());
    sourceButton->setStatusTip(Part(texts, textDataPoint, 1));
    simulations->addWidget(sourceButton);
    actions.AddGroups(*simulations, simulationMenu.groups, host::onToolBar);

    view.addSeparator();
    for (QToolBar* bar : {files, views, simulations})
        view.addAction(bar->toggleViewAction());
    view.addSeparator();
    for (QDockWidget* dock : window.findChildren<QDockWidget*>())
        view.addAction(dock->toggleViewAction());
}

void Menus::FillSources()
{
    using namespace ControllerCommand;
    sources->clear();
    sources->addAction(actions.Get(noDataPoint));
    sources->addSeparator();
    const std::vector<std::wstring> entries =
        toolBarEvents ? toolBarEvents->OnDropDown(firstSelect) : std::vector<std::wstring>();
    for (std::uint32_t i = 0; i < entries.size() && firstSelect + i <= lastSelect; ++i)
        sources->addAction(actions.Get(firstSelect + i));
    actions.Refresh();
}

void Menus::FillRecent()
{
    recent->clear();
    for (const std::string& path : state.GetRecentFiles())
    {
        const QString shown = QString::fromStdString(path);
        connect(recent->addAction(QString(shown).replace('&', "&&")), &QAction::triggered, this,
                [this, shown] { open(shown); });
    }
    const bool any = !recent->isEmpty();
    recent->addSeparator();
    QAction* clear = recent->addAction(Part(texts, textRecent, 2));
    clear->setEnabled(any);
    connect(clear, &QAction::triggered, this, [this] { state.ClearRecentFiles(); });
}

void Menus::ShowHelp() const
{
    QString page;
    for (const MenuPlan* plan : {&fileMenu, &viewMenu, &simulationMenu, &helpMenu})
        page += "<h3>" + Plain(Part(texts, plan->title, 0)).toHtmlEscaped() + "</h3><table cellpadding='3'>" +
                actions.MakeHelp(plan->groups) + "</table>";
    page += "<h3>" + Part(texts, textPaneKeys, 0).toHtmlEscaped() + "</h3><p>" +
            Part(texts, textPaneKeys, 1).toHtmlEscaped().replace("\n", "<br>") + "</p>";

    auto* dialog = new QDialog(&window);
    dialog->setAttribute(Qt::WA_DeleteOnClose);
    dialog->setObjectName("help");
    dialog->setWindowTitle(Plain(Part(texts, commandHelp, 0)));
    auto* column = new QVBoxLayout(dialog);
    column->setContentsMargins(0, 0, 0, 0);
    auto* browser = new QTextBrowser;
    browser->setHtml(page);
    column->addWidget(browser);
    dialog->resize(helpSize);
    dialog->show();
}

} // namespace desktop
