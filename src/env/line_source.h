// Text lines from an input, one at a time, with a UTF-8 byte order mark
// understood: the reader of the environ.cfg files.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdio>

namespace pc {

class VCL8BLineSource {
 public:
  // The number of lines read so far plus one, until a read has met the end
  // of the input; 0 from then on, or when there is no input.
  virtual std::int64_t hasMore() = 0;
  // Reads the next line into `buffer`: at most `size` - 1 bytes and a NUL,
  // the line end kept when it fits, the rest of a longer line read and
  // thrown away. Gives the full length of the line as it stood in the input,
  // line end included.
  virtual std::size_t readLine(char* buffer, std::size_t size) = 0;
  virtual ~VCL8BLineSource() = default;

  // Bytes of the line end of the latest line read: 0 (end of input), 1
  // ("\n") or 2 ("\r\n"), so that a caller can tell the length of the text.
  std::size_t lineEndLength() const { return lineEnd_; }

 protected:
  std::size_t lineEnd_ = 0;
};

// Reads lines from a C stream that it is given open and does not close.
class CL8BFile : public VCL8BLineSource {
 public:
  explicit CL8BFile(std::FILE* stream);
  CL8BFile(const CL8BFile&) = delete;
  CL8BFile& operator=(const CL8BFile&) = delete;
  ~CL8BFile() override;

  std::int64_t hasMore() override;
  std::size_t readLine(char* buffer, std::size_t size) override;

  bool startsWithByteOrderMark() const { return state_.utf8Mark; }

 private:
  struct State {
    std::FILE* stream = nullptr;
    bool ownsStream = false;  // never set: the caller closes the stream
    bool utf8Mark = false;
    std::int64_t linesRead = 0;
    bool atEnd = false;
    // The first bytes read while looking for the mark, given back first.
    unsigned char pending[3] = {0, 0, 0};
    int pendingCount = 0;
    int pendingNext = 0;
  };

  int nextByte();

  State state_;
};

}  // namespace pc
