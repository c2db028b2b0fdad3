#pragma once

#include <map>
#include <set>
#include <string>
#include <vector>

#include <osg/Matrixd>

#include "assets/models/ModelPackage.h"
#include "assets/models/ModelRequest.h"

/// The reading of one model: what is asked, and the report as it grows. A model is refused by throwing
/// `std::runtime_error` with a reason that makes sense behind the model's path.
class ReadContext
{
public:
    explicit ReadContext(ModelRequest modelRequest);

    /// A loss or repair to tell the user; the same sentence is told once, and after many only their number.
    void Warn(const std::string& sentence);

    /// The file of a texture or part as the model names it: an absolute or relative path or file URI, looked for beside
    /// the model, then by its bare name, then in the customer's and the product's library, with any case. Empty, after
    /// a note of where it was looked for, when there is none.
    std::string Find(const std::string& reference, const std::string& what);

    /// A name for the texture `path` that no reader can misread, whatever the path holds (blanks, "%24", "$").
    std::string AliasOf(const std::string& path);

    /// Takes down a file that the model depends on.
    void NoteFile(const std::string& path);

    /// Whether `path` lies below one of `roots`, links followed.
    bool IsWithinReach(const std::string& path) const;

    const ModelRequest request;
    const std::string folder; ///< of the model, without a trailing slash
    const std::vector<std::string>
        roots; ///< all that may be read: the model's folder and the libraries, links followed
    ModelReport report;
    std::set<std::string> textures;             ///< files that the graph must hold as images in the end
    std::map<std::string, std::string> aliases; ///< name given to the stock reader -> such a file

private:
    std::size_t warnings = 0;
};

/// The text of a model file, made ready for the stock reader, and what that reader would have dropped.
struct PreparedText
{
    std::string text;
    osg::Matrixd toModel;         ///< from the file's axes and unit to y-up metres
    bool hasTurnedRoot = false;   ///< the stock reader puts a transform of its own on top
    unsigned mainTextureUnit = 0; ///< where the stock reader puts the diffuse texture
};

/// A group that ends with this is to be seen from both sides; the stock reader carries names and nothing else.
inline constexpr const char* twoSidedMark = "__px_two_sided";
