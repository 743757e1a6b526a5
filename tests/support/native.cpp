// Test support: scratch files, the 32-bit toolchain, golden files.
#include "native.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <map>
#include <regex>
#include <sstream>
#include <sys/wait.h>
#include <unistd.h>

namespace fs = std::filesystem;

namespace ZOA::testing {

CommandResult runCommand(const std::string& commandLine) {
    CommandResult r;
    std::string cmd = commandLine + " 2>&1";
    FILE* p = popen(cmd.c_str(), "r");
    if (!p) return r;
    std::array<char, 4096> buf;
    std::size_t n;
    while ((n = fread(buf.data(), 1, buf.size(), p)) > 0) r.output.append(buf.data(), n);
    int st = pclose(p);
    r.status = WIFEXITED(st) ? WEXITSTATUS(st) : -1;
    return r;
}

std::string scratchDir() {
    const ::testing::TestInfo* info = ::testing::UnitTest::GetInstance()->current_test_info();
    std::string name = info ? std::string(info->test_suite_name()) + "." + info->name() : "zoa";
    for (char& c : name)
        if (c == '/') c = '_';
    fs::path dir = fs::temp_directory_path() / ("zoa-tests-" + std::to_string(getpid())) / name;
    fs::remove_all(dir);
    fs::create_directories(dir);
    return dir.string();
}

std::string writeFile(const std::string& dir, const std::string& name, const std::string& text) {
    fs::path path = fs::path(dir) / name;
    std::ofstream(path, std::ios::binary) << text;
    return path.string();
}

CommandResult buildAndRun32(const std::string& dir, const std::vector<std::string>& sources,
                            const std::string& flags) {
    std::string exe = (fs::path(dir) / "prog").string();
    std::string cmd = "gcc -m32 -w " + flags + " -o '" + exe + "'";
    for (const std::string& s : sources) cmd += " '" + s + "'";
    CommandResult build = runCommand(cmd);
    if (build.status != 0) {
        ADD_FAILURE() << "32-bit build failed:\n" << cmd << "\n" << build.output;
        return build;
    }
    CommandResult run = runCommand("'" + exe + "'");
    // Kernels without 32-bit support refuse the program (126): run it under
    // user-mode emulation when that is installed.
    if (run.status == 126 && runCommand("command -v qemu-i386").status == 0)
        run = runCommand("qemu-i386 '" + exe + "'");
    return run;
}

std::string normaliseAddresses(const std::string& s) {
    static const std::regex addr("0x[0-9a-fA-F]+|\\b[0-9]{6,}(?=;| ->| \\[)");
    std::map<std::string, int> seen;
    std::string out;
    std::size_t last = 0;
    for (auto it = std::sregex_iterator(s.begin(), s.end(), addr); it != std::sregex_iterator(); ++it) {
        out.append(s, last, static_cast<std::size_t>(it->position()) - last);
        auto found = seen.emplace(it->str(), static_cast<int>(seen.size())).first;
        out += "@" + std::to_string(found->second);
        last = static_cast<std::size_t>(it->position() + it->length());
    }
    return out + s.substr(last);
}

bool matchesGolden(const std::string& relativePath, const std::string& text, std::string* diff) {
    fs::path path = fs::path(ZOA_TESTS_DIR) / relativePath;
    const char* update = std::getenv("ZOA_UPDATE_GOLDEN");
    if (update && std::string(update) == "1") {
        fs::create_directories(path.parent_path());
        std::ofstream(path, std::ios::binary) << text;
        return true;
    }
    std::ifstream in(path, std::ios::binary);
    if (!in) {
        *diff = "missing golden file " + path.string() + " (set ZOA_UPDATE_GOLDEN=1 to create it)";
        return false;
    }
    std::stringstream ss;
    ss << in.rdbuf();
    std::string expected = ss.str();
    if (expected == text) return true;
    std::size_t i = 0;
    while (i < expected.size() && i < text.size() && expected[i] == text[i]) ++i;
    std::size_t line = 1 + std::count(expected.begin(), expected.begin() + i, '\n');
    *diff = path.string() + " differs at byte " + std::to_string(i) + " (line " + std::to_string(line) +
            ")\n--- expected\n" + expected + "\n--- actual\n" + text;
    return false;
}

}  // namespace ZOA::testing
