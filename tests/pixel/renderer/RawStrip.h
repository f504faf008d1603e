// RawStrip.h: draws with whatever program is current, with raw GL, from the test's own memory.
#pragma once

#include <GLES3/gl3.h>

#include <initializer_list>
#include <vector>

namespace Moka::Testing {

struct RawAttribute {
    int components;
    std::vector<GLfloat> values; // of the four vertices, one after the other
};

// A triangle strip of four vertices; the n-th attribute feeds location n.
inline void DrawRawStrip(std::initializer_list<RawAttribute> attributes) {
    glBindBuffer(GL_ARRAY_BUFFER, 0);
    GLuint location = 0;
    for (RawAttribute const& attribute : attributes) {
        glEnableVertexAttribArray(location);
        glVertexAttribPointer(location++, attribute.components, GL_FLOAT, GL_FALSE, 0,
                              attribute.values.data());
    }
    glDrawArrays(GL_TRIANGLE_STRIP, 0, 4);
    while (location > 0) glDisableVertexAttribArray(--location);
}

} // namespace Moka::Testing
