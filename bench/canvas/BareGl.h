// BareGl.h: the GL objects of the benchmarks' bare GL code.
// Thread: render thread. The library may draw between frames, so this code does not depend on earlier GL
//         state.
#pragma once

#include <GLES3/gl3.h>

#include <initializer_list>
#include <vector>

namespace Moka::Bench {

// A program. If it does not compile, the process ends. The source defines the attribute locations.
class BareProgram {
public:
    BareProgram(char const* vertexSource, char const* fragmentSource);
    ~BareProgram() { glDeleteProgram(mName); }
    BareProgram(BareProgram const&) = delete;
    BareProgram& operator=(BareProgram const&) = delete;

    void Use() const { glUseProgram(mName); }
    GLint Find(char const* uniform) const { return glGetUniformLocation(mName, uniform); }

private:
    GLuint mName;
};

// A texture and the frame buffer that draws into it.
class BareImage {
public:
    BareImage(int width, int height);
    ~BareImage();
    BareImage(BareImage const&) = delete;
    BareImage& operator=(BareImage const&) = delete;

    void DrawInto() const;
    void Sample() const; // with the first unit

private:
    int mWidth;
    int mHeight;
    GLuint mTexture = 0;
    GLuint mFrameBuffer = 0;
};

// Vertices. The numbers are the numbers of floats of the attributes 0, 1, ...
class BareVertices {
public:
    explicit BareVertices(std::initializer_list<int> attributes);
    ~BareVertices();
    BareVertices(BareVertices const&) = delete;
    BareVertices& operator=(BareVertices const&) = delete;

    void Upload(std::vector<float> const& vertices) const;
    int Count(std::vector<float> const& vertices) const {
        return static_cast<int>(vertices.size()) / mFloats;
    }

private:
    int mFloats = 0;
    GLuint mArray = 0;
    GLuint mBuffer = 0;
};

// Sets blending to premultiplied source-over and switches all tests off.
void SetBareState();

} // namespace Moka::Bench
