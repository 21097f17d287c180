// A file that is written whole or not at all.
#pragma once

#include <string>

namespace zavctl {

// Puts the text in the file's place in one step: whoever reads sees the old file or the new one. 0,
// or errno of the failure; the old file, if there is one, is then as it was.
int replace_file(const std::string &file, const std::string &text);

} // namespace zavctl
