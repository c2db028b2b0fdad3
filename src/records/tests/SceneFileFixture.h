#pragma once

#include <filesystem>
#include <fstream>
#include <iterator>
#include <set>
#include <string>

#include <unistd.h>

#include "base/Paths.h"
#include "base/Text.h"

/// Text of scene files, and a folder for them that goes with the test.
namespace scenefile
{

inline std::string Scene(const std::string& objects)
{
    return "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
           "<vtattr:Scene xmlns:vtattr=\"urn:panoramic:attributes\" version=\"1\">\n" +
           objects + "</vtattr:Scene>\n";
}

inline std::string Attribute(const std::string& name, const std::string& value, const std::string& type = "string")
{
    return "    <vtattr:Attribute name=\"" + name + "\" type=\"" + type + "\"><vtattr:value>" + value +
           "</vtattr:value></vtattr:Attribute>\n";
}

/// The element of a record; `more` are further attributes.
inline std::string Object(int type, const std::string& id, const std::string& name, const std::string& more = {})
{
    const std::string number = std::to_string(type);
    return "  <vtattr:Object type=\"" + number + "\">\n" + Attribute("object_type", number, "int") +
           Attribute("internal_id", id) + Attribute("name", name) + more + "  </vtattr:Object>\n";
}

class Folder
{
public:
    Folder()
    {
        std::string name = (std::filesystem::temp_directory_path() / "scene.XXXXXX").string();
        path = mkdtemp(name.data());
    }
    ~Folder()
    {
        std::error_code ignored;
        std::filesystem::remove_all(path, ignored);
    }
    Folder(const Folder&) = delete;
    Folder& operator=(const Folder&) = delete;

    /// Writes a file and gives its path in the inner form.
    std::wstring Write(const std::string& name, const std::string& content) const
    {
        std::filesystem::create_directories((path / name).parent_path());
        std::ofstream(path / name, std::ios::binary) << content;
        return Inner(name);
    }

    std::wstring Inner(const std::string& name) const { return base::InnerPath(path / name); }

    std::string Read(const std::string& name) const
    {
        std::ifstream file(path / name, std::ios::binary);
        return {std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
    }

    /// Of the files in it.
    std::set<std::string> Names() const
    {
        std::set<std::string> names;
        for (const auto& entry : std::filesystem::directory_iterator(path))
            names.insert(entry.path().filename().string());
        return names;
    }

    std::filesystem::path path;
};

} // namespace scenefile
