#include "MwAvrcp.h"

#include <bluetooth.h>

#include "MwLog.h"

namespace {

constexpr int COMMAND_STOP_WORKER = 3;

void shutDownBluetooth()
{
    if (const int result = bt_deinitialize(); result != 0)
        MW_LOGE("bt_deinitialize failed : [%d]", result);
}

}

MwAvrcp::MwAvrcp() { _initialize(); }

MwAvrcp::~MwAvrcp() { _deinitialize(); }

void MwAvrcp::_initialize()
{
    MW_LOGW("BEGIN");
    _thread = std::thread([this] { _work(); });
    MW_LOGW("END");
}

void MwAvrcp::_deinitialize()
{
    MW_LOGW("BEGIN");
    _queue(COMMAND_STOP_WORKER);
    if (_thread.joinable())
        _thread.join();
}

void MwAvrcp::setAvrcpState(int state)
{
    MW_LOGW("BEGIN - state : [%d]", state);
    if (state < STOPPED || state > PAUSED) {
        MW_LOGE("Unhandled state : [%d]!!!", state);
        return;
    }
    _queue(state);
    MW_LOGW("END");
}

void MwAvrcp::_queue(int command)
{
    const platform::Lock lock(_mutex);
    _commandQueue.push_back(command);
    _condition.notify_one();
}

void MwAvrcp::_work()
{
    MW_LOGW("BEGIN");
    if (!_startService(this))
        return;
    _handleCommands();
    _stopService();
    MW_LOGW("END");
}

bool MwAvrcp::_startService(void* userData)
{
    if (const int result = bt_initialize(); result != 0) {
        MW_LOGE("bt_initialize failed : [%d]", result);
        return false;
    }
    if (const int result = bt_avrcp_target_initialize(_connectionStateChangedCb, userData); result != 0) {
        MW_LOGE("bt_avrcp_target_initialize failed : [%d]", result);
        shutDownBluetooth();
        return false;
    }
    return true;
}

void MwAvrcp::_stopService()
{
    if (const int result = bt_avrcp_target_deinitialize(); result != 0)
        MW_LOGE("bt_avrcp_target_deinitialize failed : [%d]", result);
    shutDownBluetooth();
}

void MwAvrcp::_handleCommands()
{
    platform::Lock lock(_mutex);
    for (;;) {
        _condition.wait(lock, [this]() REQUIRES(_mutex) { return !_commandQueue.empty(); });
        const int command = _commandQueue.front();
        _commandQueue.pop_front();
        lock.unlock();
        MW_LOGI("command : [%d]", command);
        if (command == COMMAND_STOP_WORKER) {
            MW_LOGI("end avcp thread");
            return;
        }
        _notify(command);
        lock.lock();
    }
}

void MwAvrcp::_notify(int state)
{
    if (state < BT_AVRCP_PLAYER_STATE_STOPPED || state > BT_AVRCP_PLAYER_STATE_PAUSED) {
        MW_LOGE("Unknown command : [%d]!!!", state);
        return;
    }
    const int result = bt_avrcp_target_notify_player_state(static_cast<bt_avrcp_player_state_e>(state));
    if (result != 0)
        MW_LOGE("bt_avrcp_target_notify_player_state failed : [%d]", result);
}

void MwAvrcp::_connectionStateChangedCb(bool connected, const char*, void* userData)
{
    if (userData == nullptr) {
        MW_LOGE("userData is nullptr");
        return;
    }
    MW_LOGI("BEGIN - connected : [%d]", connected);
    MW_LOGI("END");
}
