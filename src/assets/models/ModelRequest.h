#pragma once

#include <map>
#include <optional>
#include <string>
#include <vector>

namespace osgDB
{
class Options;
}

/// The formats that are read, for messages.
inline constexpr const char* modelFormats = ".dae, .wrl, .obj, .stl, .ply, .3ds, .osgt, .osgb";

/// Whether the file `path` is of one of them, by its ending in any case.
bool HasModelFormat(const std::string& path);

/// One model to be read and how: the path, and the reader's options under their keys.
///
/// It goes to the reading process as command line arguments, and its text is what a finished model is kept under.
struct ModelRequest
{
    std::string path; ///< complete, as the file system takes it
    std::map<std::string, std::string> options;

    /// The options of `options` that the reader knows; those that stand at the reader's own default are left out, so
    /// that two ways to say the same share one finished model. Null gives none.
    static ModelRequest Make(const std::string& path, const osgDB::Options* options);

    /// `Arguments` read back. An argument without "=" is an unknown option and ignored.
    static ModelRequest FromArguments(const std::vector<std::string>& arguments);

    std::vector<std::string> Arguments() const; ///< the path, then "key=value" in the order of the keys

    bool IsOn(const std::string& key, bool otherwise) const;
    std::optional<double> Number(const std::string& key) const; ///< nothing for an absent key or no finite number
    std::string Text(const std::string& key) const;
};
