#pragma once

class VtCScene3D;
class VtIInstrumentFeed;

/// The scene that data go to. The application object implements it, since it knows the active document.
class VtIActiveScene
{
public:
    virtual ~VtIActiveScene() = default;

    /// Null while no document with a scene is open.
    virtual VtCScene3D* GetActiveScene() const = 0;

    /// The instruments of that scene, null without a scene or without instruments.
    virtual VtIInstrumentFeed* GetActiveInstruments() const = 0;
};
