#pragma once

#include <osg/Matrixd>
#include <osg/observer_ptr>
#include <osg/Quat>
#include <osg/Vec3f>
#include <osgGA/CameraManipulator>
#include <osgGA/GUIEventAdapter>

namespace osg
{
class Node;
}
namespace osgViewer
{
class View;
}
class VtC3DObserver;
class VtIInteractionServices;

/// Turns the mouse and three keys into camera motion in one view.
///
/// With a free observer it drives like a joystick: while the left button is held, the view keeps moving at a rate given
/// by the distance of the mouse from the place of the press, once a frame; on release the new placement is written back
/// to the observer. With any other observer it moves a temporary offset that snaps back on release. Tab rolls, Shift
/// pans. The rotation takes camera axes (looking along -z, y up) to the scene. Without an observer it acts as with one
/// that isn't free.
class VtCOsgCameramanipulator : public osgGA::CameraManipulator
{
public:
    static constexpr int keyTab = 0xFF09;
    static constexpr int keyShiftLeft = 0xFFE1;
    static constexpr int keyShiftRight = 0xFFE2;

    explicit VtCOsgCameramanipulator(VtIInteractionServices& interactionServices);

    const char* className() const override { return "GlidePanelDrive"; }

    bool handle(const osgGA::GUIEventAdapter& event, osgGA::GUIActionAdapter& actions) override;
    void setByMatrix(const osg::Matrixd& matrix) override;

    /// Takes a view matrix, which only turns and moves.
    void setByInverseMatrix(const osg::Matrixd& matrix) override;
    osg::Matrixd getMatrix() const override;
    osg::Matrixd getInverseMatrix() const override;

    /// There is no home position.
    void home(const osgGA::GUIEventAdapter&, osgGA::GUIActionAdapter&) override {}
    void home(double) override {}
    void init(const osgGA::GUIEventAdapter&, osgGA::GUIActionAdapter&) override { Restart(); }

    /// One frame's motion from the present displacement of the mouse; false when nothing is dragged.
    virtual bool calcMovement();

    virtual osg::Matrixd getStoredMatrix() const { return storedMatrix; }
    virtual void setStoredMatrix(const osg::Matrixd& matrix) { storedMatrix = matrix; }
    virtual void resetStoredMatrix() { storedMatrix.makeIdentity(); }

    /// Levels the camera, keeping its direction of view as far as that goes.
    virtual void straighten();

    /// Placement, offsets and drag of `other`, which shows the same observer.
    void copyStateFrom(const VtCOsgCameramanipulator& other);

    /// Whom the mouse moves (not owned, null for nobody), and the view whose manipulator this is.
    void setObserver(VtC3DObserver* newObserver, osgViewer::View* ownView);

private:
    bool DrivesFreely() const;
    void Restart();
    void Press(const osgGA::GUIEventAdapter& event);
    void Release();
    void Record(const osgGA::GUIEventAdapter& event);
    bool Key(int key, bool down);
    void UpdateDeltas(float dx, float dy, bool freely);
    void Pan(bool freely);
    void Roll(bool freely);
    void Drive(bool freely);
    void WriteBack();

    VtIInteractionServices& services;
    float panSpeed;
    float moveSpeed;
    float turnSpeed;
    float deltaX = 0;
    float deltaY = 0;
    osg::Vec3f position;
    osg::Vec3f offsetPosition;
    osg::Quat rotation;
    osg::Quat offsetRotation;
    osg::Matrixd storedMatrix;
    VtC3DObserver* observer = nullptr;
    osg::observer_ptr<osgViewer::View> view; ///< the view holds the manipulator, so not the other way round too
    osg::ref_ptr<const osgGA::GUIEventAdapter> eventAnchor;
    osg::ref_ptr<const osgGA::GUIEventAdapter> eventCurrent;
    bool dragging = false;
    bool moved = false; ///< since the press
    bool rollMode = false;
    bool panMode = false;
};

/// Puts the camera of `view` in front of `node`: at twice the radius of its bound along the present line of view, and
/// half the radius above its origin. Nothing for a null argument, or a node that hangs in no graph.
void frameNode(osgViewer::View* view, const osg::Node* node);
