#include "assets/models/ModelRequest.h"

#include <filesystem>
#include <string_view>

#include <osgDB/FileNameUtils>
#include <osgDB/Options>

#include "base/Numbers.h"

namespace
{

struct Key
{
    const char* name;
    const char* byDefault; ///< the value that says the same as an absent key; null when there is none
};

const Key keys[] = {
    {"useShininess", nullptr}, {"useAmbientIntensity", nullptr},  {"useSpecularity", nullptr},
    {"autoloadProxies", "1"},  {"glidePanelAssignsShaders", "0"}, {"vtCustomerPath", ""},
    {"vtObjectsPath", ""},     {"useVrmlTransform", "0"},         {"useMaxTexAnisotropy", nullptr},
};

} // namespace

bool HasModelFormat(const std::string& path)
{
    const std::string ending = osgDB::getLowerCaseFileExtension(path);
    const std::string_view all = modelFormats;
    const std::size_t at = ending.empty() ? std::string::npos : all.find("." + ending);
    return at != std::string::npos && (at + ending.size() + 1 == all.size() || all[at + ending.size() + 1] == ',');
}

ModelRequest ModelRequest::Make(const std::string& path, const osgDB::Options* options)
{
    ModelRequest request{std::filesystem::absolute(path).lexically_normal().string(), {}};
    if (!options)
        return request;
    for (const Key& key : keys)
    {
        const std::string value = options->getPluginStringData(key.name);
        if (!value.empty() && (!key.byDefault || value != key.byDefault))
            request.options[key.name] = value;
    }
    return request;
}

ModelRequest ModelRequest::FromArguments(const std::vector<std::string>& arguments)
{
    ModelRequest request;
    if (arguments.empty())
        return request;
    request.path = arguments.front();
    for (std::size_t i = 1; i < arguments.size(); ++i)
        if (const std::size_t at = arguments[i].find('='); at != std::string::npos)
            request.options[arguments[i].substr(0, at)] = arguments[i].substr(at + 1);
    return request;
}

std::vector<std::string> ModelRequest::Arguments() const
{
    std::vector<std::string> arguments{path};
    for (const auto& [key, value] : options)
        arguments.push_back(key + "=" + value);
    return arguments;
}

bool ModelRequest::IsOn(const std::string& key, bool otherwise) const
{
    const auto at = options.find(key);
    return at == options.end() ? otherwise : at->second != "0";
}

std::optional<double> ModelRequest::Number(const std::string& key) const
{
    const auto at = options.find(key);
    return at == options.end() ? std::nullopt : base::ParseDouble(at->second);
}

std::string ModelRequest::Text(const std::string& key) const
{
    const auto at = options.find(key);
    return at == options.end() ? std::string() : at->second;
}
