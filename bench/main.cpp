// The benchmark program: tavir_bench PHOTOGRAPH.jpg [benchmark options].
#include <benchmark/benchmark.h>
#include <turbojpeg.h>

#include <cstdio>
#include <fstream>
#include <iterator>

#include "bench/heap_meter.h"
#include "bench/job.h"

namespace bench {
namespace {

template <typename Work>
void run(benchmark::State& state, const Work& work) {
  size_t before = heap_in_use();
  reset_heap_peak();
  for (auto _ : state) {
    if (!work()) {
      state.SkipWithError("failed");
      return;
    }
  }
  state.counters["heap"] = static_cast<double>(heap_peak() - before);
}

template <typename Work>
void add_row(const std::string& name, Work work) {
  benchmark::RegisterBenchmark(name.c_str(), [work](benchmark::State& state) {
    run(state, work);
  })->Unit(benchmark::kMillisecond);
}

}  // namespace

void register_job(Job job) {
  add_row(job.name + "/ours", job.ours);
  add_row(job.name + "/peer", [peer = job.peer] { return peer(0); });
  add_row(job.name + "/peer_fast",
          [peer = job.peer] { return peer(TJFLAG_FASTDCT | TJFLAG_FASTUPSAMPLE); });
}

}  // namespace bench

int main(int argc, char** argv) {
  benchmark::Initialize(&argc, argv);
  if (argc != 2) {
    std::fprintf(stderr, "usage: %s PHOTOGRAPH.jpg [benchmark options]\n", argv[0]);
    return 2;
  }
  std::ifstream file(argv[1], std::ios::binary);
  bench::Bytes photograph{std::istreambuf_iterator<char>(file), {}};
  bench::register_decode_jobs(photograph);
  bench::register_slide_jobs(photograph);
  bench::register_png_jobs(photograph);
  bench::register_transform_jobs(photograph);
  bench::register_gif_jobs(photograph);
  bench::register_raw_jobs(photograph);
  bench::register_zoom_jobs(photograph);
  return benchmark::RunSpecifiedBenchmarks() == 0 ? 1 : 0;
}
