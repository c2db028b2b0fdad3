#pragma once

#include <string>
#include <string_view>

#include <osg/Group>
#include <osg/Image>
#include <osg/ref_ptr>

/// A finished model's graph as bytes, and back.
///
/// The library's own binary form makes objects of any class that the bytes name, loads modules for them from the
/// working directory among others, and reads files that they name. These bytes come from a process that a foreign file
/// may have taken over; so this form knows the nodes and the state that the reading process builds and nothing else,
/// and believes no count, index or size.
std::string EncodeGraph(const osg::Group& graph);

/// Throws `std::runtime_error` when the bytes are no whole graph that can be drawn without harm.
osg::ref_ptr<osg::Group> DecodeGraph(std::string_view bytes);

/// Whether an image has sizes and formats that go through the above, and data for all of it.
bool IsKnownImage(const osg::Image& image);
