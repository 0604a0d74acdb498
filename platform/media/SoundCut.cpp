#include "media/SoundCut.h"

#include "media/AmrIndex.h"
#include "media/Mp4Boxes.h"
#include "media/Mp4Movie.h"
#include "media/StreamCut.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>

namespace media {

namespace {

    constexpr int AAC_FRAME_MS = 24; // of the usual rates, rounded up

    // Copies whole frames; the index says which samples of the first and last one count.
    class Mp4Cut : public SoundCut {
    public:
        Mp4Cut(FileDescriptor source, Mp4Movie movie)
            : SoundCut(std::move(source))
            , _movie(std::move(movie))
        {
        }

    private:
        [[nodiscard]] uint64_t _units(int milliseconds) const
        {
            return (static_cast<uint64_t>(milliseconds) * _movie.scale() + 500) / 1000;
        }

        int _write(const Range& range, int target, ExportWatch& watch) override
        {
            const auto part = _movie.part(_units(range.begin), std::min(_units(range.end), _movie.length()));
            if (!part)
                return ENOTSUP;
            const auto ranges = _movie.bytesOf(part->first, part->end);
            uint64_t bytes = 0;
            for (const ByteRange& each : ranges)
                bytes += each.size;
            const bool isLong = bytes + 8 > 0xFFFFFFFFu;
            std::string dataHead = isLong ? std::string("\0\0\0\1mdat", 8) : std::string();
            putBigEndian(dataHead, isLong ? bytes + 16 : bytes + 8, isLong ? 8 : 4);
            if (!isLong)
                dataHead += "mdat";
            FrameCopy copy(source(), target, bytes, watch);
            int error = copy.write(_movie.fileType() + dataHead);
            const uint64_t dataOffset = copy.position();
            for (size_t i = 0; error == 0 && i < ranges.size(); ++i)
                error = copy.copy(ranges[i]);
            return error != 0 ? error : copy.write(_movie.indexOf(*part, dataOffset));
        }

        [[nodiscard]] int _lengthOf(int target) const override
        {
            const auto written = Mp4Movie::read(target);
            return written ? static_cast<int>(written->length() * 1000 / written->scale()) : -1;
        }

        [[nodiscard]] int _tolerance() const override { return AAC_FRAME_MS; }

        Mp4Movie _movie;
    };

    class AmrCut : public SoundCut {
    public:
        AmrCut(FileDescriptor source, AmrIndex index)
            : SoundCut(std::move(source))
            , _index(std::move(index))
        {
        }

    private:
        int _write(const Range& range, int target, ExportWatch& watch) override
        {
            constexpr unsigned int HALF = AmrIndex::FRAME_MS / 2;
            const uint64_t first = (static_cast<unsigned int>(range.begin) + HALF) / AmrIndex::FRAME_MS;
            const uint64_t end
                = std::max<uint64_t>(first + 1, (static_cast<unsigned int>(range.end) + HALF) / AmrIndex::FRAME_MS);
            const uint64_t from = _index.offsetOf(source(), first);
            const uint64_t to = _index.offsetOf(source(), end);
            if (from >= to)
                return ENOTSUP;
            FrameCopy copy(source(), target, to - from, watch);
            const int error = copy.write(_index.head());
            return error != 0 ? error : copy.copy({from, to - from});
        }

        [[nodiscard]] int _lengthOf(int target) const override
        {
            const auto written = AmrIndex::read(target);
            return written ? static_cast<int>(written->frames() * AmrIndex::FRAME_MS) : -1;
        }

        [[nodiscard]] int _tolerance() const override { return AmrIndex::FRAME_MS; }

        AmrIndex _index;
    };

}

std::unique_ptr<SoundCut> SoundCut::open(const std::string& path, int& error)
{
    FileDescriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
    struct stat status { };
    if (!file || fstat(file.get(), &status) != 0) {
        error = errno;
        return nullptr;
    }
    error = 0;
    if (auto movie = Mp4Movie::read(file.get()))
        return std::make_unique<Mp4Cut>(std::move(file), std::move(*movie));
    if (auto index = AmrIndex::read(file.get()))
        return std::make_unique<AmrCut>(std::move(file), std::move(*index));
    return StreamCut::open(std::move(file), error);
}

int SoundCut::write(const Range& range, int target, ExportWatch& watch)
{
    if (range.begin < 0 || range.end <= range.begin)
        return EINVAL;
    if (const int error = _write(range, target, watch); error != 0)
        return error;
    if (fsync(target) != 0)
        return errno;
    if (watch.cancelled)
        return ECANCELED;
    // What cannot be read back as asked for is not a recording.
    const int length = _lengthOf(target);
    watch.percent = 100;
    return length >= 0 && std::abs(length - (range.end - range.begin)) <= _tolerance() ? 0 : EBADMSG;
}

}
