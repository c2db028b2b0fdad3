#pragma once

#include <string>

#include "assets/models/ModelPackage.h"
#include "assets/models/ModelRequest.h"

/// The finished model as a package. A model that can't be read gives a package with the reason; what no reason can be
/// found for ends this process, which is what it is there for.
std::string ReadModel(const ModelRequest& request);
