#include <panekit/WSignal.h>

#include <Ecore_Evas.h>
#include <gtest/gtest.h>

#include <string>

#include "fakes/Fakes.h"

namespace {

using Signal = panekit::WSignal<void(int)>;

class WSignalTest : public ::testing::Test {
protected:
    void SetUp() override { fakes::reset(); }
    Signal::Callback writes(char letter)
    {
        return [this, letter](int) { _heard += letter; };
    }
    std::string emitted()
    {
        _heard.clear();
        _signal.emit(1);
        return _heard;
    }

    std::string _heard; // outlives the signal's listeners
    Signal _signal;
};

TEST_F(WSignalTest, CallsInOrderOfRegisteringAndPassesArguments)
{
    int sum = 0;
    _signal.addListener([&](int value) { sum += value; });
    const unsigned int first = _signal.addListener(writes('a'));
    const unsigned int second = _signal.addListener(writes('b'));
    EXPECT_LT(0u, first);
    EXPECT_LT(first, second);
    EXPECT_EQ("ab", emitted());
    _signal.emit(41);
    EXPECT_EQ(42, sum);
    _signal.removeListener(first);
    EXPECT_EQ("b", emitted());
    _signal.removeListener(first);
    EXPECT_EQ(1u, fakes::log.count("Already removed listener! =" + std::to_string(first)));
}

TEST_F(WSignalTest, ListenersMayRemoveThemselvesAndOthersDuringAnEmission)
{
    unsigned int self = 0;
    unsigned int later = 0;
    self = _signal.addListener([&](int) {
        _heard += 'x';
        _signal.removeListener(self);
        _signal.removeListener(later);
    });
    _signal.addListener(writes('m'));
    later = _signal.addListener(writes('z'));
    EXPECT_EQ("xm", emitted());
    EXPECT_EQ("m", emitted());
}

TEST_F(WSignalTest, ListenersAddedDuringAnEmissionJoinTheNextOne)
{
    unsigned int added = 0;
    const unsigned int adder = _signal.addListener([&](int) {
        _heard += 'a';
        added = _signal.addListener(writes('n'));
        _signal.removeListener(added); // not found yet: it stays
    });
    EXPECT_EQ("a", emitted());
    EXPECT_TRUE(fakes::log.has("Already removed listener!"));
    _signal.removeListener(adder);
    EXPECT_EQ("n", emitted());
}

// The inner emission must not destroy the record whose callback is still running (run under the address sanitizer).
TEST_F(WSignalTest, AListenerRemovesItselfAndEmitsAgain)
{
    const std::string letters(64, 'r'); // captured by value: its storage dies with the record
    unsigned int self = 0;
    self = _signal.addListener([&, letters](int depth) {
        if (depth != 1)
            return;
        _signal.removeListener(self);
        _signal.emit(2);
        _heard += letters;
    });
    _signal.addListener(writes('o'));
    EXPECT_EQ("o" + letters + "o", emitted());
    EXPECT_EQ("o", emitted());
}

TEST_F(WSignalTest, AnObjectTakesItsListenerWithIt)
{
    Ecore_Evas* canvas = ecore_evas_buffer_new(8, 8);
    ASSERT_NE(nullptr, canvas);
    Evas_Object* object = evas_object_rectangle_add(ecore_evas_get(canvas));
    const unsigned int bound = _signal.addListener(writes('o'), object);
    unsigned int duringId = 0;
    Evas_Object* other = evas_object_rectangle_add(ecore_evas_get(canvas));
    _signal.addListener([&](int) {
        if (other != nullptr) {
            duringId = _signal.addListener(writes('d'), other); // waits for the next emission, which never comes for it
            evas_object_del(std::exchange(other, nullptr));
        }
    });
    EXPECT_EQ("o", emitted());
    evas_object_del(object);
    EXPECT_EQ("", emitted());
    EXPECT_FALSE(fakes::log.has("Already removed"));
    _signal.removeListener(bound);
    EXPECT_TRUE(fakes::log.has("Already removed listener!"));
    {
        Signal shortLived;
        Evas_Object* survivor = evas_object_rectangle_add(ecore_evas_get(canvas));
        shortLived.addListener(writes('s'), survivor);
    }
    ecore_evas_free(canvas); // deletes the survivor: nothing of the dead signal may be called
}

}
