#pragma once

#include "host/Idle.h"

class VtCFrameCycle;

/// Takes the host's idle events and makes one idle step of each. It holds no state of its own.
class VtCOnIdleSink : public host::IIdleProcessingEvents
{
public:
    explicit VtCOnIdleSink(VtCFrameCycle& frameCycle) : cycle(frameCycle) {}

    /// `handled` is always set to 1: the cycle wants every idle event it can get.
    void OnIdle(std::int32_t& handled) override;

private:
    VtCFrameCycle& cycle;
};
