#pragma once

#include "media/FileDescriptor.h"
#include "media/FrameCopy.h"

#include <memory>
#include <string>

namespace media {

// Cuts a time range out of a sound file without decoding it. Chosen by what the file is, not by its name. Any one
// thread.
class SoundCut {
public:
    struct Range {
        int begin = 0; // milliseconds
        int end = 0;
    };

    // Reads the source. Null with the reason: ENOTSUP for what cannot be cut, EBADMSG for damage, else the system's.
    static std::unique_ptr<SoundCut> open(const std::string& path, int& error);
    virtual ~SoundCut() = default;
    SoundCut(const SoundCut&) = delete;
    SoundCut& operator=(const SoundCut&) = delete;

    // Fills the empty file. Answers 0, ECANCELED, ENOTSUP, EBADMSG or the system's error
    // number; the file is then complete and on the storage, or of no use.
    int write(const Range& range, int target, ExportWatch& watch);

    [[nodiscard]] int source() const { return _source.get(); }

protected:
    explicit SoundCut(FileDescriptor source)
        : _source(std::move(source))
    {
    }

private:
    virtual int _write(const Range& range, int target, ExportWatch& watch) = 0;
    // Milliseconds of the file that was written; negative when it does not open.
    [[nodiscard]] virtual int _lengthOf(int target) const = 0;
    [[nodiscard]] virtual int _tolerance() const = 0; // milliseconds

    FileDescriptor _source;
};

}
