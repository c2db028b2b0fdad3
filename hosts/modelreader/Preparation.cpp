#include "Preparation.h"

#include <algorithm>
#include <filesystem>

#include <osgDB/FileNameUtils>

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
        path.erase(0, 7);
        if (const std::size_t slash = path.find('/'); slash != std::string::npos)
            path.erase(0, slash); // the host part
    }
    else if (path.find("://") != std::string::npos)
        return {};
    std::replace(path.begin(), path.end(), '\\', '/');
    return path;
}

/// The file `path` below `folder` whatever its case is; empty when there is none. The library's own search begins with
/// the root of all folders, which may not be read here.
fs::path WithAnyCase(const fs::path& path, fs::path folder)
{
    std::error_code error;
    for (const fs::path& name : path)
    {
        fs::path next = folder / name;
        if (!fs::exists(next, error))
        {
            const auto isSame = [&](const fs::directory_entry& entry)
            { return base::EqualsNoCase(base::Wide(entry.path().filename().string()), base::Wide(name.string())); };
            const fs::directory_iterator end;
            const auto at = std::find_if(fs::directory_iterator(folder, error), end, isSame);
            if (at == end)
                return {};
            next = at->path();
        }
        folder = next;
    }
    return folder;
}

std::string InFolder(const std::string& path, const std::string& folder)
{
    std::error_code error;
    const fs::path plain = fs::path(folder) / path; // an absolute path stays as it is
    if (fs::is_regular_file(plain, error))
        return plain.lexically_normal().string();
    const fs::path found = folder.empty() ? fs::path() : WithAnyCase(fs::path(path).relative_path(), folder);
    return fs::is_regular_file(found, error) ? found.lexically_normal().string() : "";
}

/// The folders that a model may be made from. Where the model is a link, its file's own folder counts, too.
std::vector<std::string> RootsOf(const ModelRequest& request)
{
    std::vector<std::string> roots;
    const auto add = [&](const fs::path& path)
    {
        std::error_code error;
        const fs::path root = fs::canonical(path, error);
        if (!error && !path.empty())
            roots.push_back(root.string());
    };
    std::error_code error;
    add(fs::absolute(request.path).lexically_normal().parent_path());
    add(fs::canonical(request.path, error).parent_path());
    for (const char* library : {"vtCustomerPath", "vtObjectsPath"})
        add(base::NativePath(base::Wide(request.Text(library))));
    return roots;
}

} // namespace

ReadContext::ReadContext(ModelRequest modelRequest)
    : request(std::move(modelRequest)),
      folder(fs::absolute(fs::path(request.path)).lexically_normal().parent_path().string()),
      roots(RootsOf(request))
{
}

bool ReadContext::IsWithinReach(const std::string& path) const
{
    std::error_code error;
    const fs::path real = fs::weakly_canonical(fs::path(folder) / path, error);
    return !error && std::any_of(roots.begin(), roots.end(),
                                 [&](const std::string& root)
                                 {
                                     const fs::path below = real.lexically_relative(root);
                                     return !below.empty() && *below.begin() != "..";
                                 });
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

std::string ReadContext::AliasOf(const std::string& path)
{
    const std::string ending = osgDB::getLowerCaseFileExtension(path);
    const std::string alias = "texture-" + std::to_string(aliases.size()) + "." + ending;
    return aliases.emplace(alias, path).first->first;
}

std::string ReadContext::Find(const std::string& reference, const std::string& what)
{
    const std::string written = PlainPath(reference);
    for (const bool decodes : {false, true})
    {
        const std::string path = decodes ? PercentDecoded(written) : written;
        const std::string bare = osgDB::getSimpleFileName(path);
        if (bare.empty() || (decodes && path == written))
            continue;
        const std::pair<std::string, std::string> places[] = {
            {path, folder},
            {bare, folder},
            {path, base::NativePath(base::Wide(request.Text("vtCustomerPath"))).string()},
            {path, base::NativePath(base::Wide(request.Text("vtObjectsPath"))).string()},
        };
        for (const auto& [name, place] : places)
            if (const std::string found = InFolder(name, place); !found.empty() && IsWithinReach(found))
            {
                NoteFile(found);
                return found;
            }
        NoteFile((fs::path(folder) / path).lexically_normal().string());
    }
    const bool outside = !written.empty() && !IsWithinReach(written);
    Warn("the " + what + " \"" + reference + "\" " +
         (outside ? "lies outside the model's folder and the libraries, where nothing is read" : "is missing"));
    return {};
}
