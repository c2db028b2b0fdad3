// Road surfaces: hands position and normal to the lighting that is done per pixel.
//
// The program may have vertex attributes bound at 4 (SecondaryColor), 6 (Tangent) and 7 (Binormal).
// Road models needn't carry them, so nothing here depends on them.
#version 120

varying vec3 eyePosition;
varying vec3 eyeNormal;
varying vec2 surface;      // texture coordinates of the road

void main()
{
    vec4 position = gl_ModelViewMatrix * gl_Vertex;

    eyePosition = position.xyz;
    eyeNormal = gl_NormalMatrix * gl_Normal;
    surface = gl_MultiTexCoord0.xy;
    gl_Position = gl_ProjectionMatrix * position;
    gl_ClipVertex = position;
}
