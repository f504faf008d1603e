#include "tests/unit/codec/CodecTestSupport.h"

#include <sys/stat.h>
#include <unistd.h>

namespace Moka::Testing {
namespace {

TEST(Save, TargetsThatAreNoImageFilesAreRefusedWithTheReason) {
    ErrorLines errors;
    TempFolder const folder;
    ASSERT_EQ(mkdir(folder.Path("folder.png").c_str(), 0700), 0);
    ASSERT_EQ(mkfifo(folder.Path("pipe.png").c_str(), 0600), 0);
    ASSERT_EQ(symlink("/dev/null", folder.Path("null.png").c_str()), 0);
    ASSERT_EQ(symlink("loop.png", folder.Path("loop.png").c_str()), 0);
    std::vector<std::string> const before = folder.List();
    struct {
        std::string path;
        char const* reason;
    } const cases[] = {
        {folder.Path("folder.png"), "it is a folder"},
        {folder.Path("pipe.png"), "not a regular file"},
        {folder.Path("null.png"), "not a regular file"},
        {folder.Path("loop.png"), "symbolic links"},
        {folder.Path("page.gif"), "unknown extension 'gif'; use png"},
        {folder.Path("page"), "unknown extension ''"},
    };
    for (auto const& one : cases) {
        EXPECT_FALSE(SaveImage(MakeGradient(3, 3), one.path)) << one.path;
        EXPECT_THAT(errors.Take(), ElementsAre(HasSubstr(one.reason)));
    }
    EXPECT_EQ(folder.List(), before);
}

TEST(Save, ImagesThatAFormatCannotHoldAreRefused) {
    ErrorLines errors;
    TempFolder const folder;
    Picture const wide = Fill(65535, 1, {255, 255, 255, 255});
    EXPECT_FALSE(SaveImage(wide, folder.Path("wide.webp")));
    EXPECT_THAT(errors.Take(), ElementsAre(AllOf(HasSubstr("16383"), HasSubstr("use png"))));
    EXPECT_FALSE(SaveImage(wide, folder.Path("wide.jpg")));
    EXPECT_THAT(errors.Take(), ElementsAre(HasSubstr("65500")));
    String const path(folder.Path("nothing.png"));
    Bitmap const empty;
    std::string reason;
    EXPECT_FALSE(BitmapFactory::SaveBitmap(&empty, &path, 100, &reason));
    EXPECT_EQ(reason, "there are no pixels to save");
    EXPECT_FALSE(BitmapFactory::SaveBitmap(nullptr, &path, 100));
    EXPECT_EQ(errors.Take().size(), 2u);
    EXPECT_THAT(folder.List(), ElementsAre());
}

TEST(Save, ANewFileObeysTheMaskAndAReplacedOneKeepsItsMode) {
    TempFolder const folder;
    Picture const image = MakeGradient(5, 5);
    mode_t const mask = umask(027);
    EXPECT_TRUE(SaveImage(image, folder.Path("new.png")));
    umask(mask);
    EXPECT_EQ(std::filesystem::status(folder.Path("new.png")).permissions(), std::filesystem::perms(0640));
    WriteFile(folder.Path("old.png"), "old");
    ASSERT_EQ(chmod(folder.Path("old.png").c_str(), 0604), 0);
    EXPECT_TRUE(SaveImage(image, folder.Path("old.png")));
    EXPECT_EQ(std::filesystem::status(folder.Path("old.png")).permissions(), std::filesystem::perms(0604));
    EXPECT_EQ(LoadImage(folder.Path("old.png")), image);
}

} // namespace
} // namespace Moka::Testing
