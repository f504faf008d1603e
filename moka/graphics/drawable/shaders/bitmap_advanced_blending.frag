#version 100
precision highp float;

uniform sampler2D uSrcTexture;
uniform sampler2D uDstTexture;
uniform vec4 uColor;
uniform vec4 uTintColor;
uniform vec2 uDstTextureSize; // pixels
uniform int uHasTintColor;
uniform int uBlendingMode; // 1 darken, 2 lighten

varying float alphaAA;
varying vec2 vUV;

vec4 unpremultiply(vec4 color) {
    return color.a == 0.0 ? vec4(0.0) : vec4(color.rgb / color.a, color.a);
}

vec4 source() {
    vec4 texel = texture2D(uSrcTexture, vUV);
    float a = alphaAA * uColor.a;
    if (uHasTintColor != 1) return texel * a;
    a *= uTintColor.a * texel.a;
    return vec4(uTintColor.rgb * a, a);
}

void main() {
    vec4 s = unpremultiply(source());
    vec4 d = unpremultiply(texture2D(uDstTexture, gl_FragCoord.xy / uDstTextureSize));
    float both = s.a * d.a;
    float sourceOnly = s.a * (1.0 - d.a);
    float destinationOnly = d.a * (1.0 - s.a);
    vec3 blended = uBlendingMode == 1 ? min(s.rgb, d.rgb) : max(s.rgb, d.rgb);
    gl_FragColor = vec4(blended * both + s.rgb * sourceOnly + d.rgb * destinationOnly,
                        both + sourceOnly + destinationOnly);
}
