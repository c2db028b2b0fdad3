#pragma once

#include <string>
#include <vector>

#include "records/AttributeNames.h"
#include "records/RecordTables.h"

/// Tells a table with attributes of every type, as the folders above tell theirs. True, for a variable of a test file.
inline bool TellSampleTable()
{
    const VtTFloatTupel3 none{0, 0, 0};
    static const VtCAttributeTable table(
        objectTypeStaticBody, {IdentityRows(objectTypeStaticBody, KeptAttribute(attribute::name, L"", "").ForParts()),
                               {
                                   KeptAttribute(attribute::position, none, "").ForParts(),
                                   KeptAttribute(attribute::scale, none, ""),
                                   KeptAttribute(attribute::scaleOrient, none, "").ForParts(),
                                   KeptAttribute(attribute::channelIndex, -1, "").ForParts(),
                                   KeptAttribute(attribute::visible, true, ""),
                                   KeptAttribute(attribute::transparency, 0.0F, ""),
                                   KeptAttribute(attribute::dyeColor, VtTIntTupel3{0, 0, 0}, ""),
                                   KeptAttribute(attribute::childIds, std::vector<std::wstring>(), "").Optional(),
                                   KeptAttribute(attribute::lastTransformMatrix, std::vector<float>(16), ""),
                                   KeptAttribute(attribute::splitterPosition, std::vector<float>(2), ""),
                               }});
    RegisterAttributeTable(table);
    return true;
}
