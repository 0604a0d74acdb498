#include <gtest/gtest.h>

#include <Elementary.h>

#include <panekit/WLanguage.h>

#include "MwCircleRecordingEffect.h"
#include "MwModel.h"
#include "support/Screen.h"

namespace {

TEST(EffectMathTest, LevelsBecomeStepsAndTargetsEndAtTheClamp)
{
    const std::pair<double, int> steps[]
        = {{-300.0, 0}, {-45.0, 0}, {-44.99, 2}, {-10.0, 12}, {0.0, 12}, {-10.01, 11}, {-25.05, 6}, {-25.06, 5}};
    for (const auto& [level, step] : steps)
        EXPECT_EQ(step, MwCircleRecordingEffect::stepOf(level)) << level;
    EXPECT_NEAR(-1.08, MwCircleRecordingEffect::targetOf(12, 0), 1e-9); // nothing clamps below
    EXPECT_NEAR(0.14 - 0.36, MwCircleRecordingEffect::targetOf(0, 1), 1e-9);
    EXPECT_DOUBLE_EQ(1.8, MwCircleRecordingEffect::targetOf(12, 11));
}

class EffectTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        _window = elm_win_util_standard_add("test", "test");
        evas_object_resize(_window, 360, 640);
        _layout = elm_layout_add(_window);
        const std::string file = std::string(std::getenv("MEWLO_RESOURCE_DIR")) + "edje/MwRecorderContentView.edj";
        ASSERT_TRUE(elm_layout_file_set(_layout, file.c_str(), "recorder_content_view"));
        elm_win_resize_object_add(_window, _layout);
        evas_object_show(_layout);
        evas_object_show(_window);
        _effect = new MwCircleRecordingEffect(&_model);
        ASSERT_TRUE(_effect->create(_layout));
        _canvas = elm_object_part_content_get(_layout, "recording_effect");
    }
    void TearDown() override { evas_object_del(_window); }
    // Whether anything is drawn at a distance from the centre, on the right-hand side.
    [[nodiscard]] bool isDrawnAt(int from, int to) const
    {
        const auto* pixels = static_cast<const unsigned int*>(evas_object_image_data_get(_canvas, EINA_FALSE));
        int size = 0;
        evas_object_image_size_get(_canvas, &size, nullptr);
        for (int x = size / 2 + from; x < size / 2 + to; ++x) {
            if (pixels[size / 2 * size + x] != 0)
                return true;
        }
        return false;
    }
    MwModel _model;
    Evas_Object* _window = nullptr;
    Evas_Object* _layout = nullptr;
    Evas_Object* _canvas = nullptr;
    MwCircleRecordingEffect* _effect = nullptr;
};

TEST_F(EffectTest, StandsStillAsACircleAndIsFoundThroughItsImage)
{
    ASSERT_NE(nullptr, _canvas);
    EXPECT_EQ(_effect, MwCircleRecordingEffect::fromCanvas(_canvas));
    EXPECT_EQ(nullptr, MwCircleRecordingEffect::fromCanvas(_layout));
    EXPECT_FALSE(_effect->isAnimating());
    int width = 0;
    int height = 0;
    evas_object_image_size_get(_canvas, &width, &height);
    EXPECT_EQ(335, width); // 670 units at scale 1.3 of 2.6
    EXPECT_EQ(335, height);
    support::settle(_window);
    // The smooth curve through the middles between points on a circle of 142 pixels runs a little inside it.
    EXPECT_TRUE(isDrawnAt(128, 142));
    EXPECT_FALSE(isDrawnAt(0, 120));
    EXPECT_FALSE(isDrawnAt(150, 167));
}

TEST_F(EffectTest, EachLevelShiftsTheTargetsByOnePlace)
{
    std::vector<double> drawn;
    for (int i = 0; i < 9; ++i) {
        _effect->_updateAudioLevel(i);
        drawn.push_back(_effect->getTargetRadii()[0]);
    }
    EXPECT_TRUE(_effect->isAnimating());
    for (size_t i = 0; i < 8; ++i)
        EXPECT_DOUBLE_EQ(drawn[8 - i], _effect->getTargetRadii()[i]) << i;
}

TEST_F(EffectTest, TheTimersSampleTheModelAndEaseTowardsTheTargets)
{
    _model.setLevel(-5.0);
    ASSERT_TRUE(support::runUntil([&] { return _effect->isAnimating(); }));
    const double target = _effect->getTargetRadii()[0];
    ASSERT_TRUE(support::runUntil([&] { return _effect->getCurrentRadii()[0] != 0.0; }));
    const double current = _effect->getCurrentRadii()[0];
    EXPECT_LE(std::abs(current), std::abs(target));
    EXPECT_EQ(current > 0, target > 0);
}

TEST_F(EffectTest, EndsWithItsImageWithItsLayoutAndOnRequest)
{
    _effect->_updateAudioLevel(5);
    _effect->destroy();
    EXPECT_EQ(nullptr, elm_object_part_content_get(_layout, "recording_effect"));
    support::runFor(0.05); // no timer is left

    _effect = new MwCircleRecordingEffect(&_model);
    ASSERT_TRUE(_effect->create(_layout));
    evas_object_del(elm_object_part_content_get(_layout, "recording_effect"));
    EXPECT_EQ(nullptr, elm_object_part_content_get(_layout, "recording_effect"));

    auto* homeless = new MwCircleRecordingEffect(&_model);
    EXPECT_FALSE(homeless->create(nullptr));
    homeless->destroy();
    _effect = new MwCircleRecordingEffect(&_model);
    ASSERT_TRUE(_effect->create(_layout));
    _effect->_updateAudioLevel(5);
    evas_object_del(_layout);
    support::runFor(0.05);
}

}
