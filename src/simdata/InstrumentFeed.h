#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "simdata/points/SimulationData.h"

/// An instrument as the receiver of data sees it.
class VtIFedInstrument
{
public:
    virtual ~VtIFedInstrument() = default;

    /// Name of the instrument stream that feeds it; compared without regard to case.
    virtual const std::wstring& GetSignalName() const = 0;

    /// Number of its stream in the older addressing, from 1; 0 for none.
    virtual std::int32_t GetStreamNumber() const = 0;

    virtual void SetValue(const SimulationDataPoints::VtTInstrumentVariant& value) = 0;
};

/// How the instruments of a scene find their values.
enum class VtEInstrumentDataMode : std::int32_t
{
    LegacyStreams = 1, ///< by number, in the elements of the last two channels of a frame
    SignalNames = 2,   ///< by name, among the instrument streams
};

/// The instruments of a scene, as the data path sees them.
class VtIInstrumentFeed
{
public:
    virtual ~VtIInstrumentFeed() = default;

    virtual VtEInstrumentDataMode GetDataMode() const = 0;
    virtual void SetDataMode(VtEInstrumentDataMode mode) = 0;

    /// All instruments, groups resolved, in the order of the tree; not owned. Asked at every delivery, so the
    /// collection keeps the list and doesn't make it for the call.
    virtual const std::vector<VtIFedInstrument*>& GetFedInstruments() const = 0;
};
