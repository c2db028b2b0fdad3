// Any bytes as a table: it is imported or the report says why not, and what was imported loads without damage, apart
// from streams without a value.
#include "FuzzFile.h"
#include "simdata/points/MotionDataCsv.h"
#include "simdata/points/MotionDataReader.h"
#include "simdata/points/SimulationDataFrames.h"

using namespace SimulationDataPoints;

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const fuzz::File table(data, size);
    const fuzz::OutputName motionData("mdf");
    VtTConversionReport report;
    if (!VtCMotionDataCsv::Import(table.Path(), motionData.path, report))
    {
        fuzz::File::Check(!report.error.empty() && !std::filesystem::exists(motionData.path));
        return 0;
    }
    VtCMotionDataReader reader(motionData.path);
    fuzz::File::Check(reader.Open());
    const auto frames = reader.LoadFrames(nullptr, -1);
    fuzz::File::Check(frames != nullptr && static_cast<std::uint64_t>(frames->GetCount()) == report.frames);
    const VtTMotionDataDamage& damage = reader.GetDamage();
    fuzz::File::Check(damage.nonFinitePoses == 0 && damage.framesOutOfOrder == 0 && damage.partialBytes == 0);
    return 0;
}
