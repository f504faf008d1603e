// RecordedBitmaps: the bitmaps that a recording draws: each is read when it is drawn and written into a folder if
// none of the same contents and filter is there yet. So a bitmap that changes between two draws is two files, and
// two bitmaps that look alike are one.
// Thread: where the bitmaps may be read.
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
    // parent is the folder of the scene's file. The folder in it is made when the first bitmap is written.
    RecordedBitmaps(std::string const& parent, std::string const& folder);

    struct Result {
        std::string name;   // in the scene
        std::string reason; // why it is not there
    };
    // Neither name nor reason: it cannot be sampled, and a canvas draws nothing.
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
    std::string const mFolder; // as the scene names it
    std::map<Key, std::string> mNames;
    std::int64_t mPixels = 0;
    std::string mText;
};

} // namespace Moka::Scenes
