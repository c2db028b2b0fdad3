// Any bytes as a motion data file: it loads or says why not, what loads can be walked and searched, and what can be
// exported can be imported again.
#include <algorithm>

#include "FuzzFile.h"
#include "simdata/points/MotionDataCsv.h"
#include "simdata/points/MotionDataReader.h"
#include "simdata/points/SimulationDataFrames.h"

using namespace SimulationDataPoints;

namespace
{

void Search(VtCSimulationDataFrames& frames)
{
    frames.PrepareForTimeSyncReplay(1, 0);
    unsigned long position = 0;
    double before = frames.GetTimeAt(0);
    while (VtCSimulationDataFrame* frame = frames.GetNext(position, nullptr))
    {
        const double time = frame->GetTimestamp();
        fuzz::File::Check(time >= before);
        before = time;
        VtCSimulationDataFrame* found = frames.GetAtTime(time, 0);
        fuzz::File::Check(!frames.GetDescription().timeStamps || (found != nullptr && found->GetTimestamp() == time));
        frames.GetAtTime(time * 1.7 + 0.01, 0);
        for (long channel = 0; channel < std::min(frame->GetCount(), 20); ++channel)
        {
            float m[4][4];
            VtTInstrumentVariant value;
            frame->GetSimulationData(channel)->GetMatrix4x4(m);
            frame->GetSimulationData(channel)->getInstrumentValue(value);
        }
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const fuzz::File file(data, size);
    VtCMotionDataReader reader(file.Path());
    if (!reader.Open())
    {
        fuzz::File::Check(!reader.GetError().empty());
        return 0;
    }
    const auto frames = reader.LoadFrames(nullptr, -1);
    fuzz::File::Check((frames != nullptr) == reader.GetError().empty());
    if (!frames)
        return 0;
    Search(*frames);

    const fuzz::OutputName table("csv");
    const fuzz::OutputName again("mdf");
    VtTConversionReport report;
    if (VtCMotionDataCsv::Export(file.Path(), table.path, report))
        fuzz::File::Check(VtCMotionDataCsv::Import(table.path, again.path, report));
    return 0;
}
