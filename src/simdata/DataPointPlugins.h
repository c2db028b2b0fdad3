#pragma once

#include <array>
#include <iterator>
#include <memory>
#include <string>
#include <vector>

#include "simdata/points/DataPointKinds.h"
#include "simdata/points/SimulationDataPoint.h"

/// Ends a data point as it wants it (`Release`, then deletion) and keeps the module with its code loaded until then.
struct VtCDataPointDeleter
{
    std::shared_ptr<void> module; ///< null for a point whose code is the program's own

    void operator()(SimulationDataPoints::VtCSimulationDataPoint* point) const;
};

using VtTDataPointPtr = std::unique_ptr<SimulationDataPoints::VtCSimulationDataPoint, VtCDataPointDeleter>;

using SimulationDataPoints::VtEDataPointKind;

/// A module that is there and gave no data point.
struct VtTPluginFault
{
    std::wstring module;
    std::wstring path; ///< inner form
    std::wstring reason;
    bool otherVersion = false; ///< built with another version of the interface
};

/// The modules that data points come from, one for each kind.
///
/// A module that isn't there is passed over in silence: most installations have only some. One that is there and gives
/// no point is passed over too, and the reason is kept.
class VtCDataPointPlugins
{
public:
    /// `pluginFolders` in the inner form; the first one that has the module decides.
    explicit VtCDataPointPlugins(std::vector<std::wstring> pluginFolders) : folders(std::move(pluginFolders)) {}

    /// Loads the module of `kind`, unless it is loaded. False when there is none, or it isn't a library.
    bool Load(VtEDataPointKind kind);

    /// A new point of `kind`; null when its module isn't loaded, gives none, or was built with another version of the
    /// interface.
    VtTDataPointPtr MakePoint(VtEDataPointKind kind);

    /// Lets go of all modules, and of the faults. A module stays loaded as long as a point of it lives.
    void Unload();

    const std::vector<VtTPluginFault>& GetFaults() const { return faults; }

    /// "SimulationDataPointFileU.so"
    static std::wstring GetModuleName(VtEDataPointKind kind);

private:
    struct Module
    {
        std::shared_ptr<void> handle;
        std::wstring path;
    };

    Module& ModuleOf(VtEDataPointKind kind) { return modules[static_cast<std::size_t>(kind) - 1]; }
    void AddFault(VtEDataPointKind kind, std::wstring reason, bool otherVersion = false);

    std::vector<std::wstring> folders;
    std::array<Module, std::size(SimulationDataPoints::dataPointKinds)> modules; ///< by number, less 1
    std::vector<VtTPluginFault> faults;
};
