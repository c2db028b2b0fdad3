#pragma once

#include <string>

class ReadContext;
struct PreparedText;

/// Makes a COLLADA file ready for the stock reader: texture paths absolute, shading defaults filled in, parts in other
/// files taken out, lights, cameras and animations dropped; axes and unit are read, since that reader turns the first
/// its own way and drops the second. Throws when it isn't a COLLADA 1.4 file or has a shape that would never end.
PreparedText PrepareCollada(std::string content, ReadContext& context);
