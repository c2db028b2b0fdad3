#pragma once

#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

namespace base
{
class AtomicFile;
}

namespace SimulationDataPoints
{

struct VtTChannelDescription;

/// Writes a motion data file, frame by frame. The first failure is kept and everything after it does nothing.
class VtCMotionDataWriter
{
public:
    enum class Manner
    {
        whole,   ///< appears under its name on `Finish`, complete; before that and on a failure an older file stays
        growing, ///< grows under its name, one write for each frame: a writer that dies loses the frame it was writing
    };

    VtCMotionDataWriter(std::filesystem::path path, Manner manner);
    ~VtCMotionDataWriter();
    VtCMotionDataWriter(const VtCMotionDataWriter&) = delete;
    VtCMotionDataWriter& operator=(const VtCMotionDataWriter&) = delete;

    /// False if the file can't be written. An existing file is left as it is until `Begin`.
    bool Open();

    /// Writes header and description, once.
    bool Begin(const VtTChannelDescription& channels);
    bool HasBegun() const { return stride > 0; }

    /// Appends a record of the description's stride and layout.
    bool Write(const std::byte* record);

    /// Enters the frame count and closes the file. Without `Begin` there is nothing to keep: false, and a file that
    /// `Open` made is gone again.
    bool Finish();

    std::uint64_t GetFrameCount() const { return frameCount; }

    /// "run.mdf: No space left on device", or empty while all went well.
    const std::wstring& GetError() const { return error; }

private:
    bool Put(const void* data, std::size_t size);
    bool Flush();
    bool FinishGrowing();
    bool Fail(const std::wstring& reason);
    bool FailBySystem();

    std::filesystem::path path;
    Manner manner;
    std::unique_ptr<base::AtomicFile> atomic;
    int file = -1;
    bool made = false; ///< there was no file of that name
    std::uint64_t wholeBytes = 0;
    std::vector<std::byte> pending; ///< of a whole file, gathered for large writes
    std::size_t stride = 0;
    std::uint64_t frameCount = 0;
    std::wstring error;
};

} // namespace SimulationDataPoints
