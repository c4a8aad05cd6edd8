// load_messages: one environ.cfg file, line by line, into a message table.
#include <cerrno>
#include <cstring>
#include <string>

#include "env/configuration_loader.h"
#include "env/configuration_loader_internal.h"
#include "env/configuration_loader_syntax.h"
#include "env/diagnostic_channels.h"
#include "env/line_source.h"
#include "env/variable_lookup.h"
#include "platform/platform.h"

namespace pc {

namespace {

constexpr std::size_t lineBufferSize = 1024;
constexpr std::size_t longestLine = lineBufferSize - 1;
constexpr int deepestNesting = 7;
// Entry records hold 16-bit line numbers; later lines keep the largest.
constexpr std::int64_t largestRecordedLine = 65535;

std::string fileMessage(const char* fileName, std::int64_t line, std::string_view text) {
  return "load_messages: file '" + std::string(fileName) + "', line " + std::to_string(line) + " : " +
         std::string(text);
}

// Makes the table being filled visible to the lookups of the conditions.
class ReadingScope {
 public:
  explicit ReadingScope(MessageTable* table) : previous_(tableBeingRead()) { tableBeingRead() = table; }
  ~ReadingScope() { tableBeingRead() = previous_; }
  ReadingScope(const ReadingScope&) = delete;
  ReadingScope& operator=(const ReadingScope&) = delete;

 private:
  MessageTable* previous_;
};

class Parser {
 public:
  Parser(MessageTable* table, bool newTable, std::int32_t origin, const char* fileName)
      : table_(table), newTable_(newTable), origin_(origin), fileName_(fileName) {
    used_[0] = true;
  }

  // True when the file was read completely and stored.
  bool run(VCL8BLineSource& source) {
    char buffer[lineBufferSize];
    while (!failed_ && !gaveUp_ && source.hasMore() != 0) {
      const std::size_t length = source.readLine(buffer, sizeof buffer);
      if (length == 0 && source.hasMore() == 0) break;  // the end, after a final line end
      ++line_;
      if (length - source.lineEndLength() > longestLine) {
        warning(fileMessage(fileName_, line_, "Input line too long"));
      }
      if (skipping_) {
        skipLine(buffer);
      } else {
        useLine(buffer);
      }
    }
    if (gaveUp_) return false;
    if (skipping_) return giveUp(line_, "'/if' without '/endif'");
    if (depth_ != 0) return giveUp(-1, "'/if' without '/endif' at end of file.");
    if (failed_) return giveUp(0, "Error loading file.");
    shrinkTable(table_);
    return true;
  }

 private:
  bool giveUp(std::int64_t line, std::string_view text) {
    fatal(fileMessage(fileName_, line, text));
    gaveUp_ = true;
    return false;
  }

  std::uint16_t recordedLine() const {
    return static_cast<std::uint16_t>(line_ < largestRecordedLine ? line_ : largestRecordedLine);
  }

  void useLine(const char* buffer) {
    const std::string_view raw(buffer);
    const std::string_view stripped = stripConfigurationBlanks(raw);
    std::string text(stripped);
    cutComment(text);
    if (text.empty()) return;
    switch (classifyLine(text)) {
      case ConfigurationLine::If:
        openCondition(text);
        return;
      case ConfigurationLine::Else:
        if (depth_ == 0) {
          giveUp(line_, "'/else' without '/if'");
          return;
        }
        used_[depth_] = !used_[depth_];
        if (!used_[depth_]) startSkipping();
        return;
      case ConfigurationLine::Endif:
        if (depth_ == 0) {
          giveUp(line_, "'/endif' without '/if'");
          return;
        }
        --depth_;
        return;
      case ConfigurationLine::UnknownKeyword:
        giveUp(line_, "Unknown keyword : '" + text + "'");
        return;
      case ConfigurationLine::Section: {
        const std::string_view name = sectionNameOf(text);
        section_ = newTable_ ? addSection(table_, name) : findOrAddSection(table_, name);
        if (section_ == refusedSection || section_ < 0) {
          section_ = -1;
          failed_ = true;
        }
        return;
      }
      case ConfigurationLine::Entry: {
        if (section_ < 0) return;  // before the first section
        // The entry keeps the blanks that led its line.
        const std::string entry = std::string(raw.substr(0, static_cast<std::size_t>(stripped.data() - raw.data()))) + text;
        const int result = newTable_ ? addEntry(table_, section_, entry, origin_, recordedLine())
                                     : setEntry(table_, section_, entry, origin_, recordedLine());
        if (result != 0) failed_ = true;
        return;
      }
    }
  }

  void openCondition(const std::string& line) {
    if (depth_ >= deepestNesting) {
      giveUp(line_, "too many nested conditions: " + line);
      return;
    }
    ++depth_;
    used_[depth_] = false;
    const bool holds = conditionHolds(line, std::string_view(line).substr(3));
    if (gaveUp_) return;
    used_[depth_] = holds;
    if (!holds) startSkipping();
  }

  bool conditionHolds(const std::string& line, std::string_view condition) {
    const ConditionParts parts = parseCondition(condition);
    const std::optional<std::string> value = lookupVariable(parts.name);
    if (parts.op.empty()) return value.has_value();
    if (!value) {
      warning("load_messages: file '" + std::string(fileName_) + "' line " + std::to_string(line_) +
              ", unknown variable : '" + line + "'\n");
      return false;
    }
    if (parts.op == "==") return *value == parts.text;
    if (parts.op == "!=") return *value != parts.text;
    giveUp(line_, "invalid condition: " + line);
    return false;
  }

  void startSkipping() {
    skipping_ = true;
    skippedNesting_ = 0;
  }

  // A line of a false branch: only the keywords that end it count.
  void skipLine(const char* buffer) {
    switch (classifySkippedLine(buffer)) {
      case SkippedLine::If:
        ++skippedNesting_;
        return;
      case SkippedLine::Else:
        if (skippedNesting_ == 0) {
          used_[depth_] = true;
          skipping_ = false;
        }
        return;
      case SkippedLine::Endif:
        if (skippedNesting_ == 0) {
          --depth_;
          skipping_ = false;
        } else {
          --skippedNesting_;
        }
        return;
      case SkippedLine::Other:
        return;
    }
  }

  MessageTable* table_;
  bool newTable_;
  std::int32_t origin_;
  const char* fileName_;
  std::int64_t line_ = 0;
  int section_ = -1;
  int depth_ = 0;
  bool used_[deepestNesting + 1] = {};
  bool skipping_ = false;
  std::uint64_t skippedNesting_ = 0;
  bool failed_ = false;
  bool gaveUp_ = false;
};

}  // namespace

LoadOutcome loadMessagesFromStream(MessageTable* table, const char* fileName, std::FILE* stream) {
  CL8BFile source(stream);
  const bool newTable = table == nullptr;
  MessageTable* target = newTable ? createTable() : table;
  const std::int32_t origin = target != nullptr ? storeFileName(target, fileName) : -1;
  if (origin < 0) {
    if (newTable) destroyTable(target);
    fatal(fileMessage(fileName, 0, "Error loading file."));
    return {nullptr, true};
  }
  bool loaded = false;
  {
    const ReadingScope reading(target);
    Parser parser(target, newTable, origin, fileName);
    loaded = parser.run(source);
  }
  if (loaded) return {target, false};
  if (newTable) destroyTable(target);
  return {nullptr, true};
}

LoadOutcome loadMessagesFile(MessageTable* table, const char* fileName) {
  if (fileName == nullptr) return {table, false};
  const std::string name(fileName);
  errno = 0;
  std::FILE* stream = platform::openExistingFile(name, "r", true);
  const int openError = errno;
  if (stream == nullptr) {
    if (!platform::pathExists(name)) return {table, false};  // a missing file is skipped
    // Directories, FIFOs and devices are never read: a FIFO would block.
    const std::string reason = platform::isDirectory(name)       ? std::strerror(EISDIR)
                               : !platform::isRegularFile(name) ? "Not a regular file"
                               : std::strerror(openError != 0 ? openError : EACCES);
    fatal(fileMessage(fileName, 0, "Error opening file - " + reason));
    return {nullptr, true};
  }
  const LoadOutcome outcome = loadMessagesFromStream(table, fileName, stream);
  std::fclose(stream);
  return outcome;
}

MessageTable* load_messages(MessageTable* table, const char* fileName) {
  return loadMessagesFile(table, fileName).table;
}

MessageTable* load_messages_from_buffer(MessageTable* table, const char* fileName, const unsigned char* data,
                                        std::size_t size) {
  if (fileName == nullptr || (data == nullptr && size > 0)) return table;
  std::FILE* stream = platform::openMemoryStream(data, size);
  if (stream == nullptr) return table;
  const LoadOutcome outcome = loadMessagesFromStream(table, fileName, stream);
  std::fclose(stream);
  return outcome.table;
}

}  // namespace pc
