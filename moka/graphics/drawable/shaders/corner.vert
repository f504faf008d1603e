#version 100
precision highp float;

uniform mat4 uProjectionMatrix;

attribute vec4 aVertex; // x, y, the corner's centre x, y

varying highp vec4 vCircleCoord;

void main() {
    vCircleCoord = aVertex;
    gl_Position = uProjectionMatrix * vec4(aVertex.xy, 0.0, 1.0);
}
