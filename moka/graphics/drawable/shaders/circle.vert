#version 100
precision highp float;

uniform mat4 uProjectionMatrix;

attribute vec2 aVertex; // x, y

varying highp vec2 vCircleCoord;

void main() {
    vCircleCoord = aVertex;
    gl_Position = uProjectionMatrix * vec4(aVertex.xy, 0.0, 1.0);
}
