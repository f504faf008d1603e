#version 100
precision mediump float;

uniform vec4 uColor;
uniform vec4 uTintColor;
uniform int uHasTintColor;

varying highp float alphaAA;

void main() {
    float alpha = alphaAA * uColor.a;
    vec3 color = uColor.rgb;
    if (uHasTintColor == 1) {
        alpha *= uTintColor.a;
        color = uTintColor.rgb;
    }
    gl_FragColor = vec4(color * alpha, alpha);
}
