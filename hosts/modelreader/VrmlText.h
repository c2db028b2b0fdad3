#pragma once

#include <string>

class ReadContext;
struct PreparedText;

/// Makes a VRML 97 file ready for the stock reader: texture paths absolute, shading defaults filled in, `Inline` taken
/// out as parts, and shapes with `solid FALSE` marked by their name, since that reader drops the field. Other forms of
/// ".wrl" (VRML 1.0, compressed files) pass as they are, without defaults.
PreparedText PrepareVrml(std::string content, ReadContext& context);
