#pragma once

#include <array>
#include <atomic>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>

#include <Evas.h>

#include <panekit/WTimer.h>
#include <volume_samples.h>

typedef struct _cairo cairo_t;
typedef struct _cairo_surface cairo_surface_t;

// The picture of how loud a recording is: 90 bars, drawn anew for each size of its image and each theme. The samples
// are read on a thread of their own, a coarse look first, then the exact one; the bars grow from the one to the other.
// Belongs to the panel, its image to the panel's layout. Main loop only.
class MwTrimWaveform {
public:
    static constexpr size_t BARS = 90;
    using Bars = std::array<double, BARS>; // 0 to 1

    // Shows the recording at the path in a part of the layout.
    MwTrimWaveform(Evas_Object* layout, const char* part, const std::string& path);
    // Cancels the reading; does not wait for its end.
    ~MwTrimWaveform();
    MwTrimWaveform(const MwTrimWaveform&) = delete;
    MwTrimWaveform& operator=(const MwTrimWaveform&) = delete;

    // The colours or the place have changed.
    void _updateWaveform();
    [[nodiscard]] const Bars& getBars() const { return _bars; }
    // Whether the exact look has come, or none ever will.
    [[nodiscard]] bool isComplete() const { return _reading == nullptr; }

    // The bars of some samples, all 0 without sound.
    static Bars barsOf(const uint32_t* samples, size_t count);

private:
    struct Reading;

    void _createWaveform(Evas_Object* layout, const char* part);
    void _getVoiceSampleData(const std::string& path);
    void _take(const Bars& bars);
    bool _grow();
    void _resize();
    void _drawWaveform();
    void _deliver(const volume_samples_s* samples, bool isLast);
    static void _pixelsCb(void* data, Evas_Object* image);
    static void _resizedCb(void* data, Evas* canvas, Evas_Object* image, void* info);
    static void _deletedCb(void* data, Evas* canvas, Evas_Object* image, void* info);

    Evas_Object* _image = nullptr;
    cairo_surface_t* _surface = nullptr;
    cairo_t* _cairo = nullptr;
    Bars _bars{}; // as drawn
    Bars _former{};
    Bars _target{};
    int _growth = 0; // steps done
    bool _hasBars = false;
    panekit::WTimer::Weak _growing;
    std::shared_ptr<Reading> _reading; // until it has delivered all
};
