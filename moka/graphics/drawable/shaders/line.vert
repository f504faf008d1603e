#version 100
precision highp float;

uniform mat4 uProjectionMatrix;

attribute vec4 aVertex; // x, y, distance along the line, distance across it

varying highp vec2 vLineCoord;

void main() {
    vLineCoord = aVertex.zw;
    gl_Position = uProjectionMatrix * vec4(aVertex.xy, 0.0, 1.0);
}
