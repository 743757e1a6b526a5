// The host functions a unit may call: malloc, alloca, free, strlen, puts, abs and zoa_vsum.
#include "interp/machine.h"

#include <ostream>

namespace ZOA::interp {

Value Machine::Impl::host(const std::string& name, const std::vector<Value>& args, DataType type) {
    auto need = [&](std::size_t n) {
        if (args.size() != n) stop(Status::NO_MEANING, name + " with a wrong number of arguments");
    };
    CType rt = ctypeOf(type);
    if (name == "malloc" || name == "alloca") {
        need(1);
        std::uint64_t n = args[0].type == CType::POINTER || isInt(args[0].type) ? (args[0].bits & 0xffffffffu) : 0;
        if (name == "malloc" && n > (64u << 20)) return convert(Value::pointer(0), rt);
        std::uint32_t a = allocate(n, false, name == "malloc");
        if (name == "alloca") {
            if (!frame) stop(Status::NO_MEANING, "alloca outside a subprogram");
            frame->owned.push_back(a);
        }
        return convert(Value::pointer(a), rt);
    }
    if (name == "free") {
        need(1);
        std::uint32_t a = static_cast<std::uint32_t>(args[0].bits);
        if (a == 0) return Value{};
        if (!heapBlockAt(a)) stop(Status::BAD_ADDRESS, "free of an address malloc did not give");
        release(a);
        return rt == CType::VOID ? Value{} : convert(Value::of(CType::INT, 0), rt);
    }
    if (name == "strlen") {
        need(1);
        return convert(Value::of(CType::UINT, readString(static_cast<std::uint32_t>(args[0].bits)).size()), rt);
    }
    if (name == "puts") {
        need(1);
        std::string s = readString(static_cast<std::uint32_t>(args[0].bits));
        if (opt.out) *opt.out << s << '\n';
        return rt == CType::VOID ? Value{} : convert(Value::of(CType::INT, s.size() + 1), rt);
    }
    if (name == "abs") {
        need(1);
        Value x = convert(args[0], CType::INT);
        return convert(intResult(CType::INT, x.bits & 0x80000000u ? -wide(x) : wide(x)), rt);
    }
    if (name == "zoa_vsum") {
        // int zoa_vsum(int n, ...): the n further arguments, each read back as
        // the int C's promotions make of it, summed with wrap-around.
        if (args.empty()) stop(Status::NO_MEANING, name + " without its count");
        Value n = convert(args[0], CType::INT);
        if (static_cast<long long>(n.bits) != static_cast<long long>(args.size() - 1))
            stop(Status::NO_MEANING, name + " with a count other than its arguments");
        std::uint32_t sum = 0;
        for (std::size_t i = 1; i < args.size(); ++i) {
            if (!isInt(args[i].type) || bitsOf(args[i].type) > 32)
                stop(Status::NO_MEANING, name + " with an argument of type " + ctypeName(args[i].type) + ", not read back as an int");
            sum += static_cast<std::uint32_t>(convert(args[i], CType::INT).bits);
        }
        return convert(Value::of(CType::INT, sum), rt);
    }
    stop(Status::UNKNOWN_FUNCTION, "call of unknown function " + name);
}

std::string Machine::Impl::readString(std::uint32_t addr) {
    std::string s;
    for (;;) {
        unsigned char c;
        load(addr++, &c, 1);
        if (!c) return s;
        s += static_cast<char>(c);
        tick();
    }
}

}  // namespace ZOA::interp
