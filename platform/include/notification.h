// Status messages: a toast in the window while it is in the foreground, a transient desktop notification otherwise.
// Any thread; returns at once.
#pragma once

extern "C" {
int notification_status_message_post(const char* message);
// The last message posted by this process, borrowed until the next post; null when none. For tests and the tool.
const char* notification_status_message_last(void);
}
