#pragma once

namespace look {

constexpr auto FOCUS_COLOR = "mewlo/focus";

// The focus mark is for those who use the keyboard: keys that move or use the focus show it, the next click or touch
// hides it. All of its layouts are drawn in one colour class, which is transparent while it is hidden.
bool isFocusMarkShown();
// Starts to follow keys and clicks of all windows; once is enough. Main loop.
void watchFocusMark();

}
