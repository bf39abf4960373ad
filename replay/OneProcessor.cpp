#include "replay/OneProcessor.h"

namespace replay {

OneProcessor::OneProcessor() : mHolds(sched_getaffinity(0, sizeof(mAllowed), &mAllowed) == 0) {
    cpu_set_t present;
    CPU_ZERO(&present);
    CPU_SET(sched_getcpu(), &present);
    if (mHolds) sched_setaffinity(0, sizeof(present), &present);
}

void OneProcessor::letGo() {
    if (mHolds) sched_setaffinity(0, sizeof(mAllowed), &mAllowed);
    mHolds = false;
}

}  // namespace replay
