#include "simdata/points/MotionDataInfo.h"

#include <cstddef>
#include <cstring>
#include <vector>

#include "simdata/points/MotionDataReader.h"

namespace SimulationDataPoints
{

VtTMotionDataInfo ReadMotionDataInfo(const std::filesystem::path& path)
{
    VtTMotionDataInfo info;
    VtCMotionDataReader reader(path);
    if (reader.Open())
    {
        info.channels = *reader.GetDescription();
        info.fileBytes = reader.GetFileBytes();
        info.unfinished = reader.IsUnfinished();
        const std::size_t stride = info.channels.Stride();
        std::vector<std::byte> chunk(reader.GetChunkFrames() * stride);
        while (const std::size_t got = reader.ReadRecords(chunk.data(), reader.GetChunkFrames()))
        {
            if (info.frames == 0)
                std::memcpy(&info.firstTime, chunk.data(), sizeof info.firstTime);
            std::memcpy(&info.lastTime, chunk.data() + (got - 1) * stride, sizeof info.lastTime);
            info.frames += got;
        }
        info.damage = reader.GetDamage();
        const double span = info.lastTime - info.firstTime;
        if (span > 0.0)
            info.meanRate = static_cast<double>(info.frames - 1) / span;
    }
    info.error = reader.GetError();
    return info;
}

} // namespace SimulationDataPoints
