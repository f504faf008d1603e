#include "moka/renderer/gles/GlVertexFormats.h"

#include "moka/renderer/device/Counters.h"
#include "moka/renderer/gles/GlState.h"

#include <cstdint>

namespace Moka::detail {

int GlVertexFormats::Find(VertexDescriptor const& descriptor) {
    for (std::size_t i = 0; i < mFormats.size(); ++i) {
        if (mFormats[i].descriptor == descriptor) return static_cast<int>(i);
    }
    mFormats.push_back({descriptor, 0});
    return static_cast<int>(mFormats.size()) - 1;
}

// A whole new store each time, so that the driver need not wait for the draws that read the old one.
void GlVertexFormats::Upload(std::vector<GLfloat> const& vertices) {
    if (mBuffer == 0) {
        Gl::GenBuffers(1, &mBuffer);
        ++mState.counters.buffers;
    }
    std::size_t const bytes = vertices.size() * sizeof(GLfloat);
    mState.arrayBuffer.Set(mBuffer);
    Gl::BufferData(GL_ARRAY_BUFFER, static_cast<GLsizeiptr>(bytes), vertices.data(), GL_STREAM_DRAW);
    mState.counters.vertexBytes += bytes;
}

void GlVertexFormats::Bind(int format) {
    Format& wanted = mFormats[static_cast<std::size_t>(format)];
    if (wanted.vertexArray == 0) {
        MakeVertexArray(wanted);
    } else {
        mState.vertexArray.Set(wanted.vertexArray);
    }
}

void GlVertexFormats::MakeVertexArray(Format& format) {
    Gl::GenVertexArrays(1, &format.vertexArray);
    ++mState.counters.buffers;
    mState.vertexArray.Set(format.vertexArray);
    mState.arrayBuffer.Set(mBuffer);
    VertexDescriptor const& descriptor = format.descriptor;
    auto const stride = static_cast<GLsizei>(descriptor.GetFloatCount() * static_cast<int>(sizeof(GLfloat)));
    std::uintptr_t offset = 0;
    for (int i = 0; i < descriptor.GetAttributeCount(); ++i) {
        int const components = descriptor.GetAttribute(i).components;
        auto const location = static_cast<GLuint>(i);
        Gl::EnableVertexAttribArray(location);
        auto const* const pointer = reinterpret_cast<void const*>(offset);
        Gl::VertexAttribPointer(location, components, GL_FLOAT, GL_FALSE, stride, pointer);
        offset += static_cast<std::uintptr_t>(components) * sizeof(GLfloat);
    }
}

void GlVertexFormats::Clear() {
    for (Format& format : mFormats) {
        if (format.vertexArray == 0) continue;
        mState.ForgetVertexArray(format.vertexArray);
        Gl::DeleteVertexArrays(1, &format.vertexArray);
        --mState.counters.buffers;
    }
    mFormats.clear();
    if (mBuffer == 0) return;
    mState.ForgetArrayBuffer(mBuffer);
    Gl::DeleteBuffers(1, &mBuffer);
    mBuffer = 0;
    --mState.counters.buffers;
}

} // namespace Moka::detail
