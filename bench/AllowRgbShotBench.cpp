#include <benchmark/benchmark.h>
#include <time.h>

#include "rgb/LightSensorState.h"
#include "rgb/RgbShotManager.h"

namespace {

void clockRead(benchmark::State& state) {
    for (auto _ : state) {
        timespec now;
        clock_gettime(CLOCK_MONOTONIC, &now);
        benchmark::DoNotOptimize(now);
    }
}

/** Nothing queued, no budget: what most turns of a sampling loop cost. */
void allowRgbShot(benchmark::State& state) {
    policy = 1;
    android::RgbShotManager* manager = android::RgbShotManager::getInstance();
    for (auto _ : state) benchmark::DoNotOptimize(manager->allowRgbShot());
}

BENCHMARK(clockRead);
BENCHMARK(allowRgbShot);

}  // namespace
