#include "Preparation.h"

#include <algorithm>
#include <filesystem>

#include <osgDB/FileNameUtils>
#include <osgDB/FileUtils>

#include "base/Numbers.h"
#include "base/Paths.h"
#include "base/Text.h"

namespace fs = std::filesystem;

namespace
{

constexpr std::size_t maxWarnings = 12;

std::string PercentDecoded(const std::string& text)
{
    std::string result;
    for (std::size_t i = 0; i < text.size(); ++i)
    {
        const auto code =
            text[i] == '%' && i + 2 < text.size() ? base::ParseInteger(text.substr(i + 1, 2), 16) : std::nullopt;
        result += code ? static_cast<char>(*code) : text[i];
        i += code ? 2 : 0;
    }
    return result;
}

/// "file:///lib/car%20paint.png", "..\textures\car.png" -> a path with slashes; empty for what lies on no disk.
std::string PlainPath(const std::string& reference)
{
    std::string path = reference;
    if (path.starts_with("file://"))
    {
        path = PercentDecoded(path.substr(7));
        if (const std::size_t slash = path.find('/'); slash != std::string::npos)
            path.erase(0, slash); // the host part
    }
    else if (path.find("://") != std::string::npos)
        return {};
    std::replace(path.begin(), path.end(), '\\', '/');
    return path;
}

std::string InFolder(const std::string& path, const std::string& folder)
{
    std::error_code error;
    const fs::path plain = fs::path(folder) / path; // an absolute path stays as it is
    if (fs::is_regular_file(plain, error))
        return plain.lexically_normal().string();
    if (folder.empty())
        return {};
    const std::string found = osgDB::findFileInDirectory(path, folder, osgDB::CASE_INSENSITIVE);
    return !found.empty() && fs::is_regular_file(found, error) ? fs::path(found).lexically_normal().string() : "";
}

} // namespace

ReadContext::ReadContext(ModelRequest modelRequest)
    : request(std::move(modelRequest)),
      folder(fs::absolute(fs::path(request.path)).lexically_normal().parent_path().string())
{
}

void ReadContext::Warn(const std::string& sentence)
{
    if (std::find(report.warnings.begin(), report.warnings.end(), sentence) != report.warnings.end())
        return;
    ++warnings;
    if (warnings <= maxWarnings)
        report.warnings.push_back(sentence);
    else
    {
        report.warnings.resize(maxWarnings);
        report.warnings.push_back("and " + std::to_string(warnings - maxWarnings) + " more");
    }
}

void ReadContext::NoteFile(const std::string& path)
{
    const FileStamp stamp = FileStamp::Of(path);
    if (std::find(report.files.begin(), report.files.end(), stamp) == report.files.end())
        report.files.push_back(stamp);
}

std::string ReadContext::Find(const std::string& reference, const std::string& what)
{
    const std::string path = PlainPath(reference);
    const std::string bare = osgDB::getSimpleFileName(path);
    if (!bare.empty())
    {
        const std::pair<std::string, std::string> places[] = {
            {path, folder},
            {bare, folder},
            {path, base::NativePath(base::Wide(request.Text("vtCustomerPath"))).string()},
            {path, base::NativePath(base::Wide(request.Text("vtObjectsPath"))).string()},
        };
        for (const auto& [name, place] : places)
            if (const std::string found = InFolder(name, place); !found.empty())
            {
                NoteFile(found);
                return found;
            }
        NoteFile((fs::path(folder) / path).lexically_normal().string());
    }
    Warn("the " + what + " \"" + reference + "\" is missing");
    return {};
}
