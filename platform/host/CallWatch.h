// Telephone calls of ModemManager: the number of live calls as "memory/telephony/call_status". Rejects incoming calls
// while told to.
#pragma once

#include "BusInLoop.h"
#include "KeySink.h"

#include <map>
#include <set>
#include <string>
#include <vector>

namespace host {

class CallWatch {
public:
    // The question whether incoming calls are to be rejected is asked anew for each.
    CallWatch(KeySink sink, std::function<bool()> rejects)
        : _sink(std::move(sink))
        , _rejects(std::move(rejects))
    {
    }
    void start();
    void stop();

private:
    void _listModems();
    void _listCalls(const std::string& modem);
    void _added(const std::string& call);
    void _removed(const std::string& call);
    void _stateChanged(const std::string& call, int state);
    void _report();

    KeySink _sink;
    std::function<bool()> _rejects;
    std::vector<Slot> _slots;
    std::set<std::string> _calls; // object paths of live calls
};

}
