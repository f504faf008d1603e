#version 300 es
precision highp float;

uniform sampler2D srcTexture;
uniform sampler2D dstTexture;

in vec2 texCoord;

out vec4 fragColor;

void main() {
    vec4 s = texture(srcTexture, texCoord);
    vec4 d = texture(dstTexture, texCoord);
    vec4 f = s + d * (1.0 - s.a);
    // If both are transparent the result of the division is undefined.
    f.rgb /= f.a;
    fragColor = clamp(f, 0.0, 1.0);
}
