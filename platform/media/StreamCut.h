#pragma once

#include "media/AvFile.h"
#include "media/SoundCut.h"

namespace media {

// Cuts what other programs have recorded by copying its packets into a container of the same kind. FLAC, whose frames
// are too coarse for that and are numbered, is written anew, which loses nothing either.
class StreamCut : public SoundCut {
public:
    static std::unique_ptr<SoundCut> open(FileDescriptor source, int& error);

private:
    struct Output;

    StreamCut(FileDescriptor source, const char* container, AVCodecID codec);

    int _write(const Range& range, int target, ExportWatch& watch) override;
    [[nodiscard]] int _lengthOf(int target) const override;
    [[nodiscard]] int _tolerance() const override { return _frameMs * FRAMES_OF_TOLERANCE; }

    int _begin(Output& output, const Range& range, int target);
    int _copy(Output& output, ExportWatch& watch);
    int _put(Output& output, AVPacket* packet);
    int _encode(Output& output, ExportWatch& watch);

    static constexpr int FRAMES_OF_TOLERANCE = 3; // what some containers count of the codec's own delay

    const char* _container;
    AVCodecID _codec;
    int _frameMs = 30;
};

}
