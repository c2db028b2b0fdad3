#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace offsim
{

/// What a run can be told, as it stands in the source path of the point: "seed=7;fail=12.5;recover=20".
struct OffSimOptions
{
    /// Of the gusts of wind.
    std::uint64_t seed = 7;

    /// For trying out what a failing source looks like: from this data time on, in seconds, there are no frames. At 0,
    /// without `recover`, the source can't even be opened.
    std::optional<double> fail;

    /// The data time, above `fail`, from which there are frames again.
    std::optional<double> recover;

    bool operator==(const OffSimOptions&) const = default;

    bool CanOpen() const { return !fail || *fail > 0.0 || recover; }
    bool FailsAt(double time) const { return fail && time >= *fail && !(recover && time >= *recover); }

    /// The options that `text` holds, with ";" or "," between them, the others as they are by default. Keys without
    /// regard to case; blanks around keys and values and empty fields mean nothing. Nothing, and the reason in `fault`,
    /// for an unknown key, one that stands twice, or a value out of range.
    static std::optional<OffSimOptions> Parse(const std::wstring& text, std::wstring& fault);

    /// A text that parses to the same options. Never empty: the seed always stands in it.
    std::wstring Text() const;
};

} // namespace offsim
