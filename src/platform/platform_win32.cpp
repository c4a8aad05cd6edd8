// The Windows implementation of the platform layer. Names reach this layer in
// the process code page (configuration lines are converted to it on reading),
// so every file name goes to the wide-character API through that code page.
#include "platform/platform.h"

#ifdef _WIN32

#include <windows.h>

#include <fcntl.h>
#include <io.h>

#include <cstdlib>
#include <cstring>
#include <ctime>

namespace pc::platform {

namespace {

std::wstring widen(const std::string& text, UINT codePage = CP_ACP) {
  if (text.empty()) return {};
  const int n = ::MultiByteToWideChar(codePage, 0, text.data(), static_cast<int>(text.size()), nullptr, 0);
  if (n <= 0) return {};
  std::wstring wide(static_cast<std::size_t>(n), L'\0');
  ::MultiByteToWideChar(codePage, 0, text.data(), static_cast<int>(text.size()), wide.data(), n);
  return wide;
}

std::string narrow(const std::wstring& wide, UINT codePage = CP_ACP) {
  if (wide.empty()) return {};
  const int n = ::WideCharToMultiByte(codePage, 0, wide.data(), static_cast<int>(wide.size()), nullptr, 0,
                                      nullptr, nullptr);
  if (n <= 0) return {};
  std::string text(static_cast<std::size_t>(n), '\0');
  ::WideCharToMultiByte(codePage, 0, wide.data(), static_cast<int>(wide.size()), text.data(), n, nullptr,
                        nullptr);
  return text;
}

// INVALID_FILE_ATTRIBUTES for an empty or unconvertible name.
DWORD attributesOf(const std::string& name) {
  const std::wstring wide = widen(name);
  if (wide.empty()) return INVALID_FILE_ATTRIBUTES;
  return ::GetFileAttributesW(wide.c_str());
}

// Hands an open handle over to a C stream; the handle is closed on failure.
std::FILE* streamOf(HANDLE handle, const char* mode, bool update) {
  const int fd = ::_open_osfhandle(reinterpret_cast<intptr_t>(handle), (update ? _O_RDWR : _O_RDONLY) | _O_BINARY);
  if (fd < 0) {
    ::CloseHandle(handle);
    return nullptr;
  }
  std::FILE* file = ::_fdopen(fd, mode);
  if (file == nullptr) ::_close(fd);  // closes the handle as well
  return file;
}

bool writeAll(HANDLE handle, const void* data, std::size_t size) {
  const char* p = static_cast<const char*>(data);
  while (size > 0) {
    const DWORD chunk = size > 0x40000000u ? 0x40000000u : static_cast<DWORD>(size);
    DWORD written = 0;
    if (!::WriteFile(handle, p, chunk, &written, nullptr) || written == 0) return false;
    p += written;
    size -= written;
  }
  return true;
}

}  // namespace

char nativeSeparator() { return '\\'; }

// The process environment of the system, not the C runtime's copy: only the
// system's keeps a variable that is set but empty. The runtime's copy is kept
// in step for code that calls getenv.
std::optional<std::string> getEnv(const std::string& name) {
  if (name.empty()) return std::nullopt;
  std::string value(256, '\0');
  for (;;) {
    ::SetLastError(ERROR_SUCCESS);
    const DWORD n = ::GetEnvironmentVariableA(name.c_str(), value.data(), static_cast<DWORD>(value.size()));
    if (n == 0) {
      if (::GetLastError() == ERROR_ENVVAR_NOT_FOUND) return std::nullopt;
      return std::string();
    }
    if (n < value.size()) {
      value.resize(n);
      return value;
    }
    value.resize(n);  // n counts the NUL when the buffer was too small
  }
}

bool setEnv(const std::string& name, const std::string& value) {
  if (name.empty() || name.find('=') != std::string::npos) return false;
  if (!::SetEnvironmentVariableA(name.c_str(), value.c_str())) return false;
  // An empty value would remove the runtime's copy, which has no empty state.
  return value.empty() || ::_putenv_s(name.c_str(), value.c_str()) == 0;
}

bool unsetEnv(const std::string& name) {
  if (name.empty()) return false;
  ::_putenv_s(name.c_str(), "");
  return ::SetEnvironmentVariableA(name.c_str(), nullptr) != 0 || ::GetLastError() == ERROR_ENVVAR_NOT_FOUND;
}

std::optional<std::string> executablePath() {
  std::wstring buffer(MAX_PATH, L'\0');
  for (;;) {
    const DWORD n = ::GetModuleFileNameW(nullptr, buffer.data(), static_cast<DWORD>(buffer.size()));
    if (n == 0) return std::nullopt;
    if (n < buffer.size()) {
      buffer.resize(n);
      break;
    }
    if (buffer.size() >= 32768) return std::nullopt;  // the longest name Windows has
    buffer.resize(buffer.size() * 2);
  }
  std::string path = narrow(buffer);
  if (path.empty()) return std::nullopt;
  return path;
}

std::uint32_t processId() { return static_cast<std::uint32_t>(::GetCurrentProcessId()); }

void sleepMilliseconds(unsigned milliseconds) { ::Sleep(milliseconds); }

bool pathExists(const std::string& name) { return attributesOf(name) != INVALID_FILE_ATTRIBUTES; }

bool isRegularFile(const std::string& name) {
  const DWORD a = attributesOf(name);
  return a != INVALID_FILE_ATTRIBUTES && (a & (FILE_ATTRIBUTE_DIRECTORY | FILE_ATTRIBUTE_DEVICE)) == 0;
}

bool isDirectory(const std::string& name) {
  const DWORD a = attributesOf(name);
  return a != INVALID_FILE_ATTRIBUTES && (a & FILE_ATTRIBUTE_DIRECTORY) != 0;
}

std::optional<std::int64_t> modificationTime(const std::string& name) {
  const std::wstring wide = widen(name);
  WIN32_FILE_ATTRIBUTE_DATA data{};
  if (wide.empty() || !::GetFileAttributesExW(wide.c_str(), GetFileExInfoStandard, &data)) return std::nullopt;
  // 100-nanosecond ticks since 1601-01-01.
  const std::uint64_t ticks =
      (static_cast<std::uint64_t>(data.ftLastWriteTime.dwHighDateTime) << 32) | data.ftLastWriteTime.dwLowDateTime;
  constexpr std::uint64_t kEpochTicks = 116444736000000000ull;
  return static_cast<std::int64_t>(ticks / 10000000ull) - static_cast<std::int64_t>(kEpochTicks / 10000000ull);
}

int makeDirectory(const std::string& name) {
  switch (createDirectory(name)) {
    case DirectoryCreation::created:
      return 0;
    case DirectoryCreation::alreadyExists:
    case DirectoryCreation::accessDenied:
      return 1;
    default:
      return -1;
  }
}

bool removeFile(const std::string& name) {
  const std::wstring wide = widen(name);
  return !wide.empty() && ::DeleteFileW(wide.c_str()) != 0;
}

std::vector<std::string> listDirectory(const std::string& directory) {
  std::vector<std::string> names;
  std::string pattern = directory.empty() ? std::string(".") : directory;
  if (pattern.back() != '\\' && pattern.back() != '/') pattern += '\\';
  pattern += '*';
  WIN32_FIND_DATAW found{};
  const HANDLE search = ::FindFirstFileW(widen(pattern).c_str(), &found);
  if (search == INVALID_HANDLE_VALUE) return names;
  do {
    const std::wstring name = found.cFileName;
    if (name != L"." && name != L"..") names.push_back(narrow(name));
  } while (::FindNextFileW(search, &found));
  ::FindClose(search);
  return names;
}

DirectoryCreation createDirectory(const std::string& name) {
  const std::wstring wide = widen(name);
  if (wide.empty()) return DirectoryCreation::failed;
  if (::CreateDirectoryW(wide.c_str(), nullptr)) return DirectoryCreation::created;
  switch (::GetLastError()) {
    case ERROR_ALREADY_EXISTS:
      return DirectoryCreation::alreadyExists;
    case ERROR_ACCESS_DENIED:
    case ERROR_WRITE_PROTECT:
      return DirectoryCreation::accessDenied;
    default:
      return DirectoryCreation::failed;
  }
}

const char* platformDirectoryName() { return "msw"; }

const char* platformConfigurationVariable() { return "WINDOWS"; }

std::size_t utf8ToProcessCodePage(char* text, std::size_t length, std::size_t size) {
  if (text == nullptr || size == 0) return 0;
  if (length >= size) length = size - 1;
  if (length > 0 && ::GetACP() != CP_UTF8) {
    const std::wstring wide = widen(std::string(text, length), CP_UTF8);
    // Characters the code page lacks become its default character; a line
    // that is not UTF-8 at all is kept as it is.
    const std::string converted = wide.empty() ? std::string() : narrow(wide, CP_ACP);
    if (!converted.empty()) {
      length = converted.size() < size ? converted.size() : size - 1;
      converted.copy(text, length);
    }
  }
  text[length] = '\0';
  return length;
}

void breakpointTrap() { ::DebugBreak(); }

std::int64_t currentTime() { return static_cast<std::int64_t>(std::time(nullptr)); }

std::optional<LocalTime> localTime(std::int64_t secondsSinceEpoch) {
  const std::time_t t = static_cast<std::time_t>(secondsSinceEpoch);
  std::tm tm{};
  if (::localtime_s(&tm, &t) != 0) return std::nullopt;
  return LocalTime{tm.tm_year + 1900, tm.tm_mon + 1, tm.tm_mday, tm.tm_hour, tm.tm_min, tm.tm_sec};
}

// Large pages need a privilege that ordinary accounts lack, so the block is
// plain heap memory.
void* allocateLarge(std::size_t bytes) { return std::malloc(bytes == 0 ? 1 : bytes); }

void releaseLarge(void* block) { std::free(block); }

ExclusiveCreation createExclusiveFile(const std::string& name, std::string_view content) {
  const std::wstring wide = widen(name);
  if (wide.empty()) return ExclusiveCreation::Failed;
  // CREATE_NEW fails when the file exists, in one step, as O_EXCL does.
  const HANDLE handle = ::CreateFileW(wide.c_str(), GENERIC_WRITE, FILE_SHARE_READ | FILE_SHARE_DELETE, nullptr,
                                      CREATE_NEW, FILE_ATTRIBUTE_NORMAL, nullptr);
  if (handle == INVALID_HANDLE_VALUE) {
    const DWORD error = ::GetLastError();
    return error == ERROR_FILE_EXISTS || error == ERROR_ALREADY_EXISTS ? ExclusiveCreation::Exists
                                                                         : ExclusiveCreation::Failed;
  }
  const bool written = writeAll(handle, content.data(), content.size());
  if (!::CloseHandle(handle) || !written) {
    ::DeleteFileW(wide.c_str());
    return ExclusiveCreation::WriteFailed;
  }
  return ExclusiveCreation::Created;
}

std::FILE* openExistingFile(const std::string& name, const char* mode, bool regularOnly) {
  if (name.empty() || mode == nullptr || mode[0] != 'r') return nullptr;
  const bool update = std::string_view(mode).find('+') != std::string_view::npos;
  const std::wstring wide = widen(name);
  if (wide.empty()) return nullptr;
  const DWORD access = GENERIC_READ | (update ? GENERIC_WRITE : 0);
  const HANDLE handle = ::CreateFileW(wide.c_str(), access, FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE,
                                      nullptr, OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr);
  if (handle == INVALID_HANDLE_VALUE) return nullptr;
  // A pipe would block its reader and a device (CON, NUL, COM1) is no file;
  // only a file on disk is read. Directories cannot be opened this way at all.
  BY_HANDLE_FILE_INFORMATION info{};
  const DWORD type = ::GetFileType(handle);
  bool refused = type != FILE_TYPE_DISK;
  if (!refused && regularOnly) {
    refused = !::GetFileInformationByHandle(handle, &info) || (info.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
  }
  if (refused) {
    ::CloseHandle(handle);
    return nullptr;
  }
  return streamOf(handle, mode, update);
}

std::FILE* openMemoryStream(const void* data, std::size_t size) {
  // The C runtime has no stream over memory; a temporary file that the system
  // deletes when the stream closes stands in for one, and mostly stays in the
  // file cache.
  wchar_t directory[MAX_PATH + 1] = {};
  wchar_t file[MAX_PATH + 1] = {};
  if (::GetTempPathW(MAX_PATH + 1, directory) == 0 || ::GetTempFileNameW(directory, L"pcm", 0, file) == 0) {
    return nullptr;
  }
  const HANDLE handle = ::CreateFileW(file, GENERIC_READ | GENERIC_WRITE, FILE_SHARE_DELETE, nullptr, CREATE_ALWAYS,
                                      FILE_ATTRIBUTE_TEMPORARY | FILE_FLAG_DELETE_ON_CLOSE, nullptr);
  if (handle == INVALID_HANDLE_VALUE) {
    ::DeleteFileW(file);
    return nullptr;
  }
  if (!writeAll(handle, data, size) || ::SetFilePointer(handle, 0, nullptr, FILE_BEGIN) == INVALID_SET_FILE_POINTER) {
    ::CloseHandle(handle);
    return nullptr;
  }
  return streamOf(handle, "rb", false);
}

VersionResource readVersionResource(const std::string& file, const std::vector<std::string>& names,
                                    std::array<std::uint32_t, 13>& fixed,
                                    std::map<std::string, std::string>& strings) {
  const std::wstring wide = widen(file);
  if (wide.empty()) return VersionResource::Unreadable;
  DWORD ignored = 0;
  const DWORD size = ::GetFileVersionInfoSizeW(wide.c_str(), &ignored);
  if (size == 0) {
    const DWORD error = ::GetLastError();
    return error == ERROR_RESOURCE_DATA_NOT_FOUND || error == ERROR_RESOURCE_TYPE_NOT_FOUND ||
                   error == ERROR_RESOURCE_NAME_NOT_FOUND || error == ERROR_RESOURCE_LANG_NOT_FOUND
               ? VersionResource::Missing
               : VersionResource::Unreadable;
  }
  std::vector<unsigned char> data(size);
  if (!::GetFileVersionInfoW(wide.c_str(), 0, size, data.data())) return VersionResource::Unreadable;
  void* block = nullptr;
  UINT length = 0;
  if (!::VerQueryValueW(data.data(), L"\\", &block, &length) || block == nullptr ||
      length < sizeof(VS_FIXEDFILEINFO)) {
    return VersionResource::Missing;
  }
  std::memcpy(fixed.data(), block, sizeof fixed);
  // Strings of every language and code page the resource lists.
  struct Translation {
    WORD language;
    WORD codePage;
  };
  void* table = nullptr;
  UINT tableLength = 0;
  if (!::VerQueryValueW(data.data(), L"\\VarFileInfo\\Translation", &table, &tableLength) || table == nullptr) {
    return VersionResource::Found;
  }
  const auto* translations = static_cast<const Translation*>(table);
  for (UINT i = 0; i < tableLength / sizeof(Translation); ++i) {
    char prefix[32];
    std::snprintf(prefix, sizeof prefix, "\\StringFileInfo\\%04x%04x\\", translations[i].language,
                  translations[i].codePage);
    for (const std::string& name : names) {
      void* value = nullptr;
      UINT characters = 0;
      const std::wstring key = widen(prefix + name);
      if (::VerQueryValueW(data.data(), key.c_str(), &value, &characters) && value != nullptr && characters > 0) {
        std::wstring text(static_cast<const wchar_t*>(value), characters);
        while (!text.empty() && text.back() == L'\0') text.pop_back();
        strings[prefix + name] = narrow(text);
      }
    }
  }
  return VersionResource::Found;
}

}  // namespace pc::platform

#endif  // _WIN32
