#version 300 es
precision highp float;

uniform mat4 projectionMatrix;

in vec4 vertex; // x, y, u, v

out highp vec2 texCoord;

void main() {
    texCoord = vertex.zw;
    gl_Position = projectionMatrix * vec4(vertex.xy, 0.0, 1.0);
}
