#version 100
precision mediump float;

uniform vec4 uColor;
uniform vec4 uTintColor;
uniform int uHasTintColor;
uniform int uIsFill;
// Positions, lengths and distances are highp: a mediump float may have 16 bits, which overflow when a distance
// above 256 is squared.
uniform highp float uStrokeWidth;
uniform highp vec2 uCenter;
uniform highp float uRadius;

varying highp vec2 vCircleCoord;

void main() {
    highp float dist = distance(uCenter, vCircleCoord);
    highp float k = uIsFill == 1 ? 0.0 : uStrokeWidth * 0.5;
    highp float outer = uRadius + k;
    if (dist > outer + 0.5) discard;

    float alpha = uColor.a;
    if (dist > outer - 0.5) {
        alpha *= outer - dist + 0.5;
    } else if (uIsFill != 1) {
        highp float inner = uRadius - k;
        if (dist < inner - 0.5) discard;
        if (dist < inner + 0.5) alpha *= dist - inner + 0.5;
    }

    vec3 color = uColor.rgb;
    if (uHasTintColor == 1) {
        alpha *= uTintColor.a;
        color = uTintColor.rgb;
    }
    gl_FragColor = vec4(color * alpha, alpha);
}
