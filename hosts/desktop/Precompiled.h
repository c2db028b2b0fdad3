#pragma once

// What most sources of this folder include, and what takes long to read.

#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include <osg/Camera>
#include <osgViewer/CompositeViewer>
#include <osgViewer/GraphicsWindow>
#include <QtCore>
#include <QtWidgets>
