#version 100
precision mediump float;

uniform sampler2D uSrcTexture1;
uniform sampler2D uSrcTexture2;
uniform float uFactor;
// The drawable sets these, but they have no effect.
uniform vec4 uColor;
uniform vec4 uTintColor;
uniform int uHasTintColor;

varying highp float alphaAA;
varying highp vec2 vUV; // 16 bits cannot distinguish the texels of a wide bitmap

void main() {
    gl_FragColor = mix(texture2D(uSrcTexture1, vUV), texture2D(uSrcTexture2, vUV), uFactor);
}
