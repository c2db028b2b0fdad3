#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <vector>

#include <QString>

#include "base/FrameSuspension.h"
#include "host/Progress.h"

class QDialog;
class QLabel;
class QProgressBar;
class QWidget;

namespace host
{
class Clock;
}

namespace desktop
{

/// Long work as a box with a title, what is being done, and a bar; of several activities the innermost. Work that is
/// done before the box would be seen gets none.
///
/// While there is an activity the program draws its windows now and then, but takes no input and makes no pictures.
class ProgressBox : public host::Progress
{
public:
    /// `ticker` outlives this.
    explicit ProgressBox(const host::Clock& ticker);
    ~ProgressBox() override;

    /// The box opens over `window`; null keeps it closed.
    void SetWindow(QWidget* window);

    void ConnectProgressActivity(long id, const std::wstring& title, const std::wstring& text) override;
    void SetProgresStepCount(long id, long count) override;
    void StepProgressActivity(long id) override;
    void SetProgressDescription(long id, const std::wstring& text) override;
    void DisconnectProgressActivity(long id) override;
    void CleanUp() override;

private:
    struct Activity
    {
        long id;
        QString title;
        QString text;
        long count = 0;
        long steps = 0;
    };

    Activity* Find(long id);
    Activity& Open(long id);
    void Close();
    void Update();
    void MakeBox();

    const host::Clock& clock;
    std::optional<VtCFrameSuspension> suspended; ///< while there is an activity
    QWidget* parent = nullptr;
    std::vector<Activity> activities;
    std::uint32_t started = 0;
    std::uint32_t updated = 0;
    std::unique_ptr<QDialog> box;
    QLabel* description = nullptr;
    QProgressBar* bar = nullptr;
};

} // namespace desktop
