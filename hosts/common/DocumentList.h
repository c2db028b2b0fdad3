#pragma once

#include <memory>
#include <vector>

#include "host/Documents.h"

namespace hosts
{

/// The open documents, the active one last. A document counts as the active one while it opens already.
class DocumentList : public host::DocumentManager
{
public:
    ~DocumentList() override;

    void RegisterTemplate(host::DocumentTemplate documentTemplate) override;
    void ReleaseTemplate() override;
    host::ManagedDocument* NewDocument() override;
    host::ManagedDocument* OpenDocument(const std::wstring& path) override;
    void CloseActiveDocument() override;
    host::ManagedDocument* GetActiveDocument() const override;

private:
    host::ManagedDocument* Open(const std::wstring* path);

    host::DocumentTemplate registered;
    std::vector<std::unique_ptr<host::ManagedDocument>> documents;
};

} // namespace hosts
