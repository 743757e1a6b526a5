// Fuzz target for the text reader: any input is refused or read; what is read
// writes back to a text that reads again to the same text.
#include <zoa/text.h>
#include <zoa/verify.h>

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <string>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    std::string source(reinterpret_cast<const char*>(data), size);
    ZOA::text::Result r = ZOA::text::parse(source, "fuzz.zoa");
    if (!r.ok()) return 0;
    ZOA::verify::verify(*r.unit());
    std::string once = ZOA::text::write(*r.unit());
    ZOA::text::Result again = ZOA::text::parse(once, "again.zoa");
    if (!again.ok() || ZOA::text::write(*again.unit()) != once) std::abort();
    return 0;
}

#ifndef ZOA_LIBFUZZER
// Without libFuzzer: replays the files named on the command line (a corpus).
#include <filesystem>
#include <fstream>
#include <iostream>
#include <iterator>

int main(int argc, char** argv) {
    unsigned n = 0;
    for (int i = 1; i < argc; ++i) {
        std::filesystem::path p(argv[i]);
        std::vector<std::filesystem::path> files;
        if (std::filesystem::is_directory(p))
            for (const auto& e : std::filesystem::directory_iterator(p)) files.push_back(e.path());
        else
            files.push_back(p);
        for (const auto& f : files) {
            std::ifstream in(f, std::ios::binary);
            std::string s((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
            LLVMFuzzerTestOneInput(reinterpret_cast<const std::uint8_t*>(s.data()), s.size());
            ++n;
        }
    }
    std::cout << n << " inputs replayed\n";
    return 0;
}
#endif
