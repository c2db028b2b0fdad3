#pragma once

#include <string>

#include "records/SceneObjectStore.h"

/// Records as text. The form stands in docs/attribute-objects.md.

/// Reads one record. Any text is safe: what isn't a record gives the reason with its line.
VtTParsedObject ParseObjectText(const std::wstring& text);

/// The text that reads back as the same record.
std::wstring WriteObjectText(const VtISceneObject& object);
