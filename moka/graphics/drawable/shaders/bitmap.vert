#version 100
precision highp float;

uniform mat4 uProjectionMatrix;

attribute vec3 aVertex; // x, y, coverage
attribute vec2 aUV;

varying highp float alphaAA;
varying highp vec2 vUV;

void main() {
    alphaAA = aVertex.z;
    vUV = aUV;
    gl_Position = uProjectionMatrix * vec4(aVertex.xy, 0.0, 1.0);
}
