#include "simdata/points/MotionDataCsv.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstring>

#include <fmt/format.h>
#include <fmt/xchar.h>

#include "base/AtomicFile.h"
#include "base/Text.h"
#include "simdata/points/CsvColumns.h"
#include "simdata/points/CsvLines.h"
#include "simdata/points/LoadProgress.h"
#include "simdata/points/MotionDataReader.h"
#include "simdata/points/PoseRotation.h"

namespace SimulationDataPoints
{

namespace
{

constexpr std::size_t blockBytes = 1 << 20;

/// Matrices of floats are rigid to about 1e-6. What is off by more than the first loses something as a quaternion,
/// what is off by more than the second isn't a motion.
constexpr double roundingError = 1e-5;
constexpr double notRigid = 1e-3;

/// Digits of a quaternion: well below the resolution of the floats that it is made of.
constexpr int quaternionDigits = 10;

class CsvRows
{
public:
    explicit CsvRows(const VtTChannelDescription& description) : channels(description) {}

    /// Appends the row of a record. Why a pose of it can't be written, or empty.
    std::wstring Add(const std::byte* record, std::uint64_t frame)
    {
        if (channels.timeStamps)
            AppendNumber(Value<double>(record));
        for (std::size_t pose = 0; pose < channels.poses.size(); ++pose)
        {
            float m[4][4];
            std::memcpy(m, record + channels.PoseOffset(pose), sizeof m);
            if (!AddPose(m, frame, pose))
                return fmt::format(L"the pose \"{}\" in frame {} is no rigid motion (it scales, shears or mirrors)",
                                   channels.poses[pose], frame);
        }
        for (std::size_t stream = 0; stream < channels.instruments.size(); ++stream)
        {
            text += ',';
            const double value = Value<double>(record + channels.InstrumentOffset(stream));
            if (std::isfinite(value))
                AppendNumber(value);
        }
        text += '\n';
        return {};
    }

    std::string text;
    std::uint64_t roundedPoses = 0;
    std::uint64_t firstRounded = 0;

private:
    template <typename T>
    static T Value(const std::byte* at)
    {
        T value;
        std::memcpy(&value, at, sizeof value);
        return value;
    }

    bool AddPose(const float m[4][4], std::uint64_t frame, std::size_t)
    {
        VtTRotation rotation;
        for (std::size_t row = 0; row < 3; ++row)
            std::copy(m[row], m[row] + 3, rotation[row].begin());
        const double bottom =
            std::max({std::fabs(m[3][0]), std::fabs(m[3][1]), std::fabs(m[3][2]), std::fabs(m[3][3] - 1.0F)});
        const double error = std::max(RigidityError(rotation), bottom);
        if (!(error <= notRigid))
            return false;
        if (error > roundingError && roundedPoses++ == 0)
            firstRounded = frame;
        for (int row = 0; row < 3; ++row)
        {
            text += ',';
            AppendNumber(m[row][3]);
        }
        const VtTQuaternion q = QuaternionFromRotation(rotation);
        for (const double part : {q.w, q.x, q.y, q.z})
        {
            text += ',';
            char digits[32];
            const auto end =
                std::to_chars(digits, digits + sizeof digits, part, std::chars_format::general, quaternionDigits);
            text.append(digits, end.ptr);
        }
        return true;
    }

    /// The shortest text that reads back as the same value.
    template <typename T>
    void AppendNumber(T value)
    {
        char digits[32];
        text.append(digits, std::to_chars(digits, digits + sizeof digits, value).ptr);
    }

    const VtTChannelDescription& channels;
};

/// The header row; empty when names or units hold blanks or brackets in places where they would read back as others.
std::string HeaderRow(const VtTChannelDescription& channels)
{
    const std::vector<std::string> fields = CsvHeader(channels);
    VtTCsvColumns readBack;
    const bool readable = ReadCsvHeader({fields.begin(), fields.end()}, readBack).empty() &&
                          readBack.channels.poses == channels.poses &&
                          readBack.channels.instruments == channels.instruments;
    std::string row;
    for (const std::string& field : fields)
        row.append(row.empty() ? "" : ",").append(QuoteField(field));
    return readable ? row + '\n' : std::string();
}

} // namespace

bool VtCMotionDataCsv::Export(const std::filesystem::path& motionData, const std::filesystem::path& table,
                              VtTConversionReport& report, VtILoadProgress* progress, long activity)
{
    report = {};
    const std::wstring name = base::Wide(motionData.string());
    VtCMotionDataReader reader(motionData);
    if (!reader.Open())
    {
        report.error = reader.GetError();
        return false;
    }
    const VtTChannelDescription& channels = *reader.GetDescription();
    report.poses = channels.poses.size();
    report.instruments = channels.instruments.size();

    CsvRows rows(channels);
    rows.text = HeaderRow(channels);
    if (rows.text.empty())
    {
        report.error =
            name + L": channel names or units have blanks or brackets at their ends, which no column can tell";
        return false;
    }
    base::AtomicFile output(table);
    const std::uint64_t total = std::max<std::uint64_t>(reader.GetFrameCount(), 1);
    std::uint64_t toldPercent = 0;
    std::vector<std::byte> chunk(reader.GetChunkFrames() * channels.Stride());
    while (const std::size_t got = reader.ReadRecords(chunk.data(), reader.GetChunkFrames()))
    {
        for (std::size_t index = 0; index < got; ++index)
        {
            const std::wstring fault = rows.Add(chunk.data() + index * channels.Stride(), ++report.frames);
            if (!fault.empty())
            {
                report.error = fmt::format(L"{}: {}", name, fault);
                return false;
            }
            if (rows.text.size() >= blockBytes)
            {
                output.Write(rows.text);
                rows.text.clear();
            }
        }
        const std::uint64_t percent = report.frames * 100 / total;
        if (progress != nullptr && percent > toldPercent && report.frames < total)
        {
            progress->OnLoadProgress(activity, report.frames, total);
            toldPercent = percent;
        }
        if (!output.Error().empty())
            break;
    }
    if (!reader.GetError().empty())
        report.error = reader.GetError();
    else if (report.frames == 0)
        report.error = name + L": the file holds no usable frame";
    else if (!output.Write(rows.text) || !output.Commit())
        report.error = base::Wide(output.Error());
    if (!report.error.empty())
        return false;

    if (progress != nullptr)
        progress->OnLoadProgress(activity, total, total);
    for (const std::wstring& damage : reader.GetDamage().Texts())
        report.warnings.push_back(fmt::format(L"{}: {}", name, damage));
    if (rows.roundedPoses > 0)
        report.warnings.push_back(fmt::format(L"{}: {} poses are rigid only to {}, first in frame {}; they were "
                                              L"written as the nearest rotation",
                                              name, rows.roundedPoses, notRigid, rows.firstRounded));
    return true;
}

} // namespace SimulationDataPoints
