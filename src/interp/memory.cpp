// The simulated memory: blocks, loads and stores, string literals.
#include "interp/memory.h"

#include "core/c_literal.h"

#include <cctype>
#include <cstdio>
#include <cstring>

namespace ZOA::interp {

std::uint32_t Memory::allocate(std::uint64_t size, bool readOnly, bool heap) {
    std::uint64_t rounded = (size + 15) & ~std::uint64_t{15};
    if (used + rounded > MEMORY_LIMIT || std::uint64_t{nextData} + rounded + 16 >= CODE_START)
        stop(Status::BAD_ADDRESS, "out of simulated memory");
    std::uint32_t base = nextData;
    nextData = static_cast<std::uint32_t>(nextData + rounded + 16);
    used += rounded;
    Block& b = mem[base];
    b.size = static_cast<std::uint32_t>(size);
    b.data.assign(size, 0);
    b.written.assign(size, 0);
    b.readOnly = readOnly;
    b.heap = heap;
    return base;
}
void Memory::release(std::uint32_t base) {
    auto it = mem.find(base);
    if (it == mem.end()) return;
    used -= (it->second.size + 15) & ~std::uint64_t{15};
    mem.erase(it);
}
Block& Memory::blockAt(std::uint32_t addr, std::uint32_t n, std::uint32_t& offset) {
    auto it = mem.upper_bound(addr);
    if (it != mem.begin()) {
        --it;
        std::uint64_t off = addr - it->first;
        if (off + n <= it->second.size) {
            offset = static_cast<std::uint32_t>(off);
            return it->second;
        }
    }
    char buf[80];
    std::snprintf(buf, sizeof buf, "access of %u bytes at 0x%08x outside every block", n, addr);
    stop(Status::BAD_ADDRESS, buf);
}
void Memory::store(std::uint32_t addr, const unsigned char* bytes, std::uint32_t n) {
    std::uint32_t off;
    Block& b = blockAt(addr, n, off);
    if (b.readOnly) stop(Status::BAD_ADDRESS, "store into a string literal");
    std::memcpy(b.data.data() + off, bytes, n);
    std::memset(b.written.data() + off, 1, n);
}
void Memory::load(std::uint32_t addr, unsigned char* bytes, std::uint32_t n) {
    std::uint32_t off;
    Block& b = blockAt(addr, n, off);
    for (std::uint32_t i = 0; i < n; ++i)
        if (!b.written[off + i] && strict) stop(Status::UNDEFINED, "read of memory never written");
    std::memcpy(bytes, b.data.data() + off, n);
}
bool Memory::literalValue(const std::string& text, std::string& value) {
    return cLiteralValue(text.data(), text.size(), value);
}
std::uint32_t Memory::stringBlock(const std::string& text) {
    std::string s;
    if (!literalValue(text, s)) stop(Status::NO_MEANING, "a string literal the C text cannot close");
    return bytesBlock(s);
}
std::uint32_t Memory::bytesBlock(const std::string& s) {
    std::uint32_t a = allocate(s.size() + 1, false, false);
    store(a, reinterpret_cast<const unsigned char*>(s.c_str()), static_cast<std::uint32_t>(s.size() + 1));
    mem[a].readOnly = true;
    return a;
}
void Memory::storeValue(std::uint32_t addr, CType t, const Value& v) {
    unsigned char b[8];
    unsigned n = sizeOfC(t);
    if (t == CType::FLOAT) {
        float f = static_cast<float>(v.real);
        std::memcpy(b, &f, 4);
    } else if (t == CType::DOUBLE) {
        std::memcpy(b, &v.real, 8);
    } else {
        for (unsigned i = 0; i < n; ++i) b[i] = static_cast<unsigned char>(v.bits >> (8 * i));
    }
    store(addr, b, n);
}
Value Memory::loadValue(std::uint32_t addr, CType t) {
    unsigned char b[8] = {};
    unsigned n = sizeOfC(t);
    if (n == 0) stop(Status::NO_MEANING, "load of a void value");
    load(addr, b, n);
    Value v;
    v.type = t;
    if (t == CType::FLOAT) {
        float f;
        std::memcpy(&f, b, 4);
        v.real = f;
    } else if (t == CType::DOUBLE) {
        std::memcpy(&v.real, b, 8);
    } else {
        std::uint64_t x = 0;
        for (unsigned i = 0; i < n; ++i) x |= std::uint64_t{b[i]} << (8 * i);
        v = Value::of(t, x);
    }
    return v;
}

const Block* Memory::heapBlockAt(std::uint32_t base) const {
    auto it = mem.find(base);
    return it == mem.end() || !it->second.heap ? nullptr : &it->second;
}

}  // namespace ZOA::interp
