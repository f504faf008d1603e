#version 300 es
// Each pixel of a stroke lies in one cell, which contains all segments that can cover it. The coverage is
// their maximum, so the pixel is blended once. The position comes from gl_FragCoord, not from the vertices,
// so that all cells compute the same one, and no pixel is in two cells or in none.
precision highp float;

// The rows of the matrix from the target's pixels to the canvas, in homogeneous coordinates.
uniform vec4 uToCanvasX;
uniform vec4 uToCanvasY;
uniform vec4 uToCanvasW;

flat in vec4 vCell;
flat in vec4 vPoints0;
flat in vec4 vPoints1;
flat in vec4 vPoints2;
flat in vec4 vPoints3;
flat in vec2 vPoints4;
flat in vec4 vColor;

out vec4 fragColor;

// Returns the coverage at position by all discs between a and b, each (x, y, radius). The columns of pixels
// are the steps on the canvas of one device pixel along x and along y.
float Cover(vec2 position, vec3 a, vec3 b, mat2 pixels) {
    vec2 line = b.xy - a.xy;
    vec2 to = position - a.xy;
    float growth = b.z - a.z;
    float square = dot(line, line);
    float rest = square - growth * growth;
    // Find the disc whose edge is nearest. If one end contains the other, that is the larger end.
    float t = growth > 0.0 ? 1.0 : 0.0;
    if (rest > 0.0) {
        float across = abs(to.x * line.y - to.y * line.x);
        t = clamp((dot(to, line) + across * growth * inversesqrt(rest)) / square, 0.0, 1.0);
    }
    vec2 away = to - line * t;
    float radius = mix(a.z, b.z, t);
    float apart = length(away);
    // The change of the distance over one device pixel.
    float pixel = apart > 0.0 ? length(away * pixels) / apart : length(pixels[0]);
    float coverage = clamp(0.5 + (max(radius, 0.5 * pixel) - apart) / pixel, 0.0, 1.0);
    return coverage * min(1.0, 2.0 * radius / pixel);
}

void main() {
    vec3 at = vec3(gl_FragCoord.xy, 1.0);
    float w = dot(uToCanvasW.xyz, at);
    vec2 canvas = vec2(dot(uToCanvasX.xyz, at), dot(uToCanvasY.xyz, at)) / w;
    if (any(lessThan(canvas, vCell.xy)) || any(greaterThanEqual(canvas, vCell.xy + vCell.zz))) discard;
    mat2 pixels = mat2(vec2(uToCanvasX.x, uToCanvasY.x) - canvas * uToCanvasW.x,
                       vec2(uToCanvasX.y, uToCanvasY.y) - canvas * uToCanvasW.y) / w;

    vec2 position = canvas - vCell.xy;
    vec3 p0 = vPoints0.xyz;
    vec3 p1 = vec3(vPoints0.w, vPoints1.xy);
    vec3 p2 = vec3(vPoints1.zw, vPoints2.x);
    vec3 p3 = vPoints2.yzw;
    vec3 p4 = vPoints3.xyz;
    vec3 p5 = vec3(vPoints3.w, vPoints4);
    int segments = int(vCell.w);
    float coverage = 0.0;
    if ((segments & 1) != 0) coverage = Cover(position, p0, p1, pixels);
    if ((segments & 2) != 0) coverage = max(coverage, Cover(position, p1, p2, pixels));
    if ((segments & 4) != 0) coverage = max(coverage, Cover(position, p2, p3, pixels));
    if ((segments & 8) != 0) coverage = max(coverage, Cover(position, p3, p4, pixels));
    if ((segments & 16) != 0) coverage = max(coverage, Cover(position, p4, p5, pixels));
    if (coverage <= 0.0) discard;
    fragColor = vColor * coverage;
}
