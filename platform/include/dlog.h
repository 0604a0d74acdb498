// The log. Thread-safe. Lines go to the journal when standard error is one, else to standard error.
#pragma once

enum log_id_t { LOG_ID_MAIN };
enum log_priority { DLOG_DEBUG, DLOG_INFO, DLOG_WARN, DLOG_ERROR };

extern "C" {
// MEWLO_LOG=debug|info|warn|error|none chooses the least priority that is written (error by default).
int __dlog_print(log_id_t log, int priority, const char* tag, const char* format, ...)
    __attribute__((format(printf, 4, 5)));
}
