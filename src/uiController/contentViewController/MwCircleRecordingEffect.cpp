#include "MwCircleRecordingEffect.h"

#include <cmath>
#include <cstdlib>
#include <utility>

#include <Elementary.h>
#include <cairo.h>

#include <uxt_theme.h>

#include "MwLog.h"
#include "MwModel.h"

using panekit::WTimer;

struct MwCircleRecordingEffect::Layer {
    int startAngle; // degrees
    double idleAlpha; // before the first level
    double alpha;
    int width; // design units
};

namespace {

constexpr auto EFFECT_PART = "recording_effect";
constexpr auto EFFECT_KEY = "rec_effect_data";
constexpr auto RING_COLOR = "mewlo/ring";

constexpr double LEVEL_INTERVAL = 0.2;
constexpr double ANIMATION_INTERVAL = 0.025;
constexpr double SILENCE = -45.0; // decibels
constexpr double LARGEST_TARGET = 1.8;
constexpr int DRAWS = 12;

constexpr int SURFACE_SIZE = 670;
constexpr int CENTRE = 335;
constexpr int BASE_RADIUS = 285;
constexpr int AMPLITUDE = 64; // of both sides
constexpr int DEGREES_BETWEEN_POINTS = 45;
constexpr float RADIANS_PER_DEGREE = 0.017453292F;

int scaled(int units)
{
    // Both scales count as they are; only the product is cut to whole pixels.
    return static_cast<int>(units * elm_config_scale_get() / elm_app_base_scale_get());
}

}

MwCircleRecordingEffect::MwCircleRecordingEffect(MwModel* model)
    : _model(model)
{
}

MwCircleRecordingEffect::~MwCircleRecordingEffect() = default;

MwCircleRecordingEffect* MwCircleRecordingEffect::fromCanvas(Evas_Object* canvas)
{
    return canvas ? static_cast<MwCircleRecordingEffect*>(evas_object_data_get(canvas, EFFECT_KEY)) : nullptr;
}

Evas_Object* MwCircleRecordingEffect::onCreateView(Evas_Object* parent, void*)
{
    _parent = parent;
    if (!_createCairo())
        return nullptr;
    evas_object_data_set(_canvas, EFFECT_KEY, this);
    elm_object_part_content_set(_parent, EFFECT_PART, _canvas);
    return _canvas;
}

bool MwCircleRecordingEffect::_createCairo()
{
    if (!_parent) {
        MW_LOGE("_parent nullptr");
        return false;
    }
    Evas* canvas = evas_object_evas_get(_parent);
    if (!canvas) {
        MW_LOGE("pEvas nullptr");
        return false;
    }
    _canvas = evas_object_image_filled_add(canvas);
    const int size = scaled(SURFACE_SIZE);
    _surface = cairo_image_surface_create(CAIRO_FORMAT_ARGB32, size, size);
    _cairo = cairo_create(_surface);
    _animating = false;

    evas_object_image_colorspace_set(_canvas, EVAS_COLORSPACE_ARGB8888);
    evas_object_image_alpha_set(_canvas, EINA_TRUE);
    evas_object_image_size_set(_canvas, size, size);
    evas_object_image_data_set(_canvas, cairo_image_surface_get_data(_surface));
    evas_object_size_hint_weight_set(_canvas, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    evas_object_size_hint_align_set(_canvas, EVAS_HINT_FILL, EVAS_HINT_FILL);
    // The strokes are white; the theme gives them a colour that shows on its background.
    uxt_theme_object_set_color(_canvas, RING_COLOR);
    evas_object_show(_canvas);
    evas_object_image_pixels_get_callback_set(_canvas, _getImageFixelsCb, this);
    evas_object_image_pixels_dirty_set(_canvas, EINA_TRUE);
    evas_object_pass_events_set(_canvas, EINA_TRUE);
    return true;
}

void MwCircleRecordingEffect::onCreated()
{
    _levelTimer = WTimer::addTimer(LEVEL_INTERVAL, [this](void*) { return _sampleLevel(); });
}

void MwCircleRecordingEffect::onDestroy()
{
    WTimer::destroy(_levelTimer);
    WTimer::destroy(_animationTimer);
    if (_canvas) {
        // The pixels are about to go; the image may live on until the next frame.
        evas_object_image_pixels_get_callback_set(_canvas, nullptr, nullptr);
        evas_object_image_data_set(_canvas, nullptr);
        evas_object_data_del(_canvas, EFFECT_KEY);
    }
    if (_cairo)
        cairo_destroy(std::exchange(_cairo, nullptr));
    if (_surface)
        cairo_surface_destroy(std::exchange(_surface, nullptr));
    if (elm_object_part_content_get(_parent, EFFECT_PART) == std::exchange(_canvas, nullptr))
        evas_object_del(elm_object_part_content_unset(_parent, EFFECT_PART));
}

int MwCircleRecordingEffect::stepOf(double level)
{
    if (level <= SILENCE)
        return 0;
    const double value = std::pow(10.0, (level + 10.0) / 50.0);
    int step = 0;
    while (step < STEPS && value >= (step + 1) / static_cast<double>(STEPS))
        ++step;
    return step;
}

double MwCircleRecordingEffect::targetOf(int step, int draw)
{
    const double d = (step + 1) * 0.04;
    return std::min(draw * (d + 0.1) - (d * 0.5 + 0.1) * 3.0, LARGEST_TARGET);
}

float MwCircleRecordingEffect::speedOf(int step) { return static_cast<float>(((step + 1) * 0.04 * 10.0 + 1.0) * 0.05); }

bool MwCircleRecordingEffect::_sampleLevel()
{
    if (!_canvas) {
        MW_LOGE("_canvas == nullptr");
        return false;
    }
    _updateAudioLevel(stepOf(_model->getLevel()));
    return true;
}

void MwCircleRecordingEffect::_updateAudioLevel(int step)
{
    WTimer::destroy(_animationTimer);
    const int draw = static_cast<int>(::random() % DRAWS);
    _animating = true;
    _speed = speedOf(step);
    for (size_t i = _targets.size() - 1; i > 0; --i)
        _targets[i] = _targets[i - 1];
    _targets[0] = targetOf(step, draw);
    _animationTimer = WTimer::addTimer(ANIMATION_INTERVAL, [this](void*) { return _animate(); });
}

bool MwCircleRecordingEffect::_animate()
{
    if (!_canvas) {
        MW_LOGE("_canvas == nullptr");
        return false;
    }
    for (size_t i = 0; i < _currents.size(); ++i)
        _currents[i] += (_targets[i] - _currents[i]) * _speed;
    evas_object_image_pixels_dirty_set(_canvas, EINA_TRUE);
    return true;
}

void MwCircleRecordingEffect::_getImageFixelsCb(void* data, Evas_Object* image)
{
    auto* self = static_cast<MwCircleRecordingEffect*>(data);
    if (!self) {
        MW_LOGE("data nullptr");
        return;
    }
    if (!image) {
        MW_LOGE("canvas nullptr");
        return;
    }
    self->_draw();
}

void MwCircleRecordingEffect::_draw()
{
    static constexpr std::array<Layer, 5> LAYERS = {{
        {.startAngle = 198, .idleAlpha = 0.6, .alpha = 1.0, .width = 2},
        {.startAngle = 234, .idleAlpha = 1.0, .alpha = 1.0, .width = 3},
        {.startAngle = 306, .idleAlpha = 0.15, .alpha = 0.15, .width = 5},
        {.startAngle = 342, .idleAlpha = 0.15, .alpha = 0.15, .width = 1},
        {.startAngle = 270, .idleAlpha = 0.9, .alpha = 0.5, .width = 2},
    }};
    cairo_set_source_rgba(_cairo, 0, 0, 0, 0);
    cairo_set_operator(_cairo, CAIRO_OPERATOR_SOURCE);
    cairo_paint(_cairo);
    cairo_set_operator(_cairo, CAIRO_OPERATOR_OVER);
    cairo_save(_cairo);
    cairo_translate(_cairo, scaled(CENTRE), scaled(CENTRE));
    for (const Layer& layer : LAYERS)
        _strokeLayer(layer);
    cairo_restore(_cairo);
    cairo_surface_flush(_surface);
}

void MwCircleRecordingEffect::_strokeLayer(const Layer& layer)
{
    const auto radius = static_cast<float>(scaled(BASE_RADIUS));
    const auto amplitude = static_cast<float>(scaled(AMPLITUDE)) / 2;
    std::array<double, POINTS> x{};
    std::array<double, POINTS> y{};
    for (size_t i = 0; i < x.size(); ++i) {
        const float angle
            = static_cast<float>(layer.startAngle - DEGREES_BETWEEN_POINTS * static_cast<int>(i)) * RADIANS_PER_DEGREE;
        const double r = radius + _currents[i] * amplitude;
        x[i] = r * std::cos(static_cast<double>(angle));
        y[i] = r * std::sin(static_cast<double>(angle));
    }
    // From the middle between the last and the first point through all the middles and back.
    const size_t last = x.size() - 1;
    _lastPoint = {(x[last] + x[0]) / 2, (y[last] + y[0]) / 2};
    cairo_move_to(_cairo, _lastPoint[0], _lastPoint[1]);
    for (size_t i = 1; i <= last; ++i)
        _quad(_cairo, x[i - 1], y[i - 1], (x[i - 1] + x[i]) / 2, (y[i - 1] + y[i]) / 2);
    _quad(_cairo, x[last], y[last], (x[last] + x[0]) / 2, (y[last] + y[0]) / 2);
    cairo_set_source_rgba(_cairo, 1.0, 1.0, 1.0, _animating ? layer.alpha : layer.idleAlpha);
    cairo_set_line_width(_cairo, scaled(layer.width));
    cairo_stroke(_cairo);
}

// A quadratic curve as the cubic one that cairo draws.
void MwCircleRecordingEffect::_quad(cairo_t* cairo, double controlX, double controlY, double endX, double endY)
{
    if (!cairo) {
        MW_LOGE("cairo nullptr");
        return;
    }
    const auto [x, y] = _lastPoint;
    cairo_curve_to(cairo, x / 3 + 2 * controlX / 3, y / 3 + 2 * controlY / 3, 2 * controlX / 3 + endX / 3,
        2 * controlY / 3 + endY / 3, endX, endY);
    _lastPoint = {endX, endY};
}
