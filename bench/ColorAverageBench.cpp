#include "rgb/ColorAverage.h"

#include <cstring>
#include <random>

#include <benchmark/benchmark.h>
#ifdef WITH_OPENCV
#include <opencv2/core.hpp>
#endif

#include "bench/PlainAverage.h"

namespace {

/** A buffer as the benchmark's arguments have it, full of noise. */
struct Buffer {
    explicit Buffer(const benchmark::State& state)
          : width(static_cast<uint32_t>(state.range(0))),
            height(static_cast<uint32_t>(state.range(1))),
            stride(static_cast<uint32_t>(state.range(2))),
            pixels(static_cast<uint8_t*>(std::aligned_alloc(64, size()))) {
        std::mt19937 random(1);
        for (size_t i = 0; i < size(); ++i) pixels[i] = static_cast<uint8_t>(random());
    }

    ~Buffer() { std::free(pixels); }

    Buffer(const Buffer&) = delete;
    Buffer& operator=(const Buffer&) = delete;

    size_t size() const { return (size_t{4} * stride * height + 63) / 64 * 64; }

    const uint32_t width;
    const uint32_t height;
    const uint32_t stride;
    uint8_t* const pixels;
};

void averageColor(benchmark::State& state) {
    const Buffer buffer(state);
    for (auto _ : state) {
        int32_t rgb[3];
        android::averageColor(buffer.pixels, buffer.width, buffer.height, buffer.stride,
                              android::PIXEL_FORMAT_RGBA_8888, rgb);
        benchmark::DoNotOptimize(rgb);
    }
}

void plainLoop(benchmark::State& state) {
    const Buffer buffer(state);
    for (auto _ : state) {
        int32_t rgb[3];
        averagePlainly(buffer.pixels, buffer.width, buffer.height, buffer.stride, rgb);
        benchmark::DoNotOptimize(rgb);
    }
}

#ifdef WITH_OPENCV
void cvMean(benchmark::State& state) {
    const Buffer buffer(state);
    cv::setNumThreads(1);
    const cv::Mat image(static_cast<int>(buffer.height), static_cast<int>(buffer.width), CV_8UC4,
                        buffer.pixels, size_t{4} * buffer.stride);
    for (auto _ : state) benchmark::DoNotOptimize(cv::mean(image));
}
#endif

// As wide as averageColor's, and as many as keep the loads going.
using Vector __attribute__((vector_size(32))) = uint32_t;

#ifdef __x86_64__
__attribute__((target("avx2")))
#endif
uint32_t
readBytes(const uint8_t* next, size_t size) {
    Vector seen[4] = {};
    for (; size >= sizeof(seen); size -= sizeof(seen)) {
        for (Vector& vector : seen) {
            Vector read;
            std::memcpy(&read, next, sizeof(read));
            vector |= read;
            next += sizeof(read);
        }
    }
    for (; size >= sizeof(Vector); size -= sizeof(Vector)) {
        Vector read;
        std::memcpy(&read, next, sizeof(read));
        seen[0] |= read;
        next += sizeof(read);
    }
    const Vector all = seen[0] | seen[1] | seen[2] | seen[3];
    uint32_t bits = 0;
    for (size_t lane = 0; lane < sizeof(Vector) / sizeof(bits); ++lane) bits |= all[lane];
    return bits;
}

void readLoop(benchmark::State& state) {
    const Buffer buffer(state);
    const bool isOneRow = buffer.stride == buffer.width;
    const size_t rows = isOneRow ? 1 : buffer.height;
    const size_t rowBytes = size_t{4} * buffer.width * (isOneRow ? buffer.height : 1);
    for (auto _ : state) {
        for (size_t row = 0; row < rows; ++row) {
            benchmark::DoNotOptimize(
                    readBytes(buffer.pixels + row * size_t{4} * buffer.stride, rowBytes));
        }
    }
}

void sizes(benchmark::internal::Benchmark* benchmark) {
    benchmark->ArgNames({"width", "height", "stride"});
    benchmark->Args({16, 16, 16});
    benchmark->Args({16, 16, 32});
    benchmark->Args({64, 64, 64});
    benchmark->Args({200, 200, 200});
    benchmark->Args({200, 200, 256});
    benchmark->Args({1080, 2400, 1080});
}

BENCHMARK(averageColor)->Apply(sizes);
BENCHMARK(plainLoop)->Apply(sizes);
#ifdef WITH_OPENCV
BENCHMARK(cvMean)->Apply(sizes);
#endif
BENCHMARK(readLoop)->Apply(sizes);

}  // namespace
