// The piece of road below a bump: only its outline and its plain surface matter.
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
