#version 300 es
precision highp float;

uniform mat4 uProjectionMatrix;
uniform vec4 uColor;
uniform vec4 uTintColor;
uniform int uHasTintColor;
uniform float uMargin; // distance of the corners from the cell, in canvas pixels

in vec4 aCell;    // left, top, side; 4 * the segments' bits + the index of the corner
in vec4 aPoints0; // six points: x and y relative to the cell's corner, radius
in vec4 aPoints1;
in vec4 aPoints2;
in vec4 aPoints3;
in vec2 aPoints4;

flat out vec4 vCell; // left, top, side, the segments' bits
flat out vec4 vPoints0;
flat out vec4 vPoints1;
flat out vec4 vPoints2;
flat out vec4 vPoints3;
flat out vec2 vPoints4;
flat out vec4 vColor;

void main() {
    int code = int(aCell.w);
    vec2 corner = vec2(float(code & 1), float((code >> 1) & 1));
    vCell = vec4(aCell.xyz, float(code >> 2));
    vPoints0 = aPoints0;
    vPoints1 = aPoints1;
    vPoints2 = aPoints2;
    vPoints3 = aPoints3;
    vPoints4 = aPoints4;
    vec4 color = uHasTintColor == 1 ? vec4(uTintColor.rgb, uColor.a * uTintColor.a) : uColor;
    vColor = vec4(color.rgb * color.a, color.a);
    vec2 at = aCell.xy + corner * aCell.z + (corner * 2.0 - 1.0) * uMargin;
    gl_Position = uProjectionMatrix * vec4(at, 0.0, 1.0);
}
