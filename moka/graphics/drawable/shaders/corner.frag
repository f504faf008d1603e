#version 100
precision highp float;

uniform vec4 uColor;
uniform vec4 uTintColor;
uniform int uHasTintColor;
uniform int uIsFill;
uniform float uStrokeWidth;
uniform vec2 uRxry;

varying vec4 vCircleCoord;

// Returns the squared distance from the corner's centre, in units of the ellipse's radii: 1 on the ellipse.
float onEllipse(vec2 radii) {
    vec2 d = vCircleCoord.xy - vCircleCoord.zw;
    vec2 squares = (d * d) / (radii * radii);
    return squares.x + squares.y;
}

// Both axes use the ramp width of the x radii. // Compat: corner-ramp
float rampWidth(float outer, float inner) {
    return (outer * outer) / (inner * inner) - 1.0;
}

void main() {
    float k = uIsFill == 1 ? 0.0 : uStrokeWidth * 0.5;
    vec2 edge = uRxry + k;
    if (onEllipse(edge + 0.5) > 1.0) discard;

    float alpha = uColor.a;
    float s = onEllipse(edge - 0.5);
    if (s > 1.0) alpha *= 1.0 - (s - 1.0) / rampWidth(edge.x + 0.5, edge.x - 0.5);

    if (uIsFill != 1) {
        vec2 hole = uRxry - k;
        float t = onEllipse(hole - 0.5);
        if (t < 1.0) discard;
        if (onEllipse(hole + 0.5) < 1.0) alpha *= (t - 1.0) / rampWidth(hole.x + 0.5, hole.x - 0.5);
    }

    vec3 color = uColor.rgb;
    if (uHasTintColor == 1) {
        alpha *= uTintColor.a;
        color = uTintColor.rgb;
    }
    gl_FragColor = vec4(color * alpha, alpha);
}
