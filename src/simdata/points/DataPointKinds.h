#pragma once

namespace SimulationDataPoints
{

/// The kinds of data points, by number. A kind has one module: "SimulationDataPointFileU.so" for the kind File.
enum class VtEDataPointKind : int
{
    File = 1,
    Hardware = 2,
    Network = 3,
    Smart = 4,
    OffSim = 5,
    NetConnection = 6,
};

struct VtTDataPointKind
{
    VtEDataPointKind number;
    const wchar_t* name; ///< of the kind, within the name of its module
    unsigned unloaded;   ///< place in the order in which the modules are let go of
};

/// All kinds, in the order in which their modules are loaded.
inline constexpr VtTDataPointKind dataPointKinds[] = {
    {VtEDataPointKind::File, L"File", 0},
    {VtEDataPointKind::Network, L"Network", 3},
    {VtEDataPointKind::OffSim, L"OffSim", 5},
    {VtEDataPointKind::Hardware, L"Hardware", 1},
    {VtEDataPointKind::NetConnection, L"NetConnection", 2},
    {VtEDataPointKind::Smart, L"Smart", 4},
};

} // namespace SimulationDataPoints
