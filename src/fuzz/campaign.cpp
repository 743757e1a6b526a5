// Runs generated units through the interpreter and through gcc, and compares.
#include "fuzz/campaign.h"
#include "fuzz/quiet_stdout.h"
#include "fuzz/sound_asm.h"

#include "core/type_facts.h"
#include "emit/c/c_texts.h"

#include <zoa/interp.h>
#include <zoa/text.h>
#include <zoa/verify.h>

#include <cstdio>
#include <fstream>
#include <algorithm>
#include <functional>
#include <ostream>
#include <sstream>
#include <string_view>
#include <sys/stat.h>
#include <sys/wait.h>

namespace ZOA::fuzz {

namespace {

// The C emitter's name of t, without its separating blank.
std::string cTypeName(DataType t) {
    std::string_view n = ctext::typeName(t);
    while (!n.empty() && n.back() == ' ') n.remove_suffix(1);
    return n.empty() ? "void" : std::string(n);
}
const char* printfFormat(DataType t) {
    static const char* const f[DATA_TYPE_COUNT] = {"%d", "%u", "%llu", "%d", "%d", "%lld", "%.9g", "%.17g", "ptr", "void"};
    return static_cast<unsigned>(t) < DATA_TYPE_COUNT ? f[t] : "void";
}

struct Call {
    std::string name;
    DataType result;
    std::vector<DataType> params;
    std::vector<long long> args;
    std::string line;  // what the interpreter says the program prints
};

// One unit, ready to be compiled: its C text and the calls that have a value.
struct Prepared {
    std::uint64_t seed = 0;
    std::string prefix;
    std::string text;
    std::string c;  // the C text, or the assembly text in assembly mode
    bool assembly = false;
    bool sound = false;  // in the sound profile (sound assembly: one file per unit)
    unsigned fileNames = 0;
    std::vector<Call> calls;
};

interp::Value argValue(DataType t, long long v) {
    return isFloatingType(t) ? interp::Value::floating(t, static_cast<double>(v)) : interp::Value::integer(t, v);
}

// Interprets every entry; calls that stop are left out, and the machine is
// rebuilt and replayed so that the static data matches a program that never made them.
void interpret(ZOA_file& unit, const std::vector<Entry>& entries, Prepared& p, CampaignStats* stats) {
    interp::Options o;
    o.strictC = true;
    o.maxSteps = 2000000;
    auto machine = std::make_unique<interp::Machine>(unit, o);
    for (const Entry& e : entries) {
        for (std::size_t k = 0; k < e.argSets.size(); ++k) {
            std::vector<interp::Value> args;
            for (std::size_t i = 0; i < e.params.size(); ++i) args.push_back(argValue(e.params[i], e.argSets[k][i]));
            interp::Result r = machine->call(e.name, args);
            if (r.ok()) {
                p.calls.push_back({e.name, e.result, e.params, e.argSets[k],
                                   e.name + "#" + std::to_string(k) + " " + interp::format(r.value)});
                continue;
            }
            if (stats) ++stats->dropped[std::string(interp::toString(r.status)) + ": " + r.message];
            machine = std::make_unique<interp::Machine>(unit, o);
            for (const Call& c : p.calls) {
                std::vector<interp::Value> a;
                for (std::size_t i = 0; i < c.params.size(); ++i) a.push_back(argValue(c.params[i], c.args[i]));
                machine->call(c.name, a);
            }
        }
    }
}

bool prepareUnit(ZOA_file& unit, const std::vector<Entry>& entries, Prepared& p, CampaignStats* stats,
                 std::string* problem) {
    for (const auto& d : verify::verify(unit))
        if (d.severity == verify::Severity::ERROR) {
            if (problem) *problem = verify::format(d);
            return false;
        }
    p.fileNames = static_cast<unsigned>(unit.getNames().size());
    p.assembly = unit.IsAsmMode();
    p.sound = unit.getProfile() == Profile::SOUND;
    interpret(unit, entries, p, stats);
    std::ostringstream c;
    {
        QuietStdout quiet;
        unit.decompile(c);
    }
    p.c = c.str();
    return true;
}

std::string argText(DataType t, long long v) {
    char buf[64];
    if (isFloatingType(t)) std::snprintf(buf, sizeof buf, "(%s)%lld", cTypeName(t).c_str(), v);
    else std::snprintf(buf, sizeof buf, "(%s)0x%llxULL", cTypeName(t).c_str(), static_cast<unsigned long long>(v));
    return buf;
}

int shell(const std::string& cmd, std::string* output) {
    std::string full = cmd + " 2>&1";
    FILE* f = popen(full.c_str(), "r");
    if (!f) return -1;
    char buf[4096];
    std::size_t n;
    if (output) output->clear();
    while ((n = fread(buf, 1, sizeof buf, f)) > 0)
        if (output && output->size() < (1u << 22)) output->append(buf, n);
    int st = pclose(f);
    return WIFEXITED(st) ? WEXITSTATUS(st) : 128 + (WIFSIGNALED(st) ? WTERMSIG(st) : 0);
}

void writeText(const std::string& path, const std::string& text) {
    std::ofstream(path, std::ios::binary) << text;
}

bool isRegister(const std::string& w) {
    static const char* const regs[] = {"eax", "ebx", "ecx", "edx", "esi", "edi", "ebp", "esp",
                                       "al", "ah", "bl", "bh", "cl", "ch", "dl", "dh"};
    for (const char* r : regs)
        if (w == r) return true;
    return false;
}
bool isNumbered(const std::string& w, std::size_t prefixLen) {
    if (w.size() <= prefixLen) return false;
    for (std::size_t i = prefixLen; i < w.size(); ++i)
        if (w[i] < '0' || w[i] > '9') return false;
    return true;
}

// Makes one unit's assembly assemblable next to other units in one file: GNU as
// refuses a size keyword on a register operand, so "BYTE PTR " and "DWORD PTR "
// before a register go; labels (.La<n>) and frame offsets (t<n>) are numbered
// per subprogram, so each subprogram gets its own; file-level data names
// (ng<n>) get the unit's prefix.
void appendAssemblable(std::string& out, const std::string& text, const std::string& prefix) {
    unsigned sub = 0;
    std::string word;
    auto wordChar = [](char c) {
        return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') || c == '_' || c == '.';
    };
    static const std::string startMark = ".intel_syntax noprefix";
    for (std::size_t i = 0; i < text.size();) {
        if (text.compare(i, startMark.size(), startMark) == 0) ++sub;
        if (!wordChar(text[i]) || (i > 0 && wordChar(text[i - 1]))) {
            out += text[i++];
            continue;
        }
        std::size_t j = i;
        while (j < text.size() && wordChar(text[j])) ++j;
        word.assign(text, i, j - i);
        if ((word == "BYTE" || word == "DWORD") && text.compare(j, 5, " PTR ") == 0) {
            std::size_t k = j + 5, e = k;
            while (e < text.size() && wordChar(text[e])) ++e;
            if (isRegister(text.substr(k, e - k))) {
                i = k;
                continue;
            }
        }
        if (word[0] == 't' && isNumbered(word, 1)) out += "t" + prefix + std::to_string(sub) + "_" + word.substr(1);
        else if (word.compare(0, 3, ".La") == 0 && isNumbered(word, 3)) out += ".L" + prefix + std::to_string(sub) + "_" + word.substr(3);
        else if (word.compare(0, 2, "ng") == 0 && isNumbered(word, 2)) out += prefix + word;
        else out += word;
        i = j;
    }
    out += "\n";
}

struct BuildResult {
    bool built = false;
    std::string detail;  // compiler message or first difference
    bool same = false;
};

// Compiles the units with their driver at one level, runs and compares.
BuildResult buildAndCompare(const std::vector<const Prepared*>& units, const std::string& dir,
                            const std::string& level) {
    std::string units_c, driver_c, expected;
    bool soundC = !units.empty() && units.front()->sound && !units.front()->assembly;
    // The sound text defines the types itself.
    if (!soundC) units_c = "typedef long long int64;\ntypedef unsigned long long uint64;\n";
    driver_c = "#include <stdio.h>\n#include <stdarg.h>\ntypedef long long int64;\ntypedef unsigned long long uint64;\n";
    // The variadic host function the sound units call (the interpreter models it).
    if (!units.empty() && units.front()->sound)
        driver_c += std::string("int ") + VARIADIC_HOST +
                    "(int n, ...)\n{\n    va_list ap;\n    unsigned s = 0;\n    va_start(ap, n);\n"
                    "    while (n-- > 0) s += (unsigned)va_arg(ap, int);\n    va_end(ap);\n    return (int)s;\n}\n";
    std::string body;
    std::string units_s;
    std::vector<const std::string*> soundTexts;
    for (const Prepared* p : units) {
        if (p->sound && p->assembly) soundTexts.push_back(&p->c);
        else if (p->assembly) appendAssemblable(units_s, p->c, p->prefix);
        // File-level names are ng<id> in every unit: keep each unit's apart.
        for (unsigned k = 0; k < p->fileNames; ++k)
            units_c += "#define ng" + std::to_string(k) + " " + p->prefix + "ng" + std::to_string(k) + "\n";
        if (!p->assembly) units_c += p->c;
        for (unsigned k = 0; k < p->fileNames; ++k) units_c += "#undef ng" + std::to_string(k) + "\n";
        std::string declared;
        for (const Call& c : p->calls) {
            std::string proto = cTypeName(c.result) + " " + c.name + "(";
            for (std::size_t i = 0; i < c.params.size(); ++i) proto += (i ? ", " : "") + cTypeName(c.params[i]);
            proto += ");\n";
            if (declared.find(proto) == std::string::npos) declared += proto;
            std::string call = c.name + "(";
            for (std::size_t i = 0; i < c.params.size(); ++i) call += (i ? ", " : "") + argText(c.params[i], c.args[i]);
            call += ")";
            std::string label = c.line.substr(0, c.line.find(' ') + 1);
            if (c.result == VOID)
                body += "    " + call + "; puts(\"" + label + "void\");\n";
            else
                body += "    printf(\"" + label + printfFormat(c.result) + "\\n\", " +
                        (isByteType(c.result) ? "(int)" : c.result == FLOAT ? "(double)" : "") +
                        call + ");\n";
            expected += c.line + "\n";
        }
        driver_c += declared;
    }
    driver_c += "int main(void)\n{\n" + body + "    return 0;\n}\n";
    bool assembly = !units.empty() && units.front()->assembly;
    bool sound = !units.empty() && units.front()->sound;
    std::string unitsFile = dir + (assembly ? "/units.s" : "/units.c");
    if (sound && assembly) unitsFile = writeSoundAsmFiles(soundTexts, dir);
    else writeText(unitsFile, assembly ? units_s : units_c);
    writeText(dir + "/driver.c", driver_c);
    BuildResult r;
    std::string out;
    std::string prog = dir + "/prog" + level;
    // The assembly is position-dependent (OFFSET FLAT:) and assumes nothing of
    // the stack's alignment at a call.
    std::string flags = assembly ? (sound ? soundAsmLinkFlags() : " -no-pie -mstackrealign") : " -fno-strict-aliasing";
    if (sound && !assembly && level == "-O0" &&
        shell("gcc -m32 -c -std=gnu99 -Wall -Werror -Wno-unused-label -Wno-unused-variable "
              "-Wno-unused-but-set-variable -o " + dir + "/units.o " + unitsFile, &out) != 0) {
        r.detail = "not clean under -Wall -Werror: " + out.substr(0, 2000);
        return r;
    }
    if (shell("gcc -m32 " + level + " -w" + flags + " -o " + prog + " " + unitsFile + " " + dir + "/driver.c", &out) != 0) {
        r.detail = out.substr(0, 2000);
        return r;
    }
    r.built = true;
    // Where the kernel cannot run 32-bit programs, qemu-i386 runs them.
    static const std::string runner =
        shell("bash -c '" + prog + " >/dev/null'", nullptr) == 126 && shell("command -v qemu-i386", nullptr) == 0
            ? "qemu-i386 " : "";
    int st = shell("timeout 20 " + runner + prog, &out);
    if (out == expected && st == 0) {
        r.same = true;
        return r;
    }
    std::istringstream a(out), b(expected);
    std::string la, lb;
    for (;;) {
        bool ga = static_cast<bool>(std::getline(a, la)), gb = static_cast<bool>(std::getline(b, lb));
        if (!ga && !gb) break;
        if (!ga || !gb || la != lb) {
            r.detail = (assembly ? "assembled: " : "compiled (" + level + "): ") + (ga ? la : "<nothing, exit " + std::to_string(st) + ">") +
                       "\ninterpreted: " + (gb ? lb : "<nothing>");
            break;
        }
    }
    if (r.detail.empty()) r.detail = "exit status " + std::to_string(st);
    return r;
}

// Re-checks one unit given as text, for the shrinker.
bool textFails(const std::string& text, const std::vector<Entry>& entries, const std::string& prefix,
               const std::string& dir, const std::vector<std::string>& levels, const std::string& kind,
               Profile profile, bool assembly) {
    text::Result parsed = text::parse(text, "reduced.zoa", text::Flavour{true, assembly});
    if (!parsed.ok()) return false;
    // The text form does not keep private data apart: a reduced sound unit may merge it.
    parsed.unit()->setProfile(profile);
    Prepared p;
    p.prefix = prefix;
    if (!prepareUnit(*parsed.unit(), entries, p, nullptr, nullptr) || p.calls.empty()) return false;
    for (const std::string& level : levels) {
        BuildResult r = buildAndCompare({&p}, dir, level);
        if (kind == "build" ? !r.built : (r.built && !r.same)) return true;
    }
    return false;
}

}  // namespace

CampaignStats runDifferential(const CampaignOptions& o) {
    CampaignStats stats;
    mkdir(o.workDir.c_str(), 0755);
    std::vector<Prepared> batch;
    std::vector<std::vector<Entry>> batchEntries;
    unsigned shrunk = 0;
    // Only the driver is compiled in assembly mode: one level is enough.
    const std::vector<std::string> levels =
        o.mode == Mode::ASM || o.soundAsm ? std::vector<std::string>{"-O0"} : o.optLevels;

    auto flush = [&]() {
        if (batch.empty()) return;
        std::vector<const Prepared*> all;
        for (const Prepared& p : batch) all.push_back(&p);
        bool allSame = true;
        for (const std::string& level : levels) {
            BuildResult r = buildAndCompare(all, o.workDir, level);
            ++stats.programsBuilt;
            allSame = allSame && r.same;
        }
        if (!allSame) {  // isolate the failing units
            for (std::size_t i = 0; i < batch.size(); ++i) {
                for (const std::string& level : levels) {
                    BuildResult r = buildAndCompare({&batch[i]}, o.workDir, level);
                    if (r.same) continue;
                    Failure f{batch[i].seed, r.built ? "mismatch" : "build", r.detail, batch[i].text, ""};
                    std::string base = o.workDir + "/seed-" + std::to_string(f.seed);
                    writeText(base + ".zoa", f.text);
                    if (o.log) *o.log << "seed " << f.seed << ": " << f.kind << "\n" << f.detail << "\n  unit: " << base << ".zoa\n";
                    if (shrunk < o.shrinkLimit) {
                        ++shrunk;
                        std::vector<Entry> entries = batchEntries[i];
                        std::string prefix = batch[i].prefix, kind = f.kind;
                        f.reduced = shrink(f.text, [&](const std::string& t) {
                            return textFails(t, entries, prefix, o.workDir, levels, kind,
                                             o.soundAsm ? Profile::SOUND : o.profile, o.soundAsm);
                        }, 800);
                        writeText(base + ".min.zoa", f.reduced);
                        if (o.log) *o.log << "  reduced: " << base << ".min.zoa\n";
                    }
                    stats.failures.push_back(f);
                    break;
                }
            }
        }
        for (const Prepared& p : batch) stats.callsCompared += static_cast<unsigned>(p.calls.size());
        batch.clear();
        batchEntries.clear();
    };

    for (unsigned i = 0; i < o.seeds; ++i) {
        std::uint64_t seed = o.firstSeed + i;
        Prepared p;
        p.seed = seed;
        p.prefix = "u" + std::to_string(seed) + "_";
        // The sound assembly runs the sound C mode's units (calls of one name
        // with several arities, private and aligned data), names stepping by bytes.
        Target target{true, o.mode == Mode::ASM || o.soundAsm,
                      o.soundAsm ? Profile::SOUND : o.mode == Mode::C ? o.profile : Profile::EXACT, o.soundAsm};
        Generated g = generate(seed, o.mode, p.prefix, o.asmQuirks, target);
        if (o.soundAsm) g.unit->setProfile(Profile::SOUND);
        p.text = text::write(*g.unit);
        stats.seeds++;
        stats.subprogs += static_cast<unsigned>(g.entries.size());
        std::string problem;
        if (!prepareUnit(*g.unit, g.entries, p, &stats, &problem)) {
            stats.failures.push_back({seed, "invalid unit", problem, p.text, ""});
            if (o.log) *o.log << "seed " << seed << ": the generator made an invalid unit: " << problem << "\n";
            continue;
        }
        batch.push_back(std::move(p));
        batchEntries.push_back(g.entries);
        if (batch.size() >= o.batch) flush();
        if (o.log && (i + 1) % 200 == 0) *o.log << (i + 1) << " seeds, " << stats.failures.size() << " failures\n" << std::flush;
    }
    flush();
    return stats;
}

void report(std::ostream& os, const CampaignOptions& o, const CampaignStats& s) {
    unsigned dropped = 0;
    for (const auto& [why, n] : s.dropped) dropped += n;
    os << "seeds " << o.firstSeed << ".." << (o.firstSeed + o.seeds - 1) << ": " << s.seeds << " units, "
       << s.subprogs << " subprograms, " << s.callsCompared << " calls compared";
    if (o.soundAsm) os << " with the sound assembly";
    else if (o.mode == Mode::ASM) os << " with the assembly output";
    else {
        if (o.profile == Profile::SOUND) os << " in the sound profile";
        os << " at each of";
        for (const std::string& l : o.optLevels) os << ' ' << l;
    }
    os << ", " << dropped << " calls without a C meaning left out, " << s.programsBuilt << " programs built, "
       << s.failures.size() << " failures\n";
    std::vector<std::pair<unsigned, std::string>> reasons;
    for (const auto& [why, n] : s.dropped) reasons.push_back({n, why});
    std::sort(reasons.rbegin(), reasons.rend());
    for (std::size_t i = 0; i < reasons.size() && i < 8; ++i)
        os << "  left out " << reasons[i].first << "x: " << reasons[i].second << "\n";
    for (const Failure& f : s.failures) os << "  seed " << f.seed << ": " << f.kind << ": " << f.detail << "\n";
}

}  // namespace ZOA::fuzz
