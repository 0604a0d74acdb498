#pragma once

#include <tovanic_log_manager.h>

#include <string>

// Counts user actions: one usage-log record per action. One instance for the process. Any thread.
class MwLoggingMgr {
public:
    static MwLoggingMgr* getInstance();

    MwLoggingMgr() = default;
    ~MwLoggingMgr();
    MwLoggingMgr(const MwLoggingMgr&) = delete;
    MwLoggingMgr& operator=(const MwLoggingMgr&) = delete;

    bool init();
    // Counting never stands in the way of the action: callers ignore the result.
    bool insert(const std::string& feature);
    bool insert(const std::string& feature, const std::string& extra);
    bool insert(const std::string& feature, const std::string& extra, const std::string& value);

private:
    tovanic_log_manager_h _logMgrHandle = nullptr;
};
