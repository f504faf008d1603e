#version 100
precision mediump float;

uniform vec4 uColor;
uniform vec4 uTintColor;
uniform int uHasTintColor;
// Positions, lengths and distances are highp: a mediump float may have 16 bits, which overflow when a
// distance above 256 is squared.
uniform highp vec2 uLineInfo; // half the width, the length
uniform int uIsDashedLine;
uniform highp vec4 uDashedLinePattern; // the ends of dash, gap, dash, gap
uniform highp float uDashedLinePatternLength;
uniform int uLineCapType; // 0 butt, 1 round, else square

varying highp vec2 vLineCoord;

// The position of an edge that does not exist.
const highp float kNowhere = 100000.0;

bool within(highp float x, highp float low, highp float high) {
    return low <= x && x <= high;
}

// Returns the coverage along a line without dashes.
float alongSolid(highp vec2 at, highp float halfWidth, highp float lineLength) {
    if (uLineCapType == 0) {
        // Both ends of a line shorter than a pixel may lie in one pixel. Then its beginning counts for
        // positions on the line, and its end for those after it.
        bool isAtBegin = at.x < 0.5 && at.x <= lineLength;
        return clamp(0.5 + (isAtBegin ? at.x : lineLength - at.x), 0.0, 1.0);
    }
    highp float beyond = max(max(-at.x, at.x - lineLength), 0.0); // the distance beyond an end
    if (uLineCapType == 1) return clamp(0.5 + halfWidth - length(vec2(beyond, at.y)), 0.0, 1.0);
    return clamp(0.5 + halfWidth - beyond, 0.0, 1.0);
}

// A dash (inside is true), or the gap between two dashes.
struct Stretch {
    highp float x; // the fragment's position along the line; in a dashed line, its position in the pattern
    highp float left;
    highp float right;
    bool inside;
};

Stretch dashed(highp float x, highp float halfWidth, highp float lineLength) {
    highp vec4 p = uDashedLinePattern;
    highp float rest = mod(lineLength, uDashedLinePatternLength); // where the line ends in the pattern
    highp float cx = mod(x, uDashedLinePatternLength);
    if (x >= lineLength) {
        if (within(rest, 0.0, p.x) || within(rest, p.y, p.z)) return Stretch(x, lineLength, kNowhere, false);
        return Stretch(cx, rest < p.y ? p.x : p.z, kNowhere, false);
    }
    Stretch s = Stretch(cx, p.z, p.w, false);
    if (cx < p.x) {
        s = Stretch(cx, 0.0, p.x, true);
    } else if (cx < p.y) {
        s = Stretch(cx, p.x, p.y, false);
    } else if (cx < p.z) {
        s = Stretch(cx, p.y, p.z, true);
    }
    // After a line that ends in a gap there is no dash whose cap could extend back.
    bool endsInGap = within(rest, p.x, p.y) || within(rest, p.z, p.w);
    if (x >= lineLength - halfWidth - 0.5 && !s.inside && endsInGap) s.right = kNowhere;
    return s;
}

float alongInside(Stretch s) {
    if (uLineCapType != 0) return 1.0;
    if (s.x < s.left + 0.5) return max(0.5 + s.x - s.left, 0.0);
    if (s.x > s.right - 0.5) return max(0.5 + s.right - s.x, 0.0);
    return 1.0;
}

// Returns the coverage by the caps of the dashes on both sides.
float alongOutside(Stretch s, highp float y, highp float halfWidth) {
    float left;
    float right;
    if (uLineCapType == 0) {
        left = max(0.5 + s.left - s.x, 0.0);
        right = max(0.5 + s.x - s.right, 0.0);
    } else if (uLineCapType == 1) {
        left = clamp(0.5 + halfWidth - distance(vec2(s.x, y), vec2(s.left, 0.0)), 0.0, 1.0);
        right = clamp(0.5 + halfWidth - distance(vec2(s.x, y), vec2(s.right, 0.0)), 0.0, 1.0);
    } else {
        left = clamp(0.5 + (s.left + halfWidth) - s.x, 0.0, 1.0);
        right = clamp(0.5 + s.x - (s.right - halfWidth), 0.0, 1.0);
    }
    return max(left, right);
}

float alongDashed(highp vec2 at, highp float halfWidth, highp float lineLength) {
    Stretch s = dashed(at.x, halfWidth, lineLength);
    return s.inside ? alongInside(s) : alongOutside(s, at.y, halfWidth);
}

void main() {
    highp float halfWidth = uLineInfo.x; // 0.5 at least
    highp float lineLength = uLineInfo.y;
    float along;
    if (uIsDashedLine == 1) {
        along = alongDashed(vLineCoord, halfWidth, lineLength);
    } else {
        along = alongSolid(vLineCoord, halfWidth, lineLength);
    }
    float across = clamp(0.5 + halfWidth - abs(vLineCoord.y), 0.0, 1.0);

    float alpha = min(along, across) * uColor.a;
    vec3 color = uColor.rgb;
    if (uHasTintColor == 1) {
        alpha *= uTintColor.a;
        color = uTintColor.rgb;
    }
    gl_FragColor = vec4(color * alpha, alpha);
}
