// Pixels up to the GPU and back: which row goes where, what lies outside, and what the driver is told.
#include "tests/pixel/renderer/RendererFixture.h"

#include "moka/base/Rect.h"

#include <cstring>
#include <limits>

namespace Moka::Testing {
namespace {

class TextureTransferTest : public RendererFixture {};

// Color-store values that would ruin any transfer that trusts in the defaults.
void LeavePixelStoreDirty(GLuint buffer) {
    for (int const name : {GL_UNPACK_ROW_LENGTH, GL_UNPACK_SKIP_ROWS, GL_UNPACK_SKIP_PIXELS,
                           GL_PACK_ROW_LENGTH, GL_PACK_SKIP_ROWS, GL_PACK_SKIP_PIXELS}) {
        glPixelStorei(static_cast<GLenum>(name), 3);
    }
    glPixelStorei(GL_UNPACK_ALIGNMENT, 1);
    glPixelStorei(GL_PACK_ALIGNMENT, 8);
    glBindBuffer(GL_PIXEL_UNPACK_BUFFER, buffer);
    glBindBuffer(GL_PIXEL_PACK_BUFFER, buffer);
}

void ExpectDefaultPixelStore() {
    for (int const name : {GL_UNPACK_ROW_LENGTH, GL_UNPACK_SKIP_ROWS, GL_UNPACK_SKIP_PIXELS,
                           GL_PACK_ROW_LENGTH, GL_PACK_SKIP_ROWS, GL_PACK_SKIP_PIXELS,
                           GL_PIXEL_UNPACK_BUFFER_BINDING, GL_PIXEL_PACK_BUFFER_BINDING}) {
        EXPECT_EQ(GetInteger(static_cast<GLenum>(name)), 0) << std::hex << name;
    }
    EXPECT_EQ(GetInteger(GL_UNPACK_ALIGNMENT), 4);
    EXPECT_EQ(GetInteger(GL_PACK_ALIGNMENT), 4);
}

TEST_F(TextureTransferTest, TheFirstRowUploadedIsGlRowZeroAndComesBackFirst) {
    Picture const image = MakePattern(5, 3);
    auto const [texture, target] = MakeOffscreen(image);
    EXPECT_EQ(Read(*texture), image);
    // Seen by GL itself, without the renderer's own read-back.
    target->Activate();
    Color first;
    glReadPixels(1, 0, 1, 1, GL_RGBA, GL_UNSIGNED_BYTE, first.data());
    EXPECT_EQ(first, image.GetColor(1, 0));
}

TEST_F(TextureTransferTest, ANewTextureWithoutPixelsIsTransparentWhateverForeignCodeLeft) {
    glEnable(GL_SCISSOR_TEST);
    glScissor(2, 2, 1, 1);
    glColorMask(GL_FALSE, GL_TRUE, GL_FALSE, GL_TRUE);
    // Freed memory is what a driver hands out again, so it is filled with something to be seen.
    { TexturePtr const old = MakeTexture(MakeImage(64, 64, kRed)); }
    TexturePtr const texture = MakeTexture(64, 64);
    EXPECT_EQ(Read(*texture), MakeImage(64, 64, kClear));
    EXPECT_TRUE(glIsEnabled(GL_SCISSOR_TEST));
    EXPECT_EQ(GetColorMask(), (ColorMask{0, 1, 0, 1}));
}

TEST_F(TextureTransferTest, ABlockIsUploadedOutOfALargerImage) {
    Picture const whole = MakePattern(300, 50);
    TexturePtr const texture(RendererFactory::CreateTextureObject(
        {183, 18, 0, 2, 6, 1, true, nullptr}, nullptr, 0, {whole.pixels.data(), 17, 32, whole.width}));
    EXPECT_EQ(Read(*texture), MakeImage(183, 18).With(0, 0, whole.Crop(17, 32, 183, 18)));
    EXPECT_EQ(RendererFactory::GetStatistics().bytesUploaded, 183u * 18 * 4);
}

TEST_F(TextureTransferTest, UploadsOutsideTheTextureAreClippedAndTheRestLandsInItsPlace) {
    Picture const base = MakeImage(8, 6, kGreen);
    Picture const source = MakePattern(5, 4);
    constexpr int kMin = std::numeric_limits<int>::min();
    constexpr int kMax = std::numeric_limits<int>::max();
    struct {
        Rect rect;
        int left, top, w, h; // what of the source must arrive
    } const cases[] = {
        {{2, 1, 7, 5}, 0, 0, 5, 4},
        {{-2, 1, 3, 5}, 2, 0, 3, 4},
        {{2, -3, 7, 1}, 0, 3, 5, 1},
        {{5, 4, 10, 8}, 0, 0, 3, 2},
        {{-4, 5, 1, 9}, 4, 0, 1, 1},
        {{8, 0, 13, 4}, 0, 0, 0, 0},
        {{0, -4, 5, 0}, 0, 0, 0, 0},
        {{1, 1, 1, 3}, 0, 0, 0, 0}, // empty, inverted, huge
        {{3, 3, 1, 1}, 0, 0, 0, 0},
        {{kMax, kMax, kMin, kMin}, 0, 0, 0, 0},
        {{kMin, kMin, kMin + 4, kMin + 4}, 0, 0, 0, 0},
        {{kMax - 4, 0, kMax, 4}, 0, 0, 0, 0},
    };
    TexturePtr const texture = MakeTexture(base);
    for (auto const& [rect, left, top, w, h] : cases) {
        SCOPED_TRACE(std::to_string(rect.left) + ", " + std::to_string(rect.top));
        texture->Replace(base.pixels.data(), 0);
        std::uint64_t const before = RendererFactory::GetStatistics().bytesUploaded;
        texture->Replace(rect, source.pixels.data(), 0);
        EXPECT_EQ(RendererFactory::GetStatistics().bytesUploaded - before, std::uint64_t(4 * w * h));
        Picture const part = source.Crop(left, top, w, h);
        EXPECT_EQ(Read(*texture), w > 0 ? base.With(rect.left + left, rect.top + top, part) : base);
    }
    texture->Replace(nullptr, 0);
    EXPECT_EQ(Read(*texture), base);
}

TEST_F(TextureTransferTest, EveryStrideIsInBytes) {
    Picture const image = MakePattern(7, 5);
    for (int stride : {28, 32, 29, 30, 43, 400}) {
        auto const step = static_cast<std::size_t>(stride);
        std::vector<unsigned char> memory(step * 5, 0xAB);
        for (std::size_t y = 0; y < 5; ++y) std::memcpy(&memory[y * step], &image.pixels[y * 28], 28);
        TexturePtr const texture = MakeTexture(7, 5);
        texture->Replace(memory.data(), stride);
        EXPECT_EQ(Read(*texture), image) << stride;

        // Clipped at the left and at the top, where the source has to be advanced by rows of that stride.
        TexturePtr const clipped = MakeTexture(MakeImage(7, 5, kRed));
        clipped->Replace(Rect(-2, -1, 5, 4), memory.data(), stride);
        EXPECT_EQ(Read(*clipped), MakeImage(7, 5, kRed).With(0, 0, image.Crop(2, 1, 5, 4))) << stride;
    }
}

TEST_F(TextureTransferTest, RowsThatWouldOverlapAreRefusedWithALine) {
    auto const [texture, target] = MakeOffscreen(MakeImage(7, 5, kRed));
    std::vector<Color> const pixels(35, kBlue);
    texture->Replace(pixels.data(), 7);
    EXPECT_EQ(Read(*texture), MakeImage(7, 5, kRed));
    Picture destination = MakeImage(7, 5);
    target->ReadPixels(0, 0, 7, 5, {destination.pixels.data(), 6, 0, 0});
    target->ReadPixels(0, 0, 1, 1, {destination.pixels.data(), 7, -1, 0});
    target->ReadPixels(0, 0, 7, 5, {nullptr, 7, 0, 0}); // quietly
    EXPECT_EQ(destination, MakeImage(7, 5));
    std::vector<std::string> const errors = TakeErrors();
    ASSERT_EQ(errors.size(), 3u);
    EXPECT_NE(errors[0].find("28 bytes lie 7 bytes apart"), std::string::npos) << errors[0];
}

TEST_F(TextureTransferTest, ReadBackTouchesNothingButThePixelsInsideTheTarget) {
    Picture const image = MakePattern(8, 6);
    auto const [texture, target] = MakeOffscreen(image);
    struct {
        int x, y, w, h;               // the block asked for
        int left, top, width, height; // what of it lies inside
    } const cases[] = {
        {0, 0, 8, 6, 0, 0, 8, 6}, {2, 1, 3, 4, 0, 0, 3, 4},    {-2, -1, 5, 3, 2, 1, 3, 2},
        {6, 4, 5, 5, 0, 0, 2, 2}, {-1, -1, 10, 8, 1, 1, 8, 6}, {8, 0, 2, 2, 0, 0, 0, 0},
        {0, 6, 2, 2, 0, 0, 0, 0}, {-5, 0, 5, 5, 0, 0, 0, 0},   {3, 3, 0, 2, 0, 0, 0, 0},
    };
    for (auto const& c : cases) {
        // The block lies two rows down and three pixels in, in rows of fifteen.
        Picture destination = MakeImage(15, 14);
        target->ReadPixels(c.x, c.y, c.w, c.h, {destination.pixels.data(), 15, 2, 3});
        EXPECT_EQ(destination,
                  MakeImage(15, 14).With(3 + c.left, 2 + c.top,
                                         image.Crop(c.x + c.left, c.y + c.top, c.width, c.height)))
            << c.x << ' ' << c.y << ' ' << c.w << ' ' << c.h;
    }
}

TEST_F(TextureTransferTest, PixelStoreAndTextureBindingsLeakNeitherInNorOut) {
    GLuint foreign = 0;
    glGenTextures(1, &foreign);
    glActiveTexture(GL_TEXTURE3);
    glBindTexture(GL_TEXTURE_2D, foreign);
    GLuint buffer = 0;
    glGenBuffers(1, &buffer);
    glBindBuffer(GL_PIXEL_UNPACK_BUFFER, buffer);
    glBufferData(GL_PIXEL_UNPACK_BUFFER, 4096, nullptr, GL_STREAM_DRAW);

    LeavePixelStoreDirty(buffer);
    Picture const image = MakePattern(9, 7);
    TexturePtr const texture = MakeTexture(image);
    LeavePixelStoreDirty(buffer);
    texture->Replace(Rect(1, 1, 4, 3), MakeImage(3, 2, kRed).pixels.data(), 0);
    LeavePixelStoreDirty(buffer);
    Picture const all = Read(*texture);
    EXPECT_EQ(all, image.With(1, 1, MakeImage(3, 2, kRed)));
    EXPECT_EQ(GetInteger(GL_ACTIVE_TEXTURE), GL_TEXTURE3);
    EXPECT_EQ(GetInteger(GL_TEXTURE_BINDING_2D), static_cast<GLint>(foreign));

    // Only the direction that was used is put back.
    texture->Replace(all.pixels.data(), 0);
    ExpectDefaultPixelStore();
    glDeleteBuffers(1, &buffer);
    glDeleteTextures(1, &foreign);
}

} // namespace
} // namespace Moka::Testing
