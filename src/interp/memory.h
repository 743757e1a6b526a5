// The interpreter's simulated 32-bit memory: blocks for data, buffers, literals and heap.
#ifndef ZOA_INTERP_MEMORY_H
#define ZOA_INTERP_MEMORY_H

#include "interp/rules.h"

#include <cstdint>
#include <map>
#include <string>
#include <vector>

namespace ZOA::interp {

// Blocks of the simulated 32-bit memory; addresses start well above 0 so that
// null and small integers are never valid, and blocks are kept apart by gaps
// so that running off one never lands in the next.
struct Block {
    std::uint32_t size = 0;
    std::vector<unsigned char> data;
    std::vector<unsigned char> written;
    bool readOnly = false;
    bool heap = false;
};

constexpr std::uint32_t DATA_START = 0x00100000;
constexpr std::uint32_t CODE_START = 0xF0000000;  // label and function addresses
constexpr std::uint64_t MEMORY_LIMIT = 256u << 20;

// Every problem stops the run (BAD_ADDRESS, or UNDEFINED for a read of memory
// never written when `strict`).
class Memory {
public:
    explicit Memory(bool strict) : strict(strict) {}

    // A fresh zero-filled block of size bytes; heap blocks may be freed.
    std::uint32_t allocate(std::uint64_t size, bool readOnly, bool heap);
    void release(std::uint32_t base);
    // The heap block that starts at base, or null.
    const Block* heapBlockAt(std::uint32_t base) const;
    void store(std::uint32_t addr, const unsigned char* bytes, std::uint32_t n);
    void load(std::uint32_t addr, unsigned char* bytes, std::uint32_t n);
    void storeValue(std::uint32_t addr, CType t, const Value& v);
    Value loadValue(std::uint32_t addr, CType t);
    // A read-only block holding the characters of the literal the C text
    // writes for `text`, NUL-terminated.
    std::uint32_t stringBlock(const std::string& text);

    // The characters of the literal the C text writes for text; false when the
    // literal it writes ends early or its closing quote is escaped.
    static bool literalValue(const std::string& text, std::string& value);

private:
    Block& blockAt(std::uint32_t addr, std::uint32_t n, std::uint32_t& offset);

    bool strict;
    std::map<std::uint32_t, Block> mem;
    std::uint32_t nextData = DATA_START;
    std::uint64_t used = 0;
};

}  // namespace ZOA::interp

#endif
