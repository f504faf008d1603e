#version 100
precision mediump float;

uniform vec4 uColor;
uniform vec4 uTintColor;
uniform int uHasTintColor;
uniform int uIsFill;
uniform float uStrokeWidth;
uniform vec2 uCenter;
uniform float uRadius;

varying vec2 vCircleCoord;

void main() {
    float dist = distance(uCenter, vCircleCoord);
    float k = uIsFill == 1 ? 0.0 : uStrokeWidth * 0.5;
    float outer = uRadius + k;
    if (dist > outer + 0.5) discard;

    float alpha = uColor.a;
    if (dist > outer - 0.5) {
        alpha *= outer - dist + 0.5;
    } else if (uIsFill != 1) {
        float inner = uRadius - k;
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
