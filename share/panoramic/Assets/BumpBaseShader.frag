// The piece of road below a bump, which shows where the bump is transparent. It draws without a depth
// test and marks the stencil buffer, so that the road leaves the place to it and to the bump.
//
// It must look like the road round it: from the version line on this is PixShader.frag, since
// shaders of this version can't include one another.
#version 120
#extension GL_ARB_shader_texture_lod : enable

uniform sampler2D basetexture;
uniform sampler2D decalMap;
uniform sampler2D batterTexture;
uniform int osg_FogUsage = -1;    // -1 none, 0 linear, 1 exponential, 2 squared exponential

varying vec3 eyePosition;
varying vec3 eyeNormal;
varying vec2 surface;

const vec3 luminance = vec3(0.30, 0.59, 0.11);
const float plainLeft = 0.13;     // the strip of the picture between edge line and centre line
const float plainWidth = 0.28;

// A place in the strip without markings; walks to and fro, so that it has no seam.
vec2 inPlainStrip(vec2 place)
{
    return vec2(plainLeft + plainWidth * abs(fract(place.x) * 2.0 - 1.0), place.y);
}

// Brightness of a texture at a mip level. Named outright, the level costs one plain look-up where the
// filter along a slanted surface would take many.
float brightness(sampler2D map, vec2 place, float level)
{
#ifdef GL_ARB_shader_texture_lod
    return dot(texture2DLod(map, place, level).rgb, luminance);
#else
    return dot(texture2D(map, place).rgb, luminance);
#endif
}

// How much brighter than its surroundings a texture is at a place, about -1 to 1.
float relief(sampler2D map, vec2 place, float fine, float coarse)
{
    float around = max(brightness(map, place, coarse), 0.02);
    return clamp(brightness(map, place, fine) / around - 1.0, -0.4, 0.4);
}

void addLight(int index, vec3 normal, vec3 toEye, inout vec3 diffuse, inout vec3 specular)
{
    vec4 place = gl_LightSource[index].position;
    vec3 toLight = normalize(place.xyz - eyePosition * place.w);
    float facing = max(dot(normal, toLight), 0.0);

    diffuse += gl_FrontMaterial.ambient.rgb * gl_LightSource[index].ambient.rgb;
    diffuse += gl_FrontMaterial.diffuse.rgb * gl_LightSource[index].diffuse.rgb * facing;
    if (facing > 0.0)
    {
        float glance = max(dot(normal, normalize(toLight + toEye)), 0.0);
        specular += gl_FrontMaterial.specular.rgb * gl_LightSource[index].specular.rgb
                    * pow(glance, max(gl_FrontMaterial.shininess, 1.0));
    }
}

float clearness()
{
    float depth = abs(eyePosition.z);

    if (osg_FogUsage == 0)
        return clamp((gl_Fog.end - depth) * gl_Fog.scale, 0.0, 1.0);
    if (osg_FogUsage == 1)
        return clamp(exp(-gl_Fog.density * depth), 0.0, 1.0);
    if (osg_FogUsage == 2)
        return clamp(exp(-gl_Fog.density * gl_Fog.density * depth * depth), 0.0, 1.0);
    return 1.0;
}

void main()
{
    vec4 base = texture2D(basetexture, surface);
    float distance = length(eyePosition);

    // Markings and repairs are a little transparent throughout, and their picture has no plain strip.
    if (base.a > 0.98)
    {
        // The grain fades out before its texels get smaller than a pixel.
        if (distance < 25.0)
            base.rgb *= 1.0 + (0.5 - 0.02 * distance)
                        * relief(decalMap, inPlainStrip(surface * vec2(5.3, 9.7)), log2(1.0 + 0.3 * distance), 5.0);
        base.rgb *= 1.0 + 0.5 * relief(batterTexture, inPlainStrip(surface * vec2(0.37, 0.11)), 5.0, 7.0);
    }

    vec3 normal = normalize(eyeNormal);
    vec3 toEye = normalize(-eyePosition);
    vec3 diffuse = gl_FrontLightModelProduct.sceneColor.rgb;
    vec3 specular = vec3(0.0);
    addLight(0, normal, toEye, diffuse, specular);
    addLight(1, normal, toEye, diffuse, specular);

    // Clamped where fixed lighting clamps, so that the verge matches the landscape beside it.
    vec3 colour = base.rgb * min(diffuse, 1.0) + min(specular, 1.0);
    gl_FragColor = vec4(mix(gl_Fog.color.rgb, colour, clearness()), base.a * gl_FrontMaterial.diffuse.a);
}
