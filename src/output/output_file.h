// OutputFile: the write side of every result file. Data is gathered in a
// large block and handed to the system in big chunks (result files can hold
// millions of records); every chunk's write is checked, so a full disk or a
// failing close is seen instead of being taken for success.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <memory>

namespace pc {

// The file operations behind OutputFile. They are replaceable so that the
// failure paths of the outputs (no file, short write, failing close) can be
// exercised on demand.
struct OutputFileHooks {
  std::FILE* (*open)(const char* name, const char* mode);
  // Number of bytes written.
  std::size_t (*write)(const void* data, std::size_t size, std::FILE* file);
  // 0 on success.
  int (*close)(std::FILE* file);
};

OutputFileHooks& outputFileHooks();
OutputFileHooks defaultOutputFileHooks();

class OutputFile {
 public:
  // Size of the gathering block, and the largest reserve() request.
  static constexpr std::size_t kBlockSize = std::size_t{1} << 20;

  OutputFile() = default;
  OutputFile(OutputFile&& other) noexcept;
  OutputFile& operator=(OutputFile&& other) noexcept;
  OutputFile(const OutputFile&) = delete;
  OutputFile& operator=(const OutputFile&) = delete;
  ~OutputFile();  // closes an open file; the result is not looked at

  // Opens `name` with the standard I/O `mode`; false when it cannot be opened.
  bool open(const char* name, const char* mode);
  bool isOpen() const { return file_ != nullptr; }

  // Room for `size` (at most kBlockSize) bytes after the pending data; the
  // bytes become pending with commit(end).
  char* reserve(std::size_t size);
  void commit(char* end) { used_ = static_cast<std::size_t>(end - block_.get()); }
  void write(const void* data, std::size_t size);

  // Reads raw bytes at the current position (files opened for update);
  // returns the number read.
  std::size_t read(void* data, std::size_t size);

  // Hands every pending byte to the system. False when any write failed since
  // the file was opened or clearError() was called.
  bool flush();
  bool failed() const { return failed_; }
  void clearError() { failed_ = false; }
  // Flushes, then moves to `offset` bytes from the start.
  bool seek(std::int64_t offset);
  // Flushes and closes. False when any write since the last clearError(), the
  // flush or the close failed.
  bool close();

 private:
  bool writeThrough(const void* data, std::size_t size);

  std::FILE* file_ = nullptr;
  std::unique_ptr<char[]> block_;
  std::size_t used_ = 0;
  bool failed_ = false;
};

}  // namespace pc
