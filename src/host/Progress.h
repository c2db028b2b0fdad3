#pragma once

#include <string>

namespace host
{

/// Progress of long work, by activity number; several activities may be open at once, one inside another.
class Progress
{
public:
    virtual ~Progress() = default;

    virtual void ConnectProgressActivity(long id, const std::wstring& title, const std::wstring& text) = 0;

    /// Starts `id` over with `count` steps; opens it without a title if it isn't connected.
    virtual void SetProgresStepCount(long id, long count) = 0;
    virtual void StepProgressActivity(long id) = 0;
    virtual void SetProgressDescription(long id, const std::wstring& text) = 0;
    virtual void DisconnectProgressActivity(long id) = 0;

    /// Closes every activity.
    virtual void CleanUp() = 0;
};

} // namespace host
