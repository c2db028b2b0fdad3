#include "assets/models/FileStamp.h"

#include <sys/stat.h>

FileStamp FileStamp::Of(const std::string& path)
{
    struct stat status = {};
    if (::stat(path.c_str(), &status) != 0)
        return {path, -1, -1};
    return {path, std::int64_t{status.st_mtim.tv_sec} * 1000000000 + status.st_mtim.tv_nsec, status.st_size};
}
