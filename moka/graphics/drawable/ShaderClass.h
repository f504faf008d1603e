// ShaderClass.h: the shape that all shader classes share. A class is its table of uniforms; from that come a
// ParameterBinding for each, named as in GLSL, and the constructor that binds them in the table's order:
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
// Owner:  ShaderManager, which makes one for all who draw with it.
// Thread: render thread.
// Fails:  the constructor throws InvalidArgumentException when a uniform is not of the table's type. It
//         releases the bindings made so far, the last one first, and keeps the program.
#pragma once

#include "moka/graphics/drawable/ParameterBinding.h"
#include "moka/renderer/IShaderProgram.h"
#include "moka/renderer/RendererFactory.h"

// NOLINTBEGIN(bugprone-macro-parentheses): what is declared cannot stand in parentheses
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

// The program goes first, then the bindings with their members, the last one first.
#define MOKA_SHADER_DEFINITION(Class, UNIFORMS, vertexText, fragmentText)                                    \
    Class::Class()                                                                                           \
        : program(RendererFactory::CreateShaderProgram(vertexText, fragmentText, #Class)){                   \
              UNIFORMS(MOKA_SHADER_BIND)} Class::~Class() {                                                  \
        program->Release();                                                                                  \
    }
// NOLINTEND(bugprone-macro-parentheses)
