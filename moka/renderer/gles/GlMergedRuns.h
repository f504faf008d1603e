// GlMergedRuns: draws runs whose uniform values differ between records, with one draw call for each uniform
// block of records.
// Thread: render thread.
// Cost:   each submission uploads one buffer of records and one buffer with the record number of each vertex.
//         Their memory is reused.
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

    // Call this once for each submission, before the first draw. Chooses the runs to merge and uploads their
    // records and record numbers.
    void Prepare(DrawList const& list);
    // Call this for each run of the list, in order. Returns false if the caller must draw the records one by
    // one.
    bool Draw(DrawList const& list, Run const& run);
    void Clear();

private:
    // At most this many variants are linked in one submission, because each takes milliseconds.
    static constexpr int kMostLinks = 4;

    struct Merged {
        Run const* run;
        GlVariants* variants;
        std::size_t variant; // index
        std::size_t records; // offset of the first block in mRecords, in bytes
        std::size_t numbers; // index of the first number in mNumbers
    };

    void Place(DrawList const& list, Run const& run, int* budget);
    void PlaceRecords(DrawList const& list, Run const& run, ProgramLayout const& layout);
    std::size_t GetBlockStep(std::size_t bytes) const;
    void Upload();

    GlDevice& mDevice;
    std::vector<Merged> mMerged;
    std::size_t mNext = 0; // index of the next run in mMerged
    std::vector<unsigned char> mRecords;
    std::vector<GLushort> mNumbers; // for each vertex, the index of its record in the block
    GLuint mRecordBuffer = 0;
    GLuint mNumberBuffer = 0;
    std::size_t mAlignment = 0; // of a block in its buffer, in bytes; 0 until it is queried
};

} // namespace Moka::detail
