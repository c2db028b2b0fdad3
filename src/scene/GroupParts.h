#pragma once

#include <string>

#include <osg/Group>

/// The model file (complete path) of the part `id` of the group whose model hangs below `node`; empty without one.
///
/// The last proxy node of the model lists the parts: its children bear their ids, its file names of the same index
/// are their models. A name that isn't complete starts at the folder of `groupFile`.
std::wstring PartFile(osg::Group& node, const std::wstring& id, const std::wstring& groupFile);
