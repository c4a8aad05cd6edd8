// The left-to-right scan that replaces $NAME, $(NAME), ${NAME} and the same
// forms with '?' by their values, expanding values again when they hold
// references themselves.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace pc {

// Levels of expansion open at once, the text being expanded counted as the
// first: a value may hold a reference whose value holds one, and so on, 63
// times. Deeper nesting comes from a cycle in practice and gives
// EXPAND_TOO_DEEP.
inline constexpr int kMaxReferenceNesting = 64;
// One expansion (with everything it expands inside) looks up at most this
// many references, which bounds a value that doubles itself at every level.
inline constexpr std::size_t kMaxReferencesPerExpansion = 1'000'000;
// One expansion copies at most this many bytes in all; beyond that the text
// fits no buffer and the code is EXPAND_BUFFER_TOO_SMALL.
inline constexpr std::size_t kMaxExpansionBytes = std::size_t{64} << 20;

// Expands `text` without normalising separators. Gives EXPAND_OK or
// EXPAND_UNDEFINED with the result in `result`, or a hard error (EXPAND_SYNTAX,
// EXPAND_TOO_DEEP, EXPAND_BUFFER_TOO_SMALL) with `result` emptied.
int substituteReferences(std::string_view text, std::string& result);

// True for the codes that stop an expansion (anything but 0 and -43).
bool isHardExpansionError(int code);

}  // namespace pc
