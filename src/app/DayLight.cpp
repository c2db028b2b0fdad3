#include "app/DayLight.h"

#include <osg/Group>
#include <osg/Light>
#include <osg/LightSource>

namespace
{

osg::ref_ptr<osg::LightSource> Source(osg::Light* light)
{
    osg::ref_ptr<osg::LightSource> source = new osg::LightSource;
    source->setLight(light);
    return source;
}

osg::ref_ptr<osg::LightSource> HeadLight()
{
    osg::ref_ptr<osg::Light> light = new osg::Light;
    light->setLightNum(0);
    light->setPosition(osg::Vec4(0.0F, 0.0F, 1.0F, 0.0F)); // from behind the eye
    light->setAmbient(osg::Vec4(0.0F, 0.0F, 0.0F, 1.0F));
    light->setDiffuse(osg::Vec4(0.25F, 0.25F, 0.28F, 1.0F));
    light->setSpecular(osg::Vec4(0.0F, 0.0F, 0.0F, 1.0F));
    osg::ref_ptr<osg::LightSource> source = Source(light.get());
    source->setReferenceFrame(osg::LightSource::ABSOLUTE_RF); // the eye's, whichever view is drawn
    return source;
}

osg::ref_ptr<osg::LightSource> Sun()
{
    osg::ref_ptr<osg::Light> light = new osg::Light;
    light->setLightNum(1);
    light->setPosition(osg::Vec4(-0.45F, -0.6F, 0.66F, 0.0F)); // a direction: the last is 0
    light->setAmbient(osg::Vec4(0.50F, 0.52F, 0.56F, 1.0F));
    light->setDiffuse(osg::Vec4(1.00F, 0.97F, 0.90F, 1.0F));
    light->setSpecular(osg::Vec4(0.6F, 0.6F, 0.55F, 1.0F));
    return Source(light.get());
}

} // namespace

void AddDayLight(osg::Group& environment)
{
    environment.addChild(Sun());
    environment.addChild(HeadLight());
}
