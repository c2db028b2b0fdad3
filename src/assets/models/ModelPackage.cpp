#include "assets/models/ModelPackage.h"

#include <cstring>
#include <stdexcept>

#include <nlohmann/json.hpp>

#define XXH_INLINE_ALL
#include <xxhash.h>

namespace
{

using Json = nlohmann::json;

struct Header
{
    char magic[8];
    std::uint32_t version;
    std::uint32_t reportSize;
    std::uint64_t graphSize;
    std::uint64_t checksum; ///< of everything behind the header
};

const char magic[8] = {'P', 'A', 'N', 'M', 'O', 'D', 'E', 'L'};

Json ToJson(const ModelReport& report)
{
    Json files = Json::array();
    for (const FileStamp& file : report.files)
        files.push_back({file.path, file.time, file.size});
    Json shaders = Json::array();
    for (const auto& [drawable, name] : report.shaders)
        shaders.push_back({drawable, name});
    return {{"error", report.error},
            {"warnings", report.warnings},
            {"notes", report.notes},
            {"polygons", report.polygons},
            {"vertices", report.vertices},
            {"textureBytes", report.textureBytes},
            {"xmlAttributes", report.xmlAttributes},
            {"drawables", report.drawables},
            {"shaders", shaders},
            {"parts", report.parts},
            {"files", files}};
}

ModelReport FromJson(const Json& json)
{
    ModelReport report;
    json.at("error").get_to(report.error);
    json.at("warnings").get_to(report.warnings);
    json.at("notes").get_to(report.notes);
    json.at("polygons").get_to(report.polygons);
    json.at("vertices").get_to(report.vertices);
    json.at("textureBytes").get_to(report.textureBytes);
    json.at("xmlAttributes").get_to(report.xmlAttributes);
    json.at("drawables").get_to(report.drawables);
    json.at("parts").get_to(report.parts);
    for (const Json& shader : json.at("shaders"))
        report.shaders[shader.at(0).get<std::uint32_t>()] = shader.at(1).get<std::string>();
    for (const Json& file : json.at("files"))
        report.files.push_back(
            {file.at(0).get<std::string>(), file.at(1).get<std::int64_t>(), file.at(2).get<std::int64_t>()});
    return report;
}

} // namespace

std::string PackModel(const ModelReport& report, std::string_view graph)
{
    // A description in another encoding than UTF-8 loses the characters concerned, not the model.
    const std::string text = ToJson(report).dump(-1, ' ', false, Json::error_handler_t::replace);

    Header header = {};
    std::memcpy(header.magic, magic, sizeof magic);
    header.version = modelPackageVersion;
    header.reportSize = static_cast<std::uint32_t>(text.size());
    header.graphSize = graph.size();

    std::string bytes(sizeof header, '\0');
    bytes.reserve(sizeof header + text.size() + graph.size());
    bytes.append(text).append(graph);
    header.checksum = XXH3_64bits(bytes.data() + sizeof header, bytes.size() - sizeof header);
    std::memcpy(bytes.data(), &header, sizeof header);
    return bytes;
}

UnpackedModel UnpackModel(std::string_view bytes)
{
    Header header = {};
    if (bytes.size() < sizeof header)
        throw std::runtime_error("it is cut short");
    std::memcpy(&header, bytes.data(), sizeof header);
    if (std::memcmp(header.magic, magic, sizeof magic) != 0)
        throw std::runtime_error("it is something else");
    if (header.version != modelPackageVersion)
        throw std::runtime_error("it is of another version");

    const std::string_view rest = bytes.substr(sizeof header);
    if (header.reportSize > rest.size() || header.graphSize != rest.size() - header.reportSize)
        throw std::runtime_error("it is cut short");
    if (XXH3_64bits(rest.data(), rest.size()) != header.checksum)
        throw std::runtime_error("its checksum is wrong");

    const std::string_view text = rest.substr(0, header.reportSize);
    return {FromJson(Json::parse(text)), rest.substr(header.reportSize)}; // its exceptions are runtime errors, too
}
