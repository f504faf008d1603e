#version 100
precision highp float;

uniform mat4 uProjectionMatrix;

attribute vec4 aVertex; // x, y, u, v

varying highp vec2 vUV;

void main() {
    vUV = aVertex.zw;
    gl_Position = uProjectionMatrix * vec4(aVertex.xy, 0.0, 1.0);
}
