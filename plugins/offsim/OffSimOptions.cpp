#include "offsim/OffSimOptions.h"

#include <set>
#include <string_view>

#include "base/Numbers.h"
#include "base/Text.h"

namespace offsim
{

namespace
{

bool Seconds(std::string_view text, std::optional<double>& value)
{
    value = base::ParseDouble(text);
    return value && *value >= 0.0;
}

bool SetOption(OffSimOptions& options, const std::wstring& key, std::string_view value)
{
    if (key == L"seed")
    {
        const std::optional<std::int64_t> seed = base::ParseInteger(value);
        if (!seed || *seed < 0)
            return false;
        options.seed = static_cast<std::uint64_t>(*seed);
        return true;
    }
    if (key == L"fail")
        return Seconds(value, options.fail);
    return key == L"recover" && Seconds(value, options.recover);
}

} // namespace

std::optional<OffSimOptions> OffSimOptions::Parse(const std::wstring& text, std::wstring& fault)
{
    OffSimOptions options;
    std::set<std::wstring> taken;
    for (const std::wstring& field : base::Split(base::Replace(text, L",", L";"), L';'))
    {
        const std::string all = base::Utf8(field);
        const std::string_view stripped = base::Trim(all);
        if (stripped.empty())
            continue;
        const std::size_t equals = stripped.find('=');
        const std::wstring key = base::ToLower(base::Wide(base::Trim(stripped.substr(0, equals))));
        if (equals == std::string_view::npos || !SetOption(options, key, base::Trim(stripped.substr(equals + 1))))
        {
            fault = L"\"" + base::Wide(stripped) +
                    L"\" is no option: there are seed=NUMBER, fail=SECONDS and recover=SECONDS";
            return {};
        }
        if (!taken.insert(key).second)
        {
            fault = L"the option \"" + key + L"\" stands twice";
            return {};
        }
    }
    if (options.recover && (!options.fail || *options.recover <= *options.fail))
    {
        fault = L"\"recover\" needs a \"fail\" before it";
        return {};
    }
    return options;
}

std::wstring OffSimOptions::Text() const
{
    std::wstring text = L"seed=" + std::to_wstring(seed);
    if (fail)
        text += L";fail=" + base::Wide(base::FormatDouble(*fail));
    if (recover)
        text += L";recover=" + base::Wide(base::FormatDouble(*recover));
    return text;
}

} // namespace offsim
