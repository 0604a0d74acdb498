#include "MwTrimWaveform.h"

#include <Elementary.h>

#include <algorithm>
#include <cairo.h>
#include <cmath>
#include <thread>
#include <utility>

#include <MainLoopMailbox.h>
#include <uxt_theme.h>

#include "MwLog.h"

using panekit::WTimer;

using Samples = std::shared_ptr<volume_samples_s>;

// Of the panel and of the thread that reads the samples; closed when nobody waits any more.
struct MwTrimWaveform::Reading {
    platform::MainLoopMailbox mailbox;
    std::atomic<bool> cancelled = false;
};

namespace {

constexpr double HEIGHT = 0.9; // of the loudest bar
constexpr int MOST_STROKES = 7;
constexpr int GROWTH_STEPS = 8;
constexpr double GROWTH_INTERVAL = 0.03; // seconds

struct Stroke {
    double factor;
    const char* color;
};
constexpr std::array<Stroke, MOST_STROKES> STROKES = {{
    {.factor = 0.0, .color = ""},
    {.factor = 0.7, .color = "AO007"},
    {.factor = 0.8, .color = "AO006"},
    {.factor = 1.0, .color = "AO005"},
    {.factor = 1.0, .color = "AO005"},
    {.factor = 0.8, .color = "AO006"},
    {.factor = 0.7, .color = "AO007"},
}};

Samples readSamples(const std::string& path, volume_samples_quality_e quality, const std::atomic<bool>& cancelled)
{
    volume_samples_s* samples = nullptr;
    const int result = mw_get_volume_samples_until(path.c_str(), quality, &cancelled, &samples);
    if (result != 0 && quality == VOLUME_SAMPLES_EXACT && !cancelled)
        MW_LOGE("mw_get_volume_samples failed!!!");
    return {samples, mw_free_volume_samples};
}

// A little unevenness that looks alive, the same each time: 0.91 to 1.
double jitter(size_t bar, int stroke, int side)
{
    const auto seed = static_cast<uint32_t>(bar * 31 + static_cast<size_t>(stroke) * 7 + static_cast<size_t>(side));
    return (100 - (seed * 2654435761u >> 16) % 10) / 100.0;
}

}

MwTrimWaveform::MwTrimWaveform(Evas_Object* layout, const char* part, const std::string& path)
{
    _createWaveform(layout, part);
    _getVoiceSampleData(path);
}

MwTrimWaveform::~MwTrimWaveform()
{
    if (_reading) {
        _reading->cancelled = true;
        _reading->mailbox.close();
    }
    WTimer::destroy(_growing);
    if (_image) {
        evas_object_event_callback_del_full(_image, EVAS_CALLBACK_RESIZE, _resizedCb, this);
        evas_object_event_callback_del_full(_image, EVAS_CALLBACK_DEL, _deletedCb, this);
        _deletedCb(this, nullptr, _image, nullptr);
    }
    if (_cairo)
        cairo_destroy(_cairo);
    if (_surface)
        cairo_surface_destroy(_surface);
}

void MwTrimWaveform::_createWaveform(Evas_Object* layout, const char* part)
{
    _image = evas_object_image_filled_add(evas_object_evas_get(layout));
    evas_object_image_colorspace_set(_image, EVAS_COLORSPACE_ARGB8888);
    evas_object_image_alpha_set(_image, EINA_TRUE);
    evas_object_pass_events_set(_image, EINA_TRUE);
    evas_object_image_pixels_get_callback_set(_image, _pixelsCb, this);
    evas_object_event_callback_add(_image, EVAS_CALLBACK_RESIZE, _resizedCb, this);
    evas_object_event_callback_add(_image, EVAS_CALLBACK_DEL, _deletedCb, this);
    elm_object_part_content_set(layout, part, _image);
    evas_object_show(_image);
    _resize();
}

// The pixels are about to go; the image may live on until the next frame.
void MwTrimWaveform::_deletedCb(void* data, Evas*, Evas_Object* image, void*)
{
    evas_object_image_pixels_get_callback_set(image, nullptr, nullptr);
    evas_object_image_data_set(image, nullptr);
    static_cast<MwTrimWaveform*>(data)->_image = nullptr;
}

void MwTrimWaveform::_resizedCb(void* data, Evas*, Evas_Object*, void*)
{
    static_cast<MwTrimWaveform*>(data)->_resize();
}

// As many pixels as the screen has.
void MwTrimWaveform::_resize()
{
    int width = 0;
    int height = 0;
    evas_object_geometry_get(_image, nullptr, nullptr, &width, &height);
    if (width <= 0 || height <= 0
        || (_surface && cairo_image_surface_get_width(_surface) == width
            && cairo_image_surface_get_height(_surface) == height))
        return;
    cairo_surface_t* former = std::exchange(_surface, cairo_image_surface_create(CAIRO_FORMAT_ARGB32, width, height));
    cairo_t* formerContext = std::exchange(_cairo, cairo_create(_surface));
    evas_object_image_size_set(_image, width, height);
    evas_object_image_data_set(_image, cairo_image_surface_get_data(_surface));
    if (formerContext)
        cairo_destroy(formerContext);
    if (former)
        cairo_surface_destroy(former);
    _updateWaveform();
}

void MwTrimWaveform::_getVoiceSampleData(const std::string& path)
{
    if (_reading) {
        MW_LOGE("Already running thread!!!");
        return;
    }
    _reading = std::make_shared<Reading>();
    std::thread([this, reading = _reading, path] {
        MW_LOGI("BEGIN - sample thread");
        for (const auto quality : {VOLUME_SAMPLES_COARSE, VOLUME_SAMPLES_EXACT}) {
            const bool isLast = quality == VOLUME_SAMPLES_EXACT;
            const Samples samples = readSamples(path, quality, reading->cancelled);
            // A coarse look that was not to be had is nothing to tell.
            if (samples || isLast)
                reading->mailbox.post([this, samples, isLast] { _deliver(samples.get(), isLast); });
        }
    }).detach();
}

void MwTrimWaveform::_deliver(const volume_samples_s* samples, bool isLast)
{
    if (samples)
        _take(barsOf(samples->amplitude_samples, static_cast<size_t>(samples->sample_size) / sizeof(uint32_t)));
    if (isLast)
        _reading = nullptr;
}

MwTrimWaveform::Bars MwTrimWaveform::barsOf(const uint32_t* samples, size_t count)
{
    Bars bars{};
    if (!samples || count == 0) {
        MW_LOGE("no samples");
        return bars;
    }
    if (count <= BARS) {
        const float share = static_cast<float>(BARS) / static_cast<float>(count);
        const auto width = static_cast<size_t>(share);
        for (size_t i = 0; i < count; ++i) {
            const auto first = static_cast<size_t>(share * static_cast<float>(i));
            for (size_t bar = first; bar < std::min(first + width, BARS); ++bar)
                bars[bar] = samples[i];
        }
    } else {
        const size_t group = count / BARS;
        for (size_t bar = 0; bar < BARS; ++bar) {
            uint64_t sum = 0;
            for (size_t i = group * bar; i < group * (bar + 1); ++i)
                sum += samples[i];
            const uint64_t mean = sum / group;
            bars[bar] = static_cast<double>(mean);
        }
    }
    const double largest = *std::max_element(bars.begin(), bars.end());
    for (double& bar : bars)
        bar = largest > 0 ? bar / largest : 0;
    return bars;
}

void MwTrimWaveform::_take(const Bars& bars)
{
    _target = bars;
    if (!std::exchange(_hasBars, true)) {
        _bars = _target;
        return _updateWaveform();
    }
    _former = _bars;
    _growth = 0;
    WTimer::destroy(_growing);
    _growing = WTimer::addTimer(GROWTH_INTERVAL, [this](void*) { return _grow(); });
}

bool MwTrimWaveform::_grow()
{
    const double share = ++_growth / static_cast<double>(GROWTH_STEPS);
    for (size_t i = 0; i < BARS; ++i)
        _bars[i] = _former[i] + (_target[i] - _former[i]) * share;
    _updateWaveform();
    return _growth < GROWTH_STEPS;
}

void MwTrimWaveform::_updateWaveform()
{
    if (_image)
        evas_object_image_pixels_dirty_set(_image, EINA_TRUE);
}

void MwTrimWaveform::_pixelsCb(void* data, Evas_Object* image)
{
    auto* self = static_cast<MwTrimWaveform*>(data);
    if (!self->_surface)
        return;
    self->_drawWaveform();
    evas_object_image_data_set(image, cairo_image_surface_get_data(self->_surface));
    evas_object_image_data_update_add(
        image, 0, 0, cairo_image_surface_get_width(self->_surface), cairo_image_surface_get_height(self->_surface));
}

void MwTrimWaveform::_drawWaveform()
{
    cairo_save(_cairo);
    cairo_set_operator(_cairo, CAIRO_OPERATOR_CLEAR);
    cairo_paint(_cairo);
    cairo_restore(_cairo);
    const bool isSilent = std::all_of(_bars.begin(), _bars.end(), [](double bar) { return bar <= 0; });
    if (!_hasBars || isSilent) {
        cairo_surface_flush(_surface);
        return;
    }
    const double pitch = cairo_image_surface_get_width(_surface) / static_cast<double>(BARS);
    const double middle = cairo_image_surface_get_height(_surface) / 2.0;
    // Seven strokes of a pixel, or of several where the screen has more of them.
    const double stroke = std::max(1.0, std::floor(pitch / MOST_STROKES));
    const int count = std::min(static_cast<int>(pitch / stroke), MOST_STROKES);
    for (int k = 0; k < count; ++k) {
        int red = 0;
        int green = 0;
        int blue = 0;
        int alpha = 0;
        // Where there is room for a few strokes only, it is the strong ones.
        const int shown = count >= MOST_STROKES ? k : std::min(k == 0 ? 0 : k + 1, MOST_STROKES - 1);
        const Stroke& look = STROKES[static_cast<size_t>(count > 1 ? shown : 3)];
        if (look.factor <= 0)
            continue;
        uxt_theme_get_color(look.color, &red, &green, &blue, &alpha);
        cairo_set_source_rgba(_cairo, red / 255.0, green / 255.0, blue / 255.0, alpha / 255.0);
        for (size_t bar = 0; bar < BARS; ++bar) {
            const double height = std::max(_bars[bar] * HEIGHT, 1 / middle) * look.factor;
            const double top = middle * (1 - height * jitter(bar, k, 0));
            const double bottom = middle * (1 + height * jitter(bar, k, 1));
            cairo_rectangle(
                _cairo, std::floor(static_cast<double>(bar) * pitch) + k * stroke, top, stroke, bottom - top);
        }
        cairo_fill(_cairo);
    }
    cairo_surface_flush(_surface);
}
