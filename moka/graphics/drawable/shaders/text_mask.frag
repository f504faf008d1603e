#version 100
precision highp float;

uniform sampler2D uSrcTexture;
uniform vec4 uMaskColor;

varying vec2 vUV;

void main() {
    float mask = texture2D(uSrcTexture, vUV).a;
    if (!(mask > 0.0)) discard;
    gl_FragColor = vec4(uMaskColor.rgb * mask, mask);
}
