#include "simdata/points/CsvColumns.h"

#include <algorithm>
#include <unordered_map>

#include "base/Text.h"

namespace SimulationDataPoints
{

namespace
{

constexpr std::uint32_t none = VtTCsvPose::none;
constexpr std::array<std::wstring_view, 10> parts = {L"x",   L"y",  L"z",  L"roll", L"pitch",
                                                     L"yaw", L"qw", L"qx", L"qy",   L"qz"};

std::uint32_t& Part(VtTCsvPose& pose, std::size_t part)
{
    if (part < 3)
        return pose.position[part];
    return part < 6 ? pose.angles[part - 3] : pose.quaternion[part - 6];
}

std::wstring Trimmed(const std::wstring& text)
{
    return base::Wide(base::Trim(base::Utf8(text)));
}

/// The place of the bracket that opens the one at the end of `text`; npos without such a pair.
std::size_t UnitStart(const std::wstring& text)
{
    if (text.empty() || text.back() != L']')
        return std::wstring::npos;
    int depth = 0;
    for (std::size_t at = text.size(); at-- > 0;)
    {
        depth += text[at] == L']' ? 1 : text[at] == L'[' ? -1 : 0;
        if (depth == 0)
            return at;
    }
    return std::wstring::npos;
}

/// The index in `parts` of what follows the last point of `text`, with the pose's name before it.
std::size_t PosePart(const std::wstring& text, std::wstring& name)
{
    const std::size_t point = text.rfind(L'.');
    if (point == std::wstring::npos || point == 0)
        return parts.size();
    name = text.substr(0, point);
    const std::wstring part = base::ToLower(text.substr(point + 1));
    return static_cast<std::size_t>(std::find(parts.begin(), parts.end(), part) - parts.begin());
}

std::wstring At(std::size_t column, const std::wstring& text, const std::wstring& what)
{
    return L"column " + std::to_wstring(column + 1) + L" (" + text + L"): " + what;
}

class HeaderReader
{
public:
    explicit HeaderReader(VtTCsvColumns& result) : columns(result) {}

    std::wstring Take(std::uint32_t column, const std::wstring& text)
    {
        if (text.empty())
            return L"column " + std::to_wstring(column + 1) + L": it has no name";
        if (const std::size_t unit = UnitStart(text); unit != std::wstring::npos)
            return TakeStream(column, Trimmed(text.substr(0, unit)),
                              Trimmed(text.substr(unit + 1, text.size() - unit - 2)), text);
        if (base::EqualsNoCase(text, L"time"))
        {
            if (columns.time != none)
                return At(column, text, L"it stands twice");
            columns.time = column;
            return {};
        }
        std::wstring name;
        const std::size_t part = PosePart(text, name);
        return part < parts.size() ? TakePosePart(column, name, part, text) : TakeStream(column, text, {}, text);
    }

    std::wstring Finish()
    {
        if (columns.time == none)
            TakeTimeWithUnit();
        if (columns.time == none)
            return L"there is no column \"time\"";
        for (std::size_t pose = 0; pose < columns.poses.size(); ++pose)
            if (std::wstring fault = PoseFault(pose); !fault.empty())
                return fault;
        if (std::wstring fault = columns.channels.Fault(); !fault.empty())
            return fault;
        return {};
    }

private:
    std::wstring TakeStream(std::uint32_t column, const std::wstring& name, const std::wstring& unit,
                            const std::wstring& text)
    {
        if (name.empty())
            return At(column, text, L"it has no name");
        if (!streams.emplace(base::ToLower(name), column).second)
            return At(column, text, L"it stands twice");
        columns.instruments.push_back(column);
        columns.channels.instruments.push_back({name, unit});
        return {};
    }

    std::wstring TakePosePart(std::uint32_t column, const std::wstring& name, std::size_t part,
                              const std::wstring& text)
    {
        const auto [known, isNew] = poses.emplace(base::ToLower(name), columns.poses.size());
        if (isNew)
        {
            columns.poses.emplace_back();
            columns.channels.poses.push_back(name);
            firstColumns.push_back(column);
        }
        std::uint32_t& place = Part(columns.poses[known->second], part);
        if (place != none)
            return At(column, text, L"it stands twice");
        place = column;
        return {};
    }

    /// Loggers write "time [s]": it is meant where there is no plain one.
    void TakeTimeWithUnit()
    {
        const auto found = streams.find(L"time");
        if (found == streams.end())
            return;
        columns.time = found->second;
        const auto at = std::find(columns.instruments.begin(), columns.instruments.end(), found->second);
        columns.channels.instruments.erase(columns.channels.instruments.begin() + (at - columns.instruments.begin()));
        columns.instruments.erase(at);
    }

    std::wstring PoseFault(std::size_t index)
    {
        VtTCsvPose& pose = columns.poses[index];
        const std::wstring& name = columns.channels.poses[index];
        const bool anyAngle = std::any_of(pose.angles.begin(), pose.angles.end(), [](auto c) { return c != none; });
        const bool anyQuaternion =
            std::any_of(pose.quaternion.begin(), pose.quaternion.end(), [](auto c) { return c != none; });
        if (anyAngle && anyQuaternion)
            return At(firstColumns[index], name, L"the pose has angles and a quaternion; it takes one of them");
        if (!anyAngle && !anyQuaternion)
            return At(firstColumns[index], name,
                      L"the pose has no rotation; it takes the columns " + name + L".roll, .pitch and .yaw or " + name +
                          L".qw, .qx, .qy and .qz. A stream of that name has its unit behind it, \"" + name +
                          L".x []\"");
        for (std::size_t part = 0; part < parts.size(); ++part)
        {
            const bool wanted = part < 3 || (part < 6 ? anyAngle : anyQuaternion);
            if (wanted && Part(pose, part) == none)
                return At(firstColumns[index], name,
                          L"the pose lacks the column \"" + name + L"." + std::wstring(parts[part]) + L"\"");
        }
        return {};
    }

    VtTCsvColumns& columns;
    std::unordered_map<std::wstring, std::uint32_t> streams; ///< column by name in lower case
    std::unordered_map<std::wstring, std::size_t> poses;
    std::vector<std::uint32_t> firstColumns; ///< of each pose
};

/// Whether a stream of that name and no unit would be taken for something else.
bool NeedsBrackets(const std::wstring& name)
{
    std::wstring pose;
    return base::EqualsNoCase(name, L"time") || UnitStart(name) != std::wstring::npos ||
           PosePart(name, pose) < parts.size();
}

} // namespace

std::wstring ReadCsvHeader(const std::vector<std::string_view>& fields, VtTCsvColumns& columns)
{
    columns = {};
    columns.count = fields.size();
    HeaderReader reader(columns);
    for (std::size_t column = 0; column < fields.size(); ++column)
        if (std::wstring fault = reader.Take(static_cast<std::uint32_t>(column), base::Wide(fields[column]));
            !fault.empty())
            return fault;
    return reader.Finish();
}

std::vector<std::string> CsvHeader(const VtTChannelDescription& channels)
{
    std::vector<std::string> fields = {"time"};
    for (const std::wstring& pose : channels.poses)
        for (const wchar_t* part : {L".x", L".y", L".z", L".qw", L".qx", L".qy", L".qz"})
            fields.push_back(base::Utf8(pose + part));
    for (const VtTInstrumentStream& stream : channels.instruments)
        fields.push_back(base::Utf8(stream.unit.empty() && !NeedsBrackets(stream.name)
                                        ? stream.name
                                        : stream.name + L" [" + stream.unit + L"]"));
    return fields;
}

} // namespace SimulationDataPoints
