// A disk that is full: while one of these lives, no write gets past that length of a file.
#pragma once

#include <sys/resource.h>

#include <csignal>

namespace tests {

class FileLimit {
 public:
  explicit FileLimit(size_t length) : signal_(std::signal(SIGXFSZ, SIG_IGN)) {
    getrlimit(RLIMIT_FSIZE, &before_);
    const rlimit limit{length, before_.rlim_max};
    setrlimit(RLIMIT_FSIZE, &limit);
  }
  ~FileLimit() {
    setrlimit(RLIMIT_FSIZE, &before_);
    std::signal(SIGXFSZ, signal_);
  }
  FileLimit(const FileLimit&) = delete;
  FileLimit& operator=(const FileLimit&) = delete;

 private:
  void (*signal_)(int);
  rlimit before_;
};

}  // namespace tests
