#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <string>

namespace host
{

/// Base of documents that the host's document manager keeps.
class ManagedDocument
{
public:
    virtual ~ManagedDocument() = default;

    /// Called once on a new, empty document; false refuses it.
    virtual bool OnNewDocument() { return true; }

    /// Called once on a new document that is to be read from `path` (inner form); false refuses it.
    virtual bool OnOpenDocument(const std::wstring& path) = 0;

    /// Writes the document to `path` (inner form); false, after a message, when that failed.
    virtual bool OnSaveDocument(const std::wstring& path) = 0;

    virtual void OnCloseDocument() {}

    virtual void SetModifiedFlag(bool flag) { modified = flag; }
    bool IsModified() const { return modified; }

private:
    bool modified = false;
};

/// What the component registers: how a document is made and which files it takes.
struct DocumentTemplate
{
    std::uint32_t resource = 0;
    std::wstring filter;    ///< "Scene Config Files (*.xml)|*.xml||"
    std::wstring extension; ///< ".xml"
    std::function<std::unique_ptr<ManagedDocument>()> make;
};

/// The host's list of documents; one of them is active.
class DocumentManager
{
public:
    virtual ~DocumentManager() = default;

    virtual void RegisterTemplate(DocumentTemplate documentTemplate) = 0;

    /// Forgets the template; documents must be closed before.
    virtual void ReleaseTemplate() = 0;

    /// Makes a document, lets it open, and makes it active. Null when it refused; the active one then stays.
    virtual ManagedDocument* NewDocument() = 0;
    virtual ManagedDocument* OpenDocument(const std::wstring& path) = 0;

    /// Closes and deletes the active document; the one opened before it becomes active.
    virtual void CloseActiveDocument() = 0;

    virtual ManagedDocument* GetActiveDocument() const = 0;
};

} // namespace host
