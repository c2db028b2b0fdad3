#pragma once

#include <string>

namespace fake
{

/// The text of a ".dae" file: a box of that size (metres, y up) around the origin, in one colour ("1 0 0").
inline std::string BoxModel(const std::string& colour, double width = 1.0, double height = 1.0, double depth = 1.0)
{
    std::string points, triangles;
    for (int corner = 0; corner < 8; ++corner)
        points += std::to_string((corner & 1 ? 0.5 : -0.5) * width) + " " +
                  std::to_string((corner & 2 ? 0.5 : -0.5) * height) + " " +
                  std::to_string((corner & 4 ? 0.5 : -0.5) * depth) + " ";
    // Each side: its four corners counter-clockwise from outside, and its normal.
    const int sides[6][4] = {{0, 4, 6, 2}, {1, 3, 7, 5}, {0, 1, 5, 4}, {2, 6, 7, 3}, {0, 2, 3, 1}, {4, 5, 7, 6}};
    for (int side = 0; side < 6; ++side)
        for (const int corner : {0, 1, 2, 0, 2, 3})
            triangles += std::to_string(sides[side][corner]) + " " + std::to_string(side) + " ";

    const auto source = [](const std::string& id, const std::string& values, int count)
    {
        return "<source id=\"" + id + "\"><float_array id=\"" + id + "a\" count=\"" + std::to_string(count * 3) +
               "\">" + values + "</float_array><technique_common><accessor source=\"#" + id + "a\" count=\"" +
               std::to_string(count) +
               "\" stride=\"3\"><param name=\"X\" type=\"float\"/><param name=\"Y\" type=\"float\"/><param name=\"Z\" "
               "type=\"float\"/></accessor></technique_common></source>";
    };
    return "<?xml version=\"1.0\" encoding=\"utf-8\"?>\n"
           "<COLLADA xmlns=\"http://www.collada.org/2005/11/COLLADASchema\" version=\"1.4.1\"><asset>"
           "<created>2020-01-01T00:00:00</created><modified>2020-01-01T00:00:00</modified>"
           "<unit name=\"meter\" meter=\"1\"/><up_axis>Y_UP</up_axis></asset>\n"
           "<library_effects><effect id=\"fx\"><profile_COMMON><technique sid=\"c\"><lambert>"
           "<ambient><color>" +
           colour + " 1</color></ambient><diffuse><color>" + colour +
           " 1</color></diffuse></lambert></technique></profile_COMMON></effect></library_effects>\n"
           "<library_materials><material id=\"mat\"><instance_effect url=\"#fx\"/></material></library_materials>\n"
           "<library_geometries><geometry id=\"box\"><mesh>" +
           source("p", points, 8) + source("n", "-1 0 0 1 0 0 0 -1 0 0 1 0 0 0 -1 0 0 1", 6) +
           "<vertices id=\"v\"><input semantic=\"POSITION\" source=\"#p\"/></vertices>"
           "<triangles count=\"12\" material=\"m\"><input semantic=\"VERTEX\" source=\"#v\" offset=\"0\"/>"
           "<input semantic=\"NORMAL\" source=\"#n\" offset=\"1\"/><p>" +
           triangles +
           "</p></triangles></mesh></geometry></library_geometries>\n"
           "<library_visual_scenes><visual_scene id=\"vs\"><node id=\"node\" name=\"box\"><instance_geometry "
           "url=\"#box\"><bind_material><technique_common><instance_material symbol=\"m\" target=\"#mat\"/>"
           "</technique_common></bind_material></instance_geometry></node></visual_scene></library_visual_scenes>"
           "<scene><instance_visual_scene url=\"#vs\"/></scene></COLLADA>\n";
}

} // namespace fake
