// The search form of file names: "?LIST/file" looks the file up along the
// directories of a path list.
#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace pc {

// Splits an expanded directory list at ';' and ',', trims bytes 0x01-0x20 at
// both ends of every piece and drops the pieces left empty.
std::vector<std::string> splitDirectoryList(std::string_view list);

// Expands `name` in its search form. EXPAND_OK: `result` is the first
// candidate that exists. EXPAND_NOT_FOUND: none exists (or `name` is empty)
// and `result` is the candidate in the first directory. Any other code leaves
// `result` empty: -43 for an undefined reference, -44 for a list part without
// a file part, or a hard error of the expansion.
int expandSearchForm(std::string_view name, std::string& result);

}  // namespace pc
