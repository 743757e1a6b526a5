// The sound-assembly campaign's build files.
#include "fuzz/sound_asm.h"

#include <fstream>

namespace ZOA::fuzz {

std::string writeSoundAsmFiles(const std::vector<const std::string*>& texts, const std::string& dir) {
    std::string paths;
    for (std::size_t i = 0; i < texts.size(); ++i) {
        std::string path = dir + "/sound" + std::to_string(i) + ".s";
        std::ofstream(path, std::ios::binary) << *texts[i];
        paths += " " + path;
    }
    return paths;
}

}  // namespace ZOA::fuzz
