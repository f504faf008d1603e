// RecordedBitmaps: the bitmaps of a recording. Each is read back when it is drawn, and written to a folder
// unless one with the same contents and filter is there. So a bitmap that changes between two draws becomes
// two files, and two equal bitmaps become one.
// Thread: a thread that may read the bitmaps back.
// Cost:   a read-back for each draw.
#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <vector>

namespace Moka {

class IMKBitmap;

} // namespace Moka

namespace Moka::Scenes {

class RecordedBitmaps {
public:
    // parent is the folder of the scene's file. `folder` in it is created when the first bitmap is written.
    RecordedBitmaps(std::string const& parent, std::string const& folder);

    struct Result {
        std::string name;   // the bitmap's name in the scene
        std::string reason; // why it could not be recorded
    };
    // If the bitmap cannot be sampled, so that a canvas would not draw it, name and reason are empty.
    Result Record(IMKBitmap* bitmap);

    // {"b1": {"file": "scene.bitmaps/b1.mki"}, ...}
    std::string GetText() const { return '{' + mText + '}'; }

private:
    struct Key {
        std::uint64_t hash;
        int width;
        int height;
        int filter;

        bool operator<(Key const& other) const;
    };

    Result Write(std::vector<unsigned char>& pixels, Key const& key);

    std::string const mPath;
    std::string const mFolder; // relative to the scene's file
    std::map<Key, std::string> mNames;
    std::int64_t mPixels = 0;
    std::string mText;
};

} // namespace Moka::Scenes
