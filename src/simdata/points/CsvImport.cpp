#include "simdata/points/MotionDataCsv.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstring>
#include <string_view>

#include "base/Text.h"
#include "simdata/points/CsvColumns.h"
#include "simdata/points/CsvLines.h"
#include "simdata/points/LoadProgress.h"
#include "simdata/points/MotionDataWriter.h"
#include "simdata/points/PoseRotation.h"
#include "simdata/points/SimulationDataFrames.h"

namespace SimulationDataPoints
{

namespace
{

/// Quaternions whose length is off by more than this were hardly meant as rotations.
constexpr double quaternionTolerance = 0.01;

class CsvImport
{
public:
    CsvImport(const std::filesystem::path& table, VtCMotionDataWriter& target, VtTConversionReport& result)
        : path(table), lines(table), writer(target), report(result)
    {
    }

    bool Run(VtILoadProgress* progress, long activity)
    {
        if (!ReadHeader())
            return false;
        std::uint64_t toldPercent = 0;
        std::string_view line;
        while (lines.Next(line))
        {
            if (!base::Trim(line).empty() && !TakeRow(line))
                return false;
            const std::uint64_t percent = lines.GetBytesRead() * 100 / std::max<std::uint64_t>(lines.GetFileBytes(), 1);
            if (progress != nullptr && percent > toldPercent && percent < 100)
            {
                progress->OnLoadProgress(activity, lines.GetBytesRead(), lines.GetFileBytes());
                toldPercent = percent;
            }
        }
        if (!lines.GetError().empty())
            return Fail(L"", lines.GetError());
        if (report.frames == 0)
            return Fail(L"", L"there is no row below the header");
        if (progress != nullptr)
            progress->OnLoadProgress(activity, lines.GetFileBytes(), lines.GetFileBytes());
        if (offLengths > 0)
            report.warnings.push_back(base::Wide(path.string()) + L": " + std::to_wstring(offLengths) +
                                      L" quaternions don't have the length 1, first in line " +
                                      std::to_wstring(firstOffLength) + L"; they were normalised");
        return true;
    }

private:
    bool Fail(const std::wstring& place, const std::wstring& reason)
    {
        report.error = base::Wide(path.string()) + place + L": " + reason;
        return false;
    }

    bool FailInLine(const std::wstring& reason)
    {
        return Fail(L", line " + std::to_wstring(lines.GetNumber()), reason);
    }

    bool FailInField(std::size_t column, const std::wstring& reason)
    {
        return Fail(L", line " + std::to_wstring(lines.GetNumber()) + L", column " + std::to_wstring(column + 1) +
                        L" (" + base::Wide(names[column]) + L")",
                    reason);
    }

    bool FailInNumber(std::size_t column)
    {
        constexpr std::size_t shown = 40;
        const std::wstring text = base::Wide(fields[column].substr(0, shown));
        return FailInField(column, text.empty() ? L"there is no number" : L"\"" + text + L"\" is no finite number");
    }

    bool ReadHeader()
    {
        std::string_view line;
        do
            if (!lines.Next(line))
                return Fail(L"", lines.GetError().empty() ? L"the file is empty" : lines.GetError());
        while (base::Trim(line).empty());

        separator = FindSeparator(line);
        if (const std::size_t bad = SplitFields(line, separator, fields, unquoted); bad > 0)
            return FailInLine(L"column " + std::to_wstring(bad) + L": the quotes are wrong");
        if (const std::wstring fault = ReadCsvHeader(fields, columns); !fault.empty())
            return FailInLine(fault);
        names.assign(fields.begin(), fields.end());
        fields.reserve(columns.count);
        record.resize(columns.channels.Stride());
        report.poses = columns.channels.poses.size();
        report.instruments = columns.channels.instruments.size();
        return true;
    }

    bool TakeRow(std::string_view line)
    {
        if (const std::size_t bad = SplitFields(line, separator, fields, unquoted); bad > 0)
            return FailInLine(L"column " + std::to_wstring(bad) + L": the quotes are wrong");
        if (fields.size() != columns.count)
            return FailInLine(L"column " + std::to_wstring(std::min(fields.size(), columns.count) + 1) +
                              L": the row has " + std::to_wstring(fields.size()) + L" columns, the header " +
                              std::to_wstring(columns.count));
        if (report.frames == 0)
        {
            columns.channels.timeStamps = !fields[columns.time].empty();
            if (!writer.Open() || !writer.Begin(columns.channels))
                return Fail(writer.GetError());
        }
        VtCFrameRecord frame(record.data(), columns.channels);
        if (!TakeTime())
            return false;
        for (std::size_t pose = 0; pose < columns.poses.size(); ++pose)
            if (!TakePose(pose, frame))
                return false;
        for (std::size_t stream = 0; stream < columns.instruments.size(); ++stream)
            if (!TakeInstrument(stream, frame))
                return false;
        if (!writer.Write(record.data()))
            return Fail(writer.GetError());
        ++report.frames;
        return true;
    }

    bool Fail(const std::wstring& whole)
    {
        report.error = whole;
        return false;
    }

    bool TakeTime()
    {
        double time = 0.0;
        if (!columns.channels.timeStamps)
        {
            if (!fields[columns.time].empty())
                return FailInField(columns.time, L"there is a time here, but none in the first row");
        }
        else if (!Number(columns.time, time))
            return FailInNumber(columns.time);
        time = VtCSimulationDataFrame::RoundTimeStamp(time);
        if (report.frames > 0 && time < lastTime)
            return FailInField(columns.time, L"the time decreases, from " + std::to_wstring(lastTime) + L" s to " +
                                                 std::to_wstring(time) + L" s");
        lastTime = time;
        std::memcpy(record.data(), &time, sizeof time);
        return true;
    }

    bool TakePose(std::size_t index, VtCFrameRecord& frame)
    {
        const VtTCsvPose& pose = columns.poses[index];
        VtTRotation rotation;
        if (!TakeRotation(pose, rotation))
            return false;
        float matrix[4][4] = {{0, 0, 0, 0}, {0, 0, 0, 0}, {0, 0, 0, 0}, {0, 0, 0, 1}};
        for (std::size_t row = 0; row < 3; ++row)
        {
            for (std::size_t column = 0; column < 3; ++column)
                matrix[row][column] = static_cast<float>(rotation[row][column]);
            double place = 0.0;
            if (!Number(pose.position[row], place))
                return FailInNumber(pose.position[row]);
            matrix[row][3] = static_cast<float>(place);
            if (!std::isfinite(matrix[row][3]))
                return FailInField(pose.position[row], L"the number is too large for a position");
        }
        frame.SetPose(index, matrix);
        return true;
    }

    bool TakeRotation(const VtTCsvPose& pose, VtTRotation& rotation)
    {
        if (!pose.HasQuaternion())
        {
            std::array<double, 3> angles{};
            for (std::size_t i = 0; i < angles.size(); ++i)
                if (!Number(pose.angles[i], angles[i]))
                    return FailInNumber(pose.angles[i]);
            rotation = RotationFromAngles(angles[2], angles[1], angles[0]);
            return true;
        }
        std::array<double, 4> q{};
        for (std::size_t i = 0; i < q.size(); ++i)
            if (!Number(pose.quaternion[i], q[i]))
                return FailInNumber(pose.quaternion[i]);
        const double length = std::hypot(std::hypot(q[0], q[1]), std::hypot(q[2], q[3]));
        if (!(length > 1e-6) || !(length < 1e6))
            return FailInField(pose.quaternion[0],
                               L"the quaternion has the length " + std::to_wstring(length) + L", it tells no rotation");
        if (std::fabs(length - 1.0) > quaternionTolerance && offLengths++ == 0)
            firstOffLength = lines.GetNumber();
        rotation = RotationFromQuaternion({q[0], q[1], q[2], q[3]});
        return true;
    }

    bool TakeInstrument(std::size_t stream, VtCFrameRecord& frame)
    {
        const std::uint32_t column = columns.instruments[stream];
        double value = std::nan("");
        if (!fields[column].empty() && !Number(column, value))
            return FailInNumber(column);
        frame.SetInstrument(stream, value);
        return true;
    }

    /// The number that is all of a field; finite.
    bool Number(std::uint32_t column, double& value)
    {
        std::string_view text = fields[column];
        if (separator != ',')
            text = WithDecimalPoint(text);
        if (text.size() > 1 && text[0] == '+' && text[1] != '-')
            text.remove_prefix(1);
        const auto [stop, fault] = std::from_chars(text.data(), text.data() + text.size(), value);
        if (fault == std::errc::result_out_of_range && stop == text.data() + text.size() &&
            text.find("e-") != std::string_view::npos)
            value = 0.0; // too small for a double
        else if (fault != std::errc() || stop != text.data() + text.size())
            return false;
        return std::isfinite(value);
    }

    std::string_view WithDecimalPoint(std::string_view text)
    {
        const std::size_t comma = text.find(',');
        if (comma == std::string_view::npos || text.find_first_of(".,", comma + 1) != std::string_view::npos ||
            text.find('.') != std::string_view::npos)
            return text;
        pointed.assign(text);
        pointed[comma] = '.';
        return pointed;
    }

    const std::filesystem::path& path;
    VtCCsvLines lines;
    VtCMotionDataWriter& writer;
    VtTConversionReport& report;
    char separator = ',';
    VtTCsvColumns columns;
    std::vector<std::string> names; ///< of the columns, as they stand
    std::vector<std::string_view> fields;
    std::string unquoted;
    std::string pointed;
    std::vector<std::byte> record;
    double lastTime = 0.0;
    std::uint64_t offLengths = 0;
    std::uint64_t firstOffLength = 0;
};

} // namespace

bool VtCMotionDataCsv::Import(const std::filesystem::path& table, const std::filesystem::path& motionData,
                              VtTConversionReport& report, VtILoadProgress* progress, long activity)
{
    report = {};
    VtCMotionDataWriter writer(motionData, VtCMotionDataWriter::Manner::whole);
    if (!CsvImport(table, writer, report).Run(progress, activity))
        return false;
    if (!writer.Finish())
        report.error = writer.GetError();
    return report.error.empty();
}

} // namespace SimulationDataPoints
