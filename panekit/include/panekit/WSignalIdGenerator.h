#pragma once

namespace panekit {

// Hands out listener identifiers: unique, increasing and never 0 across all signals of the process. Main loop only.
class WSignalIdGenerator {
public:
    static unsigned int generate();
};

}
