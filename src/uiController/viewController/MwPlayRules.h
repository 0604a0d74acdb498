#pragma once

#include <string>
#include <vector>

// The pure rules of the player panel. Times in milliseconds unless they say otherwise.

// How often the panel looks at the position while playing, in seconds: long recordings move slowly anyway.
double mwPlayRefreshPeriod(unsigned int duration);
// The two times in one shape: both with hours when the recording has them.
std::string mwPlayTotalText(unsigned int duration);
std::string mwPlayPositionText(unsigned int position, unsigned int duration);
// The place of a position on the slider, 0.0 to 1.0.
double mwPlayRatio(unsigned int position, unsigned int duration);
// Where a step (negative: back) leads to within the recording.
unsigned int mwSoughtPosition(unsigned int position, long long step, unsigned int duration);
// The whole second, in seconds, a bookmark at the position belongs to: the nearest, but none behind the end.
unsigned int mwBookmarkSecond(unsigned int position, unsigned int duration);
// The word with the smallest number from 1 on that none of the names is.
std::string mwFreeBookmarkName(const std::string& word, const std::vector<std::string>& names);
// Whether the recording at the path is long enough and of a kind that can be trimmed.
bool mwIsTrimmable(const std::string& extension, unsigned int duration);
