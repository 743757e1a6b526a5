// The sound-assembly campaign's build: each unit's assembly in a file of its own, linked with the C driver.
#ifndef ZOA_FUZZ_SOUND_ASM_H
#define ZOA_FUZZ_SOUND_ASM_H

#include <string>
#include <vector>

namespace ZOA::fuzz {

// Writes texts[i] to dir/sound<i>.s (labels and file-level data are private
// to each file, so units never clash) and returns the paths, separated and
// preceded by blanks, for a gcc command line.
std::string writeSoundAsmFiles(const std::vector<const std::string*>& texts, const std::string& dir);

// gcc's flags for linking them: gcc's defaults (PIE), as a user would.
inline const char* soundAsmLinkFlags() { return ""; }

}  // namespace ZOA::fuzz

#endif
