// Ownership of memory from the OS layer: everything that the codec allocates is held by one of these.
#pragma once

#include <cstddef>
#include <memory>
#include <new>
#include <type_traits>
#include <utility>

#include "codec/base/checked.h"
#include "codec/base/os.h"

namespace pelo {

// A block of `count` trivial elements, zero-filled, freed with the OS layer.
template <class T>
class OsBuffer {
  static_assert(std::is_trivially_copyable_v<T>);

 public:
  OsBuffer() = default;
  OsBuffer(OsBuffer&& other) noexcept { swap(other); }
  OsBuffer& operator=(OsBuffer&& other) noexcept {
    swap(other);
    return *this;
  }
  OsBuffer(const OsBuffer&) = delete;
  OsBuffer& operator=(const OsBuffer&) = delete;
  ~OsBuffer() { reset(); }

  // Replaces the block by `count` zeroed elements; false (and empty) for 0 or when memory is short.
  [[nodiscard]] bool allocate(size_t count) {
    reset();
    const auto bytes = checked_mul(count, sizeof(T));
    if (!bytes) return false;
    data_ = static_cast<T*>(os_zeroed(*bytes));
    if (data_ == nullptr) return false;
    count_ = count;
    return true;
  }
  // More elements behind those that are there, zeroed; false, with nothing changed, when memory is
  // short.
  [[nodiscard]] bool grow(size_t count) {
    OsBuffer larger;
    if (count < count_ || !larger.allocate(count)) return false;
    os_memcpy(larger.data_, data_, count_ * sizeof(T));
    swap(larger);
    return true;
  }
  void reset() {
    os_free(data_);
    data_ = nullptr;
    count_ = 0;
  }
  // Hands the block to the caller, who frees it with os_free.
  [[nodiscard]] T* release() {
    count_ = 0;
    return std::exchange(data_, nullptr);
  }
  void swap(OsBuffer& other) noexcept {
    std::swap(data_, other.data_);
    std::swap(count_, other.count_);
  }

  T* data() { return data_; }
  const T* data() const { return data_; }
  size_t size() const { return count_; }
  explicit operator bool() const { return data_ != nullptr; }
  T& operator[](size_t i) { return data_[i]; }
  const T& operator[](size_t i) const { return data_[i]; }

 private:
  T* data_ = nullptr;
  size_t count_ = 0;
};

// Destroys an object made by os_new.
struct OsDelete {
  template <class T>
  void operator()(T* object) const {
    if (object == nullptr) return;
    object->~T();
    os_free(object);
  }
};
template <class T>
using OsPtr = std::unique_ptr<T, OsDelete>;

// A value-initialised object in OS-layer memory; empty when memory is short.
template <class T>
[[nodiscard]] OsPtr<T> os_new() {
  void* memory = os_malloc(sizeof(T));
  return OsPtr<T>(memory == nullptr ? nullptr : new (memory) T());
}

}  // namespace pelo
