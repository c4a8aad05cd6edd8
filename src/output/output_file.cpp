#include "output/output_file.h"

#include <cstring>
#include <new>
#include <utility>

namespace pc {

namespace {

std::FILE* openFile(const char* name, const char* mode) { return std::fopen(name, mode); }
std::size_t writeFile(const void* data, std::size_t size, std::FILE* file) {
  return std::fwrite(data, 1, size, file);
}
int closeFile(std::FILE* file) { return std::fclose(file); }

// The block of a finished output is kept for the next one: each fresh
// megabyte costs its page faults, and a run may write a few outputs.
std::unique_ptr<char[]>& spareBlock() {
  static std::unique_ptr<char[]> spare;
  return spare;
}

}  // namespace

OutputFileHooks defaultOutputFileHooks() { return OutputFileHooks{openFile, writeFile, closeFile}; }

OutputFileHooks& outputFileHooks() {
  static OutputFileHooks hooks = defaultOutputFileHooks();
  return hooks;
}

OutputFile::OutputFile(OutputFile&& other) noexcept
    : file_(std::exchange(other.file_, nullptr)),
      block_(std::move(other.block_)),
      used_(std::exchange(other.used_, 0)),
      failed_(std::exchange(other.failed_, false)) {}

OutputFile& OutputFile::operator=(OutputFile&& other) noexcept {
  if (this != &other) {
    if (file_ != nullptr) close();
    file_ = std::exchange(other.file_, nullptr);
    block_ = std::move(other.block_);
    used_ = std::exchange(other.used_, 0);
    failed_ = std::exchange(other.failed_, false);
  }
  return *this;
}

OutputFile::~OutputFile() {
  if (file_ != nullptr) close();
  if (block_ && !spareBlock()) spareBlock() = std::move(block_);
}

bool OutputFile::open(const char* name, const char* mode) {
  if (file_ != nullptr) close();
  used_ = 0;
  failed_ = false;
  if (!block_) block_ = std::move(spareBlock());
  if (!block_) {
    block_.reset(new (std::nothrow) char[kBlockSize]);
    if (!block_) return false;
  }
  file_ = outputFileHooks().open(name, mode);
  if (file_ == nullptr) return false;
  // The block above is the only buffer: every write reaches the system at
  // once and its result is known at once.
  std::setvbuf(file_, nullptr, _IONBF, 0);
  return true;
}

char* OutputFile::reserve(std::size_t size) {
  if (kBlockSize - used_ < size) flush();
  return block_.get() + used_;
}

void OutputFile::write(const void* data, std::size_t size) {
  if (kBlockSize - used_ < size) {
    flush();
    if (size >= kBlockSize) {
      if (!failed_ && !writeThrough(data, size)) failed_ = true;
      return;
    }
  }
  std::memcpy(block_.get() + used_, data, size);
  used_ += size;
}

std::size_t OutputFile::read(void* data, std::size_t size) {
  if (file_ == nullptr || !flush()) return 0;
  const std::size_t got = std::fread(data, 1, size, file_);
  // An update stream must be repositioned between reading and writing.
  std::fseek(file_, 0, SEEK_CUR);
  return got;
}

bool OutputFile::writeThrough(const void* data, std::size_t size) {
  return file_ != nullptr && outputFileHooks().write(data, size, file_) == size;
}

bool OutputFile::flush() {
  // After a failure the pending bytes are dropped: the file is lost anyway,
  // and the level dump starts its next level from a clean block.
  if (used_ > 0 && !failed_ && !writeThrough(block_.get(), used_)) failed_ = true;
  used_ = 0;
  return !failed_;
}

bool OutputFile::seek(std::int64_t offset) {
  if (!flush() || file_ == nullptr) return false;
  return std::fseek(file_, static_cast<long>(offset), SEEK_SET) == 0;
}

bool OutputFile::close() {
  if (file_ == nullptr) return false;
  bool ok = flush();
  if (std::ferror(file_) != 0) ok = false;
  if (outputFileHooks().close(file_) != 0) ok = false;
  file_ = nullptr;
  return ok;
}

}  // namespace pc
