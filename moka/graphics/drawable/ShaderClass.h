// ShaderClass.h: macros that define shader classes from a table of uniforms. A class has a ParameterBinding
// for each uniform, named as in GLSL, and a constructor that binds them in the table's order:
//
//     #define DISC_UNIFORMS(U)                    kind K stands for BindingTypeK
//         U(Matrix4, uProjectionMatrix)
//         U(Vector4, uColor)
//     MOKA_SHADER_CLASS(DiscShader, DISC_UNIFORMS)                                     in a header
//     MOKA_SHADER_DEFINITION(DiscShader, DISC_UNIFORMS, vertexText, fragmentText)      in a source file
//
//     shader->program->MakeCurrent();
//     shader->uColor = paint.GetColor();
//
// Owner:  ShaderManager, which creates one object for all users.
// Thread: render thread.
// Fails:  the constructor throws InvalidArgumentException if a uniform does not have the table's type. The
//         bindings created so far are then released, the last one first; the program leaks.
#pragma once

#include "moka/graphics/drawable/ParameterBinding.h"
#include "moka/renderer/IShaderProgram.h"
#include "moka/renderer/RendererFactory.h"

// NOLINTBEGIN(bugprone-macro-parentheses): C++ does not allow parentheses around a declared name
#define MOKA_SHADER_MEMBER(kind, name) ParameterBinding<BindingType##kind> name;
#define MOKA_SHADER_BIND(kind, name) name.bind(program, #name);

#define MOKA_SHADER_CLASS(Class, UNIFORMS)                                                                   \
    class Class {                                                                                            \
    public:                                                                                                  \
        Class();                                                                                             \
        ~Class();                                                                                            \
        Class(Class const&) = delete;                                                                        \
        Class& operator=(Class const&) = delete;                                                             \
                                                                                                             \
        UNIFORMS(MOKA_SHADER_MEMBER)                                                                         \
        IShaderProgram* program;                                                                             \
    };

// The destructor releases the program first, then the bindings, the last one first.
#define MOKA_SHADER_DEFINITION(Class, UNIFORMS, vertexText, fragmentText)                                    \
    Class::Class()                                                                                           \
        : program(RendererFactory::CreateShaderProgram(vertexText, fragmentText, #Class)){                   \
              UNIFORMS(MOKA_SHADER_BIND)} Class::~Class() {                                                  \
        program->Release();                                                                                  \
    }
// NOLINTEND(bugprone-macro-parentheses)
