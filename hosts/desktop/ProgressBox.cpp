#include "hosts/desktop/ProgressBox.h"

#include <algorithm>

#include <QCoreApplication>
#include <QDialog>
#include <QLabel>
#include <QProgressBar>
#include <QVBoxLayout>

#include "host/Clock.h"
#include "hosts/desktop/Wording.h"

namespace desktop
{

namespace
{

constexpr std::uint32_t showAfter = 300;     // milliseconds
constexpr std::uint32_t updateInterval = 40; // drawing must not cost more than the work
constexpr int boxWidth = 420;

} // namespace

ProgressBox::ProgressBox(const host::Clock& ticker) : clock(ticker) {}

ProgressBox::~ProgressBox() = default;

void ProgressBox::SetWindow(QWidget* window)
{
    parent = window;
    if (!parent)
        box.reset();
}

ProgressBox::Activity& ProgressBox::Open(long id)
{
    if (activities.empty())
    {
        suspended.emplace(VtCFrameSuspension::Extent::steps);
        started = updated = clock.TickCount();
    }
    return activities.emplace_back(Activity{id, {}, {}});
}

void ProgressBox::Close()
{
    box.reset();
    suspended.reset();
}

void ProgressBox::ConnectProgressActivity(long id, const std::wstring& title, const std::wstring& text)
{
    Activity* activity = Find(id);
    if (!activity)
        activity = &Open(id);
    *activity = {id, ToQt(title), ToQt(text)};
    Update();
}

void ProgressBox::SetProgresStepCount(long id, long count)
{
    Activity* activity = Find(id);
    if (!activity)
        activity = &Open(id);
    activity->count = std::max(count, 0L);
    activity->steps = 0;
    Update();
}

void ProgressBox::StepProgressActivity(long id)
{
    Activity* activity = Find(id);
    if (!activity)
        return;
    if (activity->steps < activity->count)
        ++activity->steps;
    Update();
}

void ProgressBox::SetProgressDescription(long id, const std::wstring& text)
{
    Activity* activity = Find(id);
    if (!activity)
        return;
    activity->text = ToQt(text);
    Update();
}

void ProgressBox::DisconnectProgressActivity(long id)
{
    if (std::erase_if(activities, [id](const Activity& a) { return a.id == id; }) == 0)
        return;
    if (activities.empty())
        Close();
    else
        Update();
}

void ProgressBox::CleanUp()
{
    if (activities.empty())
        return;
    activities.clear();
    Close();
}

ProgressBox::Activity* ProgressBox::Find(long id)
{
    const auto at = std::find_if(activities.begin(), activities.end(), [id](const Activity& a) { return a.id == id; });
    return at == activities.end() ? nullptr : &*at;
}

void ProgressBox::Update()
{
    const std::uint32_t now = clock.TickCount();
    if (!parent || now - updated < updateInterval || (!box && now - started < showAfter))
        return;
    updated = now;
    if (!box)
        MakeBox();

    // Of activities within one another each may have a part of what is to be told.
    const auto innermost = [this](auto has) -> const Activity&
    {
        const auto at = std::find_if(activities.rbegin(), activities.rend(), has);
        return at == activities.rend() ? activities.back() : *at;
    };
    const Activity& counted = innermost([](const Activity& a) { return a.count > 0; });
    box->setWindowTitle(innermost([](const Activity& a) { return !a.title.isEmpty(); }).title);
    description->setText(innermost([](const Activity& a) { return !a.text.isEmpty(); }).text);
    bar->setRange(0, static_cast<int>(counted.count)); // 0 to 0 is a bar that runs to and fro
    bar->setValue(static_cast<int>(counted.steps));
    QCoreApplication::processEvents(QEventLoop::ExcludeUserInputEvents);
}

void ProgressBox::MakeBox()
{
    box = std::make_unique<QDialog>(parent, Qt::Dialog | Qt::CustomizeWindowHint | Qt::WindowTitleHint);
    box->setWindowModality(Qt::WindowModal);
    box->setMinimumWidth(boxWidth);
    description = new QLabel(box.get());
    description->setTextFormat(Qt::PlainText);
    bar = new QProgressBar(box.get());
    auto* layout = new QVBoxLayout(box.get());
    layout->addWidget(description);
    layout->addWidget(bar);
    box->show();
}

} // namespace desktop
