#include "moka/renderer/gles/GlVertexFormats.h"

#include "moka/renderer/device/Counters.h"
#include "moka/renderer/gles/GlState.h"
#include "moka/renderer/gles/GlslVariant.h"

#include <cstdint>

namespace Moka::detail {

int GlVertexFormats::Find(VertexDescriptor const& descriptor) {
    for (std::size_t i = 0; i < mFormats.size(); ++i) {
        if (mFormats[i].descriptor == descriptor) return static_cast<int>(i);
    }
    mFormats.emplace_back();
    mFormats.back().descriptor = descriptor;
    return static_cast<int>(mFormats.size()) - 1;
}

// Allocates a new data store each time, so that the driver need not wait for draws that read the old one.
void GlVertexFormats::Upload(AppendBuffer<float> const& vertices) {
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
    if (wanted.vertexArray != 0) {
        mState.vertexArray.Set(wanted.vertexArray);
        return;
    }
    MakeVertexArray(&wanted.vertexArray);
    SetAttributes(wanted.descriptor, 0);
}

void GlVertexFormats::BindNumbered(int format, int first, GLuint numberBuffer, std::size_t numbers) {
    Format& wanted = mFormats[static_cast<std::size_t>(format)];
    bool const isNew = wanted.numberedArray == 0;
    if (isNew) {
        MakeVertexArray(&wanted.numberedArray);
        Gl::EnableVertexAttribArray(kRecordLocation);
    } else {
        mState.vertexArray.Set(wanted.numberedArray);
    }
    if (isNew || wanted.first != first) SetAttributes(wanted.descriptor, first);
    if (isNew || wanted.numbers != numbers) {
        mState.arrayBuffer.Set(numberBuffer);
        auto const* const pointer = reinterpret_cast<void const*>(numbers * sizeof(GLushort));
        Gl::VertexAttribIPointer(kRecordLocation, 1, GL_UNSIGNED_SHORT, 0, pointer);
    }
    wanted.first = first;
    wanted.numbers = numbers;
}

void GlVertexFormats::MakeVertexArray(GLuint* vertexArray) {
    Gl::GenVertexArrays(1, vertexArray);
    ++mState.counters.buffers;
    mState.vertexArray.Set(*vertexArray);
}

void GlVertexFormats::SetAttributes(VertexDescriptor const& descriptor, int first) {
    mState.arrayBuffer.Set(mBuffer);
    auto const stride = static_cast<GLsizei>(descriptor.GetFloatCount() * static_cast<int>(sizeof(GLfloat)));
    std::uintptr_t offset = static_cast<std::uintptr_t>(first) * static_cast<std::uintptr_t>(stride);
    for (int i = 0; i < descriptor.GetAttributeCount(); ++i) {
        int const components = descriptor.GetAttribute(i).components;
        auto const location = static_cast<GLuint>(i);
        Gl::EnableVertexAttribArray(location);
        auto const* const pointer = reinterpret_cast<void const*>(offset);
        Gl::VertexAttribPointer(location, components, GL_FLOAT, GL_FALSE, stride, pointer);
        offset += static_cast<std::uintptr_t>(components) * sizeof(GLfloat);
    }
}

void GlVertexFormats::DeleteVertexArray(GLuint vertexArray) {
    if (vertexArray == 0) return;
    mState.ForgetVertexArray(vertexArray);
    Gl::DeleteVertexArrays(1, &vertexArray);
    --mState.counters.buffers;
}

void GlVertexFormats::Clear() {
    for (Format const& format : mFormats) {
        DeleteVertexArray(format.vertexArray);
        DeleteVertexArray(format.numberedArray);
    }
    mFormats.clear();
    if (mBuffer == 0) return;
    mState.ForgetBuffer(mBuffer);
    Gl::DeleteBuffers(1, &mBuffer);
    mBuffer = 0;
    --mState.counters.buffers;
}

} // namespace Moka::detail
