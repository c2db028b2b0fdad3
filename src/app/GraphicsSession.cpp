#include "app/GraphicsSession.h"

#include <osg/Notify>
#include <osgDB/Registry>

std::unique_ptr<VtCGraphicsSession> graphicsSession;

VtCGraphicsSession::VtCGraphicsSession()
{
    osg::setNotifyLevel(osg::WARN);
}

VtCGraphicsSession::~VtCGraphicsSession()
{
    osgDB::Registry::instance()->clearObjectCache();
}
