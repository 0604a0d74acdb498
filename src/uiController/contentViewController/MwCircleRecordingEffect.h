#pragma once

#include <array>

#include <panekit/WTimer.h>
#include <panekit/WViewController.h>

typedef struct _cairo cairo_t;
typedef struct _cairo_surface cairo_surface_t;
class MwModel;

// The ring around the record button that breathes with the input level: five rotated strokes of one smooth closed
// curve. Every 0.2 s the level gives the curve a new target, an animation eases towards it. The image lies in the
// part "recording_effect" of the parent layout, which owns it; deleting either ends the other. The model is borrowed.
// Main loop only.
class MwCircleRecordingEffect : public panekit::WViewController {
public:
    static constexpr int POINTS = 8;
    static constexpr int STEPS = 12;
    using Radii = std::array<double, POINTS>;

    explicit MwCircleRecordingEffect(MwModel* model);

    const char* getClassName() const override { return "MwCircleRecordingEffect"; }
    // The effect of an image made by it, null when it is none. Borrowed.
    static MwCircleRecordingEffect* fromCanvas(Evas_Object* canvas);

    // 0 (silence) to 12 for a level in decibels.
    static int stepOf(double level);
    // The target radius of a step for a random draw of 0 to 11.
    static double targetOf(int step, int draw);
    static float speedOf(int step);

    void _updateAudioLevel(int step);
    [[nodiscard]] const Radii& getTargetRadii() const { return _targets; }
    [[nodiscard]] const Radii& getCurrentRadii() const { return _currents; }
    [[nodiscard]] bool isAnimating() const { return _animating; }

protected:
    ~MwCircleRecordingEffect() override;
    Evas_Object* onCreateView(Evas_Object* parent, void* viewParam) override;
    void onCreated() override;
    void onDestroy() override;

private:
    struct Layer;

    bool _createCairo();
    bool _sampleLevel();
    bool _animate();
    void _draw();
    void _strokeLayer(const Layer& layer);
    void _quad(cairo_t* cairo, double controlX, double controlY, double endX, double endY);
    static void _getImageFixelsCb(void* data, Evas_Object* image);

    MwModel* _model;
    Evas_Object* _parent = nullptr;
    Evas_Object* _canvas = nullptr;
    Radii _currents{};
    Radii _targets{};
    std::array<double, 2> _lastPoint{};
    float _speed = 0.0F;
    bool _animating = false;
    panekit::WTimer::Weak _levelTimer;
    panekit::WTimer::Weak _animationTimer;
    cairo_t* _cairo = nullptr;
    cairo_surface_t* _surface = nullptr;
};
