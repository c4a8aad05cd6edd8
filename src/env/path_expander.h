// Path expansion: every file name of the suite is written with references to
// variables ($NAME, $(NAME), ${NAME}) and path lists (?NAME) that are resolved
// here, from the environment, the configuration table and the work zone.
// Every code an entry point does not accept is reported on the warning
// channel ("_Expand("<name>") = error <code>..."); none of them stops the
// process. Separators are normalised to the platform's own.
#pragma once

#include <cstddef>
#include <span>
#include <string_view>

namespace pc {

inline constexpr int EXPAND_OK = 0;
inline constexpr int EXPAND_UNDEFINED = -43;
inline constexpr int EXPAND_NOT_FOUND = -21;
inline constexpr int EXPAND_SYNTAX = -31;
inline constexpr int EXPAND_BUFFER_TOO_SMALL = -32;
inline constexpr int EXPAND_INVALID_ARGUMENT = -44;
// References that lead back to themselves (directly, through other values or
// through the undefined-value text), or that nest or multiply beyond any real
// name: the expansion is abandoned.
inline constexpr int EXPAND_TOO_DEEP = -45;

// NUL-terminated names, normalised. On 0 or -43 the result (with its NUL) is
// copied into `destination` when it fits `size`, else -32. `destination` may
// be `source`.
int expandName(const char* source, char* destination, std::size_t size);
int expandNameInPlace(char* buffer, std::size_t size);

// Fixed-length fields: the source is used up to its last non-blank; on an
// accepted code the destination receives the result, blank-padded.
// expandFileName: search form, accepts 0, -43 (destination all blanks), -21.
int expandFileName(std::string_view source, std::span<char> destination);
// expandText: plain substitution, no normalisation; accepts 0, -43.
int expandText(std::string_view source, std::span<char> destination);
// expandPath: substitution and normalisation; accepts 0, -43.
int expandPath(std::string_view source, std::span<char> destination);

}  // namespace pc
