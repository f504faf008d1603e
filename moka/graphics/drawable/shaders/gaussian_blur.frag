#version 300 es
precision highp float;

uniform sampler2D srcTexture;
uniform vec4 uTintColor;
uniform int uHasTintColor;
uniform bool isHorizontal;
uniform float blurAmount;

in vec2 texCoord;

out vec4 fragColor;

// The weights of the samples, from the centre outwards.
const float kWeights[5] = float[](0.227027, 0.1945946, 0.1216216, 0.054054, 0.016216);

void main() {
    vec2 size = vec2(textureSize(srcTexture, 0));
    vec2 tap = isHorizontal ? vec2(1.0 / size.x, 0.0) : vec2(0.0, 1.0 / size.y);
    vec4 result = kWeights[0] * texture(srcTexture, texCoord);
    for (int i = 1; i < 5; ++i) {
        vec2 offset = float(i) * tap * blurAmount;
        vec4 pair = texture(srcTexture, texCoord + offset) + texture(srcTexture, texCoord - offset);
        result += kWeights[i] * pair;
    }
    if (uHasTintColor == 1) {
        float alpha = result.a * uTintColor.a;
        result = vec4(uTintColor.rgb * alpha, alpha);
    }
    fragColor = result;
}
