#include "simdata/DataPointPlugins.h"

#include <algorithm>
#include <dlfcn.h>
#include <exception>
#include <filesystem>
#include <system_error>

#include "base/Paths.h"
#include "base/Text.h"
#include "simdata/points/ExportFactory.h"

using SimulationDataPoints::dataPointKinds;
using SimulationDataPoints::VtCSimulationDataPoint;

namespace
{

std::wstring LastLoaderError()
{
    const char* error = dlerror();
    return base::Wide(error ? error : "unknown error of the loader");
}

} // namespace

void VtCDataPointDeleter::operator()(VtCSimulationDataPoint* point) const
{
    point->Release();
    delete point;
}

std::wstring VtCDataPointPlugins::GetModuleName(VtEDataPointKind kind)
{
    const auto* row = std::ranges::find(dataPointKinds, kind, &SimulationDataPoints::VtTDataPointKind::number);
    return L"SimulationDataPoint" + std::wstring(row->name) + L"U.so";
}

bool VtCDataPointPlugins::Load(VtEDataPointKind kind)
{
    Module& module = ModuleOf(kind);
    if (module.handle)
        return true;

    const std::filesystem::path name = base::NativePath(GetModuleName(kind));
    for (const std::wstring& folder : folders)
    {
        std::error_code ignored;
        const std::filesystem::path path = std::filesystem::absolute(base::NativePath(folder), ignored) / name;
        if (!std::filesystem::exists(path, ignored))
            continue;

        module.path = base::InnerPath(path);
        // At once, so that a module with a symbol missing is refused here and not in the middle of a run.
        if (void* handle = dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL))
            module.handle = std::shared_ptr<void>(handle, dlclose);
        else
            AddFault(kind, LastLoaderError());
        break;
    }
    return module.handle != nullptr;
}

VtTDataPointPtr VtCDataPointPlugins::MakePoint(VtEDataPointKind kind)
{
    const Module& module = ModuleOf(kind);
    if (!module.handle)
        return nullptr;

    void* symbol = dlsym(module.handle.get(), SimulationDataPoints::factoryName);
    if (!symbol)
    {
        AddFault(kind, LastLoaderError());
        return nullptr;
    }
    const auto version = reinterpret_cast<SimulationDataPoints::VersionFunction>(
        dlsym(module.handle.get(), SimulationDataPoints::versionName));
    if (!version || version() != SimulationDataPoints::interfaceVersion)
    {
        AddFault(kind,
                 L"it was built with " + (version ? L"version " + std::to_wstring(version()) : L"no version") +
                     L" of the data point interface, and this program has version " +
                     std::to_wstring(SimulationDataPoints::interfaceVersion),
                 true);
        return nullptr;
    }
    std::wstring reason = L"its factory gave no data point";
    try
    {
        const auto factory = reinterpret_cast<SimulationDataPoints::FactoryFunction>(symbol);
        if (VtTDataPointPtr point{factory(), VtCDataPointDeleter{module.handle}})
        {
            point->SetKind(static_cast<int>(kind));
            return point;
        }
    }
    catch (const std::exception& error)
    {
        reason = L"its factory failed: " + base::Wide(error.what());
    }
    catch (...)
    {
        reason = L"its factory failed";
    }
    AddFault(kind, std::move(reason));
    return nullptr;
}

void VtCDataPointPlugins::Unload()
{
    auto leaving = std::to_array(dataPointKinds);
    std::ranges::sort(leaving, {}, &SimulationDataPoints::VtTDataPointKind::unloaded);
    for (const auto& kind : leaving)
        ModuleOf(kind.number) = {};
    faults.clear();
}

void VtCDataPointPlugins::AddFault(VtEDataPointKind kind, std::wstring reason, bool otherVersion)
{
    // A module that gives no point is asked again for every file that is written: once is enough to tell.
    const std::wstring& path = ModuleOf(kind).path;
    const bool known = std::any_of(faults.begin(), faults.end(),
                                   [&](const VtTPluginFault& f) { return f.path == path && f.reason == reason; });
    if (!known)
        faults.push_back({GetModuleName(kind), path, std::move(reason), otherVersion});
}
