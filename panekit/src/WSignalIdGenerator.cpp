#include <panekit/WSignalIdGenerator.h>

namespace panekit {

unsigned int WSignalIdGenerator::generate()
{
    static unsigned int last = 0;
    if (++last == 0)
        ++last;
    return last;
}

}
