// GlMergedRuns: draws runs whose uniform values differ from record to record, with one call for each full block
// of records.
// Thread: render thread.
// Cost:   each submission uploads the records and a number for each vertex, one buffer each; the memory for
//         both is kept.
#pragma once

#include "moka/renderer/device/DrawList.h"
#include "moka/renderer/device/ProgramLayout.h"
#include "moka/renderer/gles/GlFunctions.h"

#include <vector>

namespace Moka::detail {

class GlDevice;
class GlVariants;

class GlMergedRuns {
public:
    explicit GlMergedRuns(GlDevice& device) : mDevice(device) {}

    // Once for each submission, before its first draw: chooses the runs that are merged and uploads what they
    // need.
    void Prepare(DrawList const& list);
    // The list's runs in order. False: this one's records are to be drawn one by one.
    bool Draw(DrawList const& list, Run const& run);
    void Clear();

private:
    // Variants that are linked during one submission at most: linking one takes milliseconds.
    static constexpr int kMostLinks = 4;

    struct Merged {
        Run const* run;
        GlVariants* variants;
        std::size_t variant; // index
        std::size_t records; // offset of the first block, bytes
        std::size_t numbers; // offset, numbers
    };

    void Place(DrawList const& list, Run const& run, int* budget);
    void PlaceRecords(DrawList const& list, Run const& run, ProgramLayout const& layout);
    std::size_t GetBlockStep(std::size_t bytes) const;
    void Upload();

    GlDevice& mDevice;
    std::vector<Merged> mMerged;
    std::size_t mNext = 0; // of mMerged
    std::vector<unsigned char> mRecords;
    std::vector<GLushort> mNumbers; // of each vertex: its record's place in the block
    GLuint mRecordBuffer = 0;
    GLuint mNumberBuffer = 0;
    std::size_t mAlignment = 0; // of a block in its buffer, bytes; 0 before it was queried
};

} // namespace Moka::detail
