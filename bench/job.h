// One row of the table: a job that the library and the peer both do.
#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace bench {

using Bytes = std::vector<uint8_t>;
using Shared = std::shared_ptr<Bytes>;  // what a job keeps until it runs

struct Job {
  std::string name;
  std::function<bool()> ours;
  // The peer as it is called without wishes, and with its flags for speed over accuracy.
  std::function<bool(int flags)> peer;
};

// Registers "NAME/ours", "NAME/peer" and "NAME/peer_fast" with the benchmark library.
void register_job(Job job);

// The jobs, over a large photograph.
void register_decode_jobs(const Bytes& photograph);
void register_slide_jobs(const Bytes& photograph);
void register_png_jobs(const Bytes& photograph);
void register_transform_jobs(const Bytes& photograph);
void register_gif_jobs(const Bytes& photograph);
void register_raw_jobs(const Bytes& photograph);
void register_zoom_jobs(const Bytes& photograph);

}  // namespace bench
