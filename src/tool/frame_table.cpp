#include "tool/frame_table.h"

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <memory>
#include <optional>
#include <string>

#include "env/diagnostic_channels.h"
#include "env/path_expander.h"
#include "env/work_zone.h"
#include "fileio/memory_files.h"
#include "platform/platform.h"
#include "tool/file_names.h"
#include "tool/view_file.h"

namespace pc {

namespace {

struct FileCloser {
  void operator()(std::FILE* f) const { std::fclose(f); }
};

bool validIndex(int index) { return index >= 0 && index < kFrameCount; }

// A bounded copy: longer names are cut to the field.
void copyName(std::array<char, kFrameNameSize>& field, const char* name) {
  const std::size_t length = std::min(std::strlen(name), kFrameNameSize - 1);
  std::memcpy(field.data(), name, length);
  field[length] = '\0';
}

void storeName(Frame& frame, const char* name) { copyName(frame.name, name); }

void makeIdentity(Frame& frame, const char* name) {
  frame.mat = identityMatrix();
  frame.inv_mat = identityMatrix();
  frame.defined = true;
  frame.loaded = true;
  frame.matIsIdentity = true;
  storeName(frame, name);
}

// The machine axis system file's name, expanded as a 512-character name.
std::array<char, kFrameNameSize> machineFileName() {
  std::array<char, kFrameNameSize> name{};
  const std::string pattern = fileKindName(kMachineAxisSystemFile);
  copyName(name, pattern.c_str());
  expandNameInPlace(name.data(), name.size());
  name[name.size() - 1] = '\0';
  return name;
}

// Reads frame `frame` from the view file `name`. A file that cannot be read
// leaves the frame as it was.
int readFrame(Frame& frame, const char* name) {
  if (!fileExists(name)) return -1;
  // Memory-backed bytes first, so that the reader can be driven without
  // the disk; a directory, FIFO or device is refused like an unreadable file.
  std::unique_ptr<std::FILE, FileCloser> stream(fileio::openMemoryFile(name));
  if (!stream) stream.reset(platform::openExistingFile(name, "r", true));
  if (!stream) {
    warning(std::string("cannot open ") + name);
    return -1;
  }
  const std::optional<ViewMatrices> view = readViewStream(stream.get());
  if (!view) {
    warning(std::string("read error ") + name);
    return -1;
  }
  frame.mat = view->mat;
  frame.inv_mat = view->inv_mat;
  frame.loaded = true;
  frame.matIsIdentity = isIdentity(frame.mat);
  frame.defined = true;
  return 0;
}

void relativeMatrices(Frame& frame, const Frame& view) {
  frame.matlec = multiply(frame.mat, view.inv_mat);
  frame.matecr = multiply(view.mat, frame.inv_mat);
  frame.matlecIsIdentity = isIdentity(frame.matlec);
}

void relativeMatricesOnly(int index) {
  auto& table = frameTable();
  const Frame& view = table[kToolViewFrame];
  if (index == kToolViewFrame) {
    for (int g = kFrameCount - 1; g >= 0; --g) {
      Frame& frame = table[static_cast<std::size_t>(g)];
      if (frame.defined && frame.loaded) relativeMatrices(frame, view);
    }
  } else if (view.loaded) {
    relativeMatrices(table[static_cast<std::size_t>(index)], view);
  }
}

}  // namespace

std::array<Frame, kFrameCount>& frameTable() {
  static std::array<Frame, kFrameCount> table;
  return table;
}

void resetFrameTable() { frameTable() = std::array<Frame, kFrameCount>{}; }

int defineView(int index, const char* name) {
  if (!validIndex(index) || name == nullptr) return -1;
  Frame& frame = frameTable()[static_cast<std::size_t>(index)];
  if (std::strcmp(name, "CAO") == 0 || std::strcmp(name, "CAD") == 0) {
    makeIdentity(frame, name);
    return 0;
  }
  if (std::strcmp(name, "MACHINE") == 0) {
    const auto file = machineFileName();
    if (!fileExists(file.data())) {
      makeIdentity(frame, name);
      return 0;
    }
    return readFrame(frame, file.data());
  }
  return readFrame(frame, name);
}

void ensureMachineFrame() {
  Frame& machine = frameTable()[kMachineFrame];
  if (machine.loaded) return;
  const auto file = machineFileName();
  if (fileExists(file.data())) {
    if (defineView(kMachineFrame, file.data()) == 0) updateRelativeMatrices(kMachineFrame);
  } else {
    makeIdentity(machine, file.data());
  }
}

void updateRelativeMatrices(int index) {
  if (!validIndex(index)) return;
  if (index != kMachineFrame) ensureMachineFrame();
  relativeMatricesOnly(index);
}

void scaleView(int index, double s) {
  if (!validIndex(index)) return;
  if (index != kMachineFrame) ensureMachineFrame();
  Frame& frame = frameTable()[static_cast<std::size_t>(index)];
  frame.inv_mat = multiply(frame.inv_mat, scaleMatrix(s));
  frame.mat = multiply(scaleMatrix(1.0 / s), frame.mat);
  relativeMatricesOnly(index);
}

}  // namespace pc
