#version 100
precision mediump float;

uniform sampler2D uSrcTexture;
uniform vec4 uColor;
uniform vec4 uTintColor;
uniform int uHasTintColor;

varying highp float alphaAA;
varying highp vec2 vUV; // 16 bits cannot distinguish the texels of a wide bitmap

void main() {
    vec4 texel = texture2D(uSrcTexture, vUV);
    float a = alphaAA * uColor.a;
    if (uHasTintColor == 1) {
        a *= uTintColor.a * texel.a;
        gl_FragColor = vec4(uTintColor.rgb * a, a);
    } else {
        gl_FragColor = texel * a;
    }
}
