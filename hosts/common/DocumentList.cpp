#include "hosts/common/DocumentList.h"

namespace hosts
{

DocumentList::~DocumentList()
{
    while (!documents.empty())
        CloseActiveDocument();
}

void DocumentList::RegisterTemplate(host::DocumentTemplate documentTemplate)
{
    registered = std::move(documentTemplate);
}

void DocumentList::ReleaseTemplate()
{
    registered = {};
}

host::ManagedDocument* DocumentList::NewDocument()
{
    return Open(nullptr);
}

host::ManagedDocument* DocumentList::OpenDocument(const std::wstring& path)
{
    return Open(&path);
}

host::ManagedDocument* DocumentList::Open(const std::wstring* path)
{
    if (!registered.make)
        return nullptr;
    documents.push_back(registered.make());
    host::ManagedDocument* document = documents.back().get();
    if (path ? document->OnOpenDocument(*path) : document->OnNewDocument())
        return document;
    documents.pop_back();
    return nullptr;
}

void DocumentList::CloseActiveDocument()
{
    if (documents.empty())
        return;
    documents.back()->OnCloseDocument();
    documents.pop_back();
}

host::ManagedDocument* DocumentList::GetActiveDocument() const
{
    return documents.empty() ? nullptr : documents.back().get();
}

} // namespace hosts
