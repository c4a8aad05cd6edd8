// CheckedArray: the growable list of the pocket model. It grows linearly by a
// fixed step (large steps, few reallocations), checks every read made through
// at(), and turns allocation failures and bad indices into the FatalReport
// instead of exceptions.
#pragma once

#include <cstdint>
#include <limits>
#include <new>
#include <type_traits>
#include <utility>

#include "driver/fatal_report.h"

namespace pc {

template <typename T>
struct CheckedArray {
  std::int32_t count = 0;
  std::int32_t capacity = 0;
  std::int32_t growStep = 100;
  T* data = nullptr;

  CheckedArray(std::int32_t initialCapacity, std::int32_t step)
      : growStep(step < 1 ? 100 : step) {
    if (initialCapacity >= 1) {
      data = allocate(initialCapacity);
      if (data == nullptr) {
        FatalReport(kArraySourceName, kLineAllocAtConstruction, kMemoryAllocationFailure);
      }
      capacity = initialCapacity;
    }
  }
  CheckedArray(const CheckedArray&) = delete;
  CheckedArray& operator=(const CheckedArray&) = delete;
  CheckedArray(CheckedArray&& other) noexcept { swap(other); }
  CheckedArray& operator=(CheckedArray&& other) noexcept {
    if (this != &other) {
      clear();
      swap(other);
    }
    return *this;
  }
  ~CheckedArray() { release(data); }

  void append(const T& value) {
    if (data != nullptr && count < capacity) {
      data[count++] = value;
      return;
    }
    // Linear growth; an overflowing capacity counts as a failed allocation.
    T* grown = nullptr;
    std::int32_t newCapacity = 0;
    if (capacity <= std::numeric_limits<std::int32_t>::max() - growStep) {
      newCapacity = capacity + growStep;
      grown = allocate(newCapacity);
    }
    if (grown == nullptr) {
      FatalReport(kArraySourceName, kLineAllocAtGrowth, kMemoryAllocationFailure);
    }
    for (std::int32_t i = 0; i < count; ++i) grown[i] = data[i];
    grown[count++] = value;
    release(data);
    data = grown;
    capacity = newCapacity;
  }

  const T& at(std::int32_t i) const {
    if (i < 0 || i >= count) FatalReport(kArraySourceName, kLineInvalidIndex, kInvalidArrayIndex);
    return data[i];
  }
  T& at(std::int32_t i) {
    if (i < 0 || i >= count) FatalReport(kArraySourceName, kLineInvalidIndex, kInvalidArrayIndex);
    return data[i];
  }

  // Empties the list but keeps its block, so a cached list refills without
  // reallocating.
  void reset() { count = 0; }

  void clear() {
    release(data);
    data = nullptr;
    count = 0;
    capacity = 0;
  }

 private:
  CheckedArray() = default;
  void swap(CheckedArray& other) noexcept {
    std::swap(count, other.count);
    std::swap(capacity, other.capacity);
    std::swap(growStep, other.growStep);
    std::swap(data, other.data);
  }
  static T* allocate(std::int32_t slots) {
    if (static_cast<std::uint64_t>(slots) > std::numeric_limits<std::size_t>::max() / sizeof(T)) {
      return nullptr;
    }
    const std::size_t n = static_cast<std::size_t>(slots);
    // Slots beyond `count` are never read, so plain elements are not
    // initialised: the large outline lists then cost no more pages than
    // their points fill.
    if constexpr (kPlain) {
      return static_cast<T*>(::operator new(n * sizeof(T), std::nothrow));
    } else {
      return new (std::nothrow) T[n]();
    }
  }
  static void release(T* block) {
    if constexpr (kPlain) {
      ::operator delete(block);
    } else {
      delete[] block;
    }
  }
  static constexpr bool kPlain = std::is_trivially_copyable_v<T> && std::is_trivially_destructible_v<T>;
};

}  // namespace pc
