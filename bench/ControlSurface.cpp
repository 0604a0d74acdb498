// What the control surface of a recording costs on the X server that there is: "created" the first time and "again"
// (median of the later ones), "updated" (median), the longest time in milliseconds that the main loop works on it,
// and "memory", kilobytes resident once it is on the screen. Nothing is recorded.
#include <Elementary.h>
#include <panekit/WWindowController.h>

#include <cstdio>
#include <fstream>
#include <string>
#include <vector>

#include "MwMiniControllerMgr.h"
#include "bench/LoopHold.h"
#include "bench/PanelWindow.h"

namespace {

constexpr int ROUNDS = 21;

void runFor(double seconds)
{
    ecore_timer_add(
        seconds,
        [](void*) -> Eina_Bool {
            ecore_main_loop_quit();
            return ECORE_CALLBACK_CANCEL;
        },
        nullptr);
    ecore_main_loop_begin();
}

double held(bench::Engines& engines, MwRecorderState state)
{
    bench::LoopHold::restart();
    engines.model.setRecorderState(state);
    engines.controller.getRecorderUpdatedSignal().emit();
    runFor(0.4);
    return bench::LoopHold::longestCpu();
}

long residentKilobytes()
{
    std::ifstream status("/proc/self/status");
    for (std::string word; status >> word;)
        if (word == "VmRSS:") {
            long size = 0;
            status >> size;
            return size;
        }
    return 0;
}

double median(std::vector<double> values)
{
    std::sort(values.begin(), values.end());
    return values[values.size() / 2];
}

}

int main(int argc, char** argv)
{
    bench::initToolkit(argc, argv, 1.3, "x11");
    bench::Engines engines;
    bench::loadLook();
    panekit::WWindowController program("bench", 0);
    // What any window of the toolkit needs does not count.
    program.create();
    runFor(1.0);
    MwMiniControllerMgr manager(&engines.model, &engines.controller, &program);
    const long before = residentKilobytes();
    bench::LoopHold::install();
    runFor(2.0); // it prepares itself while nothing happens
    evas_object_hide(program.getEvasObject()); // it would hide the surface
    std::vector<double> created;
    std::vector<double> updated;
    for (int i = 0; i < ROUNDS; ++i) {
        created.push_back(held(engines, REC_STATE_RECORDING));
        if (i == 0)
            std::printf("memory %ld\ncreated %.1f\n", residentKilobytes() - before, created.front());
        updated.push_back(held(engines, REC_STATE_PAUSED));
        (void)held(engines, REC_STATE_READY);
    }
    created.erase(created.begin());
    std::printf("again %.1f\nupdated %.1f\n", median(created), median(updated));
    return 0;
}
