#include "tests/pixel/pen/ForeignInk.h"

#include <GLES3/gl3.h>

#include <gtest/gtest.h>

namespace Moka::Testing {

ForeignInk::ForeignInk() : mInk(Tool::GlInk::Create()) {
    glGenTextures(1, &mTexture);
    glGenSamplers(1, &mSampler);
}

ForeignInk::~ForeignInk() {
    glDeleteSamplers(1, &mSampler);
    glDeleteTextures(1, &mTexture);
    mInk.reset();
    EXPECT_EQ(glGetError(), static_cast<GLenum>(GL_NO_ERROR));
}

void ForeignInk::Fill(RectF const& rect, Matrix4<float> const& matrix) const {
    EXPECT_EQ(glGetError(), static_cast<GLenum>(GL_NO_ERROR));
    // In the middle of ink that is wide enough to be solid.
    mInk->Draw(matrix,
               {{rect.left, rect.top, 0, 1},
                {rect.left, rect.bottom, 0, 1},
                {rect.right, rect.top, 0, 1},
                {rect.right, rect.bottom, 0, 1}},
               {0, 1, 0, 1});
    EXPECT_EQ(glGetError(), static_cast<GLenum>(GL_NO_ERROR));
}

void ForeignInk::LeaveAMess() const {
    glEnable(GL_BLEND);
    glBlendEquation(GL_FUNC_REVERSE_SUBTRACT);
    glBlendFunc(GL_ZERO, GL_ZERO);
    glColorMask(GL_FALSE, GL_TRUE, GL_FALSE, GL_FALSE);
    glEnable(GL_SCISSOR_TEST);
    glScissor(1, 1, 2, 2);
    glViewport(3, 3, 5, 4);
    glEnable(GL_STENCIL_TEST);
    glStencilFunc(GL_NEVER, 0, 255);
    glStencilMask(0);
    glEnable(GL_DEPTH_TEST);
    glDepthFunc(GL_NEVER);
    glEnable(GL_CULL_FACE);
    glCullFace(GL_FRONT_AND_BACK);
    for (GLenum unit = 0; unit < 3; ++unit) {
        glActiveTexture(GL_TEXTURE0 + unit);
        glBindTexture(GL_TEXTURE_2D, mTexture); // has no image
        glBindSampler(unit, mSampler);
    }
    glPixelStorei(GL_UNPACK_ALIGNMENT, 8);
    glPixelStorei(GL_UNPACK_SKIP_ROWS, 2);
    glPixelStorei(GL_PACK_ROW_LENGTH, 3);
    glBindFramebuffer(GL_FRAMEBUFFER, 0);
    glClearColor(1, 0, 1, 1);
    mInk->Bind();
    EXPECT_EQ(glGetError(), static_cast<GLenum>(GL_NO_ERROR));
}

} // namespace Moka::Testing
