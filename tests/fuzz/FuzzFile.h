#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <sys/mman.h>
#include <unistd.h>

namespace fuzz
{

/// A file in memory with the given bytes, for code that takes a path.
class File
{
public:
    File(const std::uint8_t* data, std::size_t size) : file(memfd_create("fuzz", 0))
    {
        Check(file >= 0 && write(file, data, size) == static_cast<ssize_t>(size));
    }
    ~File() { close(file); }
    File(const File&) = delete;
    File& operator=(const File&) = delete;

    std::filesystem::path Path() const { return "/proc/self/fd/" + std::to_string(file); }

    /// Ends the process as a finding unless `right`.
    static void Check(bool right)
    {
        if (!right)
            std::abort();
    }

private:
    int file;
};

/// A name for a file that the code under test makes, in memory too, and gone with this.
class OutputName
{
public:
    explicit OutputName(const char* name) : path("/dev/shm/panoramic_fuzz." + std::to_string(getpid()) + "." + name) {}
    ~OutputName() { unlink(path.c_str()); }
    OutputName(const OutputName&) = delete;
    OutputName& operator=(const OutputName&) = delete;

    const std::filesystem::path path;
};

} // namespace fuzz
