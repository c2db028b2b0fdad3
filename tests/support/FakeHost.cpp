#include "tests/support/FakeHost.h"

#include <algorithm>

namespace fake
{

std::int32_t IdleSource::Raise()
{
    std::int32_t handled = 0;
    const auto advised = sinks; // a sink may end its own connection
    for (const auto& [cookie, sink] : advised)
        sink->OnIdle(handled);
    return handled;
}

bool MessageHandler::Has(host::Severity severity, std::uint32_t number) const
{
    return std::any_of(shown.begin(), shown.end(),
                       [&](const Entry& e) { return e.severity == severity && e.number == number; });
}

MessageHandler::Shown MessageHandler::Add(Entry entry)
{
    auto result = std::make_shared<host::ShownMessage>();
    result->number = entry.number;
    result->severity = entry.severity;
    result->text = std::to_wstring(entry.number);
    shown.push_back(std::move(entry));
    return result;
}

void DocumentManager::CloseActiveDocument()
{
    if (documents.empty())
        return;
    documents.back()->OnCloseDocument();
    documents.pop_back();
}

host::ManagedDocument* DocumentManager::Keep(std::unique_ptr<host::ManagedDocument> document, const std::wstring* path)
{
    // The document counts as the active one while it opens, as in the real host.
    documents.push_back(std::move(document));
    host::ManagedDocument& made = *documents.back();
    if (path ? made.OnOpenDocument(*path) : made.OnNewDocument())
        return &made;
    documents.pop_back();
    return nullptr;
}

} // namespace fake
