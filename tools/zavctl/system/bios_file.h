// Saving and loading BIOS settings so that no failure costs a file or goes unnoticed.
#pragma once

#include "../core/bios_report.h"

#include <string>

namespace zavctl {

NvramFact read_nvram();

// Saves into a new file beside `file` and renames it in the end: on every failure the old file,
// if there was one, is untouched and no new one is left. Without `replace` an existing file is
// never overwritten, also not one that appears meanwhile: outcome "exists".
BiosOutcome save_bios_file(const std::string &file, bool replace);

// Loads the file, whose bytes were found to be `image`, and compares what the device holds then.
BiosOutcome load_bios_file(const std::string &file, const std::string &image);

} // namespace zavctl
