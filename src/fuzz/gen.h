// Random units for differential and crash testing, built through the public API.
#ifndef ZOA_FUZZ_GEN_H
#define ZOA_FUZZ_GEN_H

#include <zoa/zoa.h>

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

namespace ZOA::fuzz {

enum class Mode {
    C,    // every operator and type where the C text has a defined meaning
    ASM,  // what the assembly output translates: PLUS, MINUS, MUL, relations,
          // CONV4, INT_S/INT_U/CHAR types, buffers and tables, calls, jumps
    ODD,  // odd but constructible trees: shared subtrees, empty labels,
          // statements after jumps, null SEQ sides, unused temps, deep nesting
};

// Constructs whose assembly, written by the assembly output's rules, computes
// another value than the C text means (docs/assembly-limits.md). The assembly
// mode leaves them out unless asked for.
enum AsmQuirk : unsigned {
    SIGNED_CHAR = 1,    // CHAR_S values
    MUL_RESULT = 2,     // MUL
    WIDENING = 4,       // CONV4 of a char
    MIXED_WIDTHS = 8,   // operands of another integer type than the operator's
    UNSIGNED_RELATION = 16,  // relations on INT_U / CHAR_U operands
    BYTE_MEMORY = 32,   // chars loaded or stored through an address sum
    CHAR_RELATION = 64, // relations giving a char value
    SCALED_INDEX = 128, // a MUL scaling the index in a buffer's address sum
};

// A host function taking any number of arguments, which the interpreter
// models and the campaign driver defines: int zoa_vsum(int n, ...), the
// wrapping sum of its n further int (or promoted char) arguments.
constexpr const char* VARIADIC_HOST = "zoa_vsum";

// A subprogram the driver calls, with the argument sets to call it on.
struct Entry {
    std::string name;
    DataType result = VOID;
    std::vector<DataType> params;
    std::vector<std::vector<long long>> argSets;  // FLOAT/DOUBLE params get integer values
};

struct Generated {
    std::unique_ptr<ZOA_file> unit;  // valid until the next unit is constructed
    std::vector<Entry> entries;
};

// The output the unit is made for (its ZOA_file flavour).
struct Target {
    bool isGcc = true;
    bool asmMode = false;
    // In the sound profile the C mode also draws what only that profile's C
    // means: byte offsets on table names, inexact and non-finite floating
    // constants, tables of function addresses, private mutable data,
    // alignment requests and calls of VARIADIC_HOST with varying arities.
    Profile profile = Profile::EXACT;
    // Array names step by bytes without the sound C constructs (the sound
    // assembly campaign): table indexes are scaled.
    bool namesInBytes = false;
};

// Builds the unit for `seed`; subprogram names start with `prefix`. The same
// seed, mode and prefix always give the same tree. The unit is made for GCC C,
// or for assembly in the assembly mode, unless a target is given.
Generated generate(std::uint64_t seed, Mode mode, const std::string& prefix, unsigned asmQuirks = 0);
Generated generate(std::uint64_t seed, Mode mode, const std::string& prefix, unsigned asmQuirks, Target target);

}  // namespace ZOA::fuzz

#endif
