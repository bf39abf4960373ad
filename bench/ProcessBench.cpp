#include <benchmark/benchmark.h>

#include "bench/EmptyCall.h"
#include "core/SDCImpl.h"

namespace {

void emptyVirtualCall(benchmark::State& state) {
    EmptyCall* call = EmptyCall::create();
    benchmark::DoNotOptimize(call);
    const sensors_event_t event{};
    for (auto _ : state) call->process(event);
}

/** What the host pays for every event that it dispatches while the chat app is not in a call. */
void processUnwanted(benchmark::State& state) {
    android::SDCImpl* sdc = android::SDCImpl::getInstance();
    sensors_event_t event{};
    event.type = 1;
    for (auto _ : state) sdc->process(event);
}

BENCHMARK(emptyVirtualCall);
BENCHMARK(processUnwanted);

}  // namespace
