#version 100
precision highp float;

uniform mat4 uProjectionMatrix;

attribute vec3 aVertex; // x, y, coverage

varying highp float alphaAA;

void main() {
    alphaAA = aVertex.z;
    gl_Position = uProjectionMatrix * vec4(aVertex.xy, 0.0, 1.0);
}
