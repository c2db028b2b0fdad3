#pragma once

#include <algorithm>
#include <cstddef>
#include <vector>

/// Pointers to those who want to be called, in the order they came; not owned.
///
/// They may come and go while they are being called: one that goes is not called any more, one that comes waits for
/// the next round.
template <class Type>
class VtCRegistrationList
{
public:
    /// False, and nothing changes, for null and for one that is listed already.
    bool Add(Type* entry)
    {
        if (!entry || std::find(entries.begin(), entries.end(), entry) != entries.end())
            return false;
        entries.push_back(entry);
        return true;
    }

    /// Null and strangers are ignored.
    void Remove(Type* entry)
    {
        const auto at = entry ? std::find(entries.begin(), entries.end(), entry) : entries.end();
        if (at == entries.end())
            return;
        if (rounds > 0)
            *at = nullptr;
        else
            entries.erase(at);
    }

    bool IsEmpty() const
    {
        return std::none_of(entries.begin(), entries.end(), [](const Type* entry) { return entry != nullptr; });
    }

    template <class Call>
    void ForEach(Call&& call)
    {
        const Round round(*this);
        const std::size_t count = entries.size();
        for (std::size_t i = 0; i < count; ++i)
            if (Type* entry = entries[i])
                call(*entry);
    }

private:
    struct Round
    {
        explicit Round(VtCRegistrationList& walked) : list(walked) { ++list.rounds; }
        ~Round()
        {
            if (--list.rounds == 0)
                std::erase(list.entries, nullptr);
        }
        Round(const Round&) = delete;
        Round& operator=(const Round&) = delete;

        VtCRegistrationList& list;
    };

    std::vector<Type*> entries;
    int rounds = 0;
};
