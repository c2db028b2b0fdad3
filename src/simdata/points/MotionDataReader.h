#pragma once

#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

#include "simdata/points/ChannelDescription.h"
#include "simdata/points/MotionDataDamage.h"

namespace SimulationDataPoints
{

class VtCSimulationDataFrames;
class VtILoadProgress;

/// Reads a motion data file: the description at once, the frames in chunks or all into a buffer.
///
/// Every length is checked against the file's size before anything is allocated. The file is read plainly and not
/// mapped, so that one that is cut off meanwhile is an ordinary short read. What can be used of a damaged file is
/// used, and told by `GetDamage`:
/// - all whole frames of a file that ends in the middle of one;
/// - the frames before the first one whose time decreases or is no finite number;
/// - a pose that isn't finite takes the channel's last good one (the identity at first), since a body can't be placed
///   by it; an instrument value that isn't stays as it is, and gives no value.
class VtCMotionDataReader
{
public:
    explicit VtCMotionDataReader(std::filesystem::path path);
    ~VtCMotionDataReader();
    VtCMotionDataReader(const VtCMotionDataReader&) = delete;
    VtCMotionDataReader& operator=(const VtCMotionDataReader&) = delete;

    /// Opens the file and reads header and description. False if it can't be used, see `GetError`.
    bool Open();

    const std::shared_ptr<const VtTChannelDescription>& GetDescription() const { return description; }

    /// Whole frames of the file, before any is left out for its time.
    std::uint64_t GetFrameCount() const { return damage.framesWhole; }

    /// The header doesn't count the frames: the file is still being written, or its writer died.
    bool IsUnfinished() const { return unfinished; }

    std::uint64_t GetFileBytes() const { return fileBytes; }

    /// Reads up to `frames` records to `into`, checked, repaired and with rounded times. Their number: 0 at the end,
    /// and after an error.
    std::size_t ReadRecords(std::byte* into, std::size_t frames);

    /// Frames that make a chunk which stays in the processor's cache between reading and checking; at least 1.
    std::size_t GetChunkFrames() const;

    /// All frames from here on in a buffer of just that capacity. Null with an error when there is none.
    std::unique_ptr<VtCSimulationDataFrames> LoadFrames(VtILoadProgress* progress, long activity);

    const VtTMotionDataDamage& GetDamage() const { return damage; }

    /// "run.mdf: the file is empty", or empty while all went well.
    const std::wstring& GetError() const { return error; }

private:
    bool Fail(const std::wstring& reason);
    bool FailBySystem();
    std::size_t ReadBytes(std::byte* into, std::size_t size);
    std::size_t CheckRecords(std::byte* first, std::size_t frames);
    bool CheckTime(std::byte* record);
    void RepairRecord(std::byte* record, const std::byte* before);
    void NameNonFinite(const std::wstring& channel);

    std::filesystem::path path;
    int file = -1;
    std::uint64_t fileBytes = 0;
    bool unfinished = false;
    std::shared_ptr<const VtTChannelDescription> description;
    std::size_t stride = 0;
    std::uint64_t framesLeft = 0; ///< of the whole ones
    std::uint64_t framesRead = 0; ///< handed out
    double lastTime = 0.0;
    std::vector<std::byte> lastRecord; ///< of the chunk before, for poses that keep their value
    VtTMotionDataDamage damage;
    std::wstring error;
};

} // namespace SimulationDataPoints
