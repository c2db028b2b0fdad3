#pragma once

#include <filesystem>
#include <map>
#include <string>
#include <vector>

#include <gtest/gtest.h>
#include <osg/Geode>
#include <osg/Geometry>
#include <osg/Group>
#include <osg/Node>

#include "assets/models/ModelReaderSettings.h"

/// Small models made up by a test, in a folder that goes with it.
class AssetsFixture : public testing::Test
{
protected:
    /// A unit square in the plane z = 0 that looks along z, by a node of a COLLADA file.
    struct Square
    {
        std::string name;
        std::string transform; ///< "<translate>1 2 3</translate>", or nothing
        std::string material;  ///< a name of the effects, or nothing
    };

    /// The rest of a COLLADA file.
    struct File
    {
        std::vector<Square> squares;
        std::map<std::string, std::string> effects; ///< name -> "<lambert>...</lambert>"; "TEXTURE" stands for tex.png
        std::string unit = "1";
        std::string up = "Y_UP";
        std::string nodes; ///< further text of the scene
    };

    struct Placed
    {
        osg::Geode* geode;
        osg::Geometry* geometry;
        osg::BoundingBox box; ///< in the model's root
    };

    void SetUp() override;
    void TearDown() override;

    static std::string Dae(const File& file);

    /// A VRML shape with a unit square; `fields` go into the IndexedFaceSet, `appearance` into the Appearance.
    static std::string WrlSquare(const std::string& name, const std::string& appearance,
                                 const std::string& fields = {});

    std::string Write(const std::string& name, const std::string& content) const; ///< gives the full path
    void WritePicture(const std::string& name, int size, bool alpha = false) const;

    /// A program that leaves a line in `starts.log` and then goes on as `body`, a piece of shell script that has the
    /// real reader as $READER.
    std::filesystem::path Script(const std::string& body) const;
    int CountStarts() const;

    /// Settings without a cache.
    VtTModelReaderSettings Settings() const;

    /// Every geometry below `root` with its geode and place.
    static std::vector<Placed> Geometries(osg::Node& root);
    static const Placed* Find(const std::vector<Placed>& all, const std::string& geode);

    std::filesystem::path folder;
};
