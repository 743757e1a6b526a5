// The sound assembly's hard parts against the interpreter: every conversion pair,
// every operator on every type and mixed types, x87 results, nested calls and alignment.
#include "sound_util.h"

#include "core/type_facts.h"

#include <zoa/interp.h>

#include <cinttypes>
#include <cstdio>
#include <functional>
#include <sstream>

using namespace ZOA;
using namespace ZOA::testing;

namespace {

const DataType VALUE_TYPES[] = {CHAR_S, CHAR_U, INT_S, INT_U, INT64_S, INT64_U, FLOAT, DOUBLE, POINTER};

// A call of one subprogram of the unit on one set of arguments.
struct Call {
    std::string name;
    std::vector<interp::Value> args;
};

// What the driver prints for a value: integers in decimal, reals with 17 digits,
// addresses as unsigned numbers.
std::string shown(const interp::Value& v) {
    char buf[64];
    switch (v.type) {
    case interp::CType::FLOAT:
    case interp::CType::DOUBLE: std::snprintf(buf, sizeof buf, "%.17g", v.real); break;
    case interp::CType::SCHAR:
    case interp::CType::INT:
    case interp::CType::LLONG: std::snprintf(buf, sizeof buf, "%lld", v.asSigned()); break;
    default: std::snprintf(buf, sizeof buf, "%llu", static_cast<unsigned long long>(v.bits)); break;
    }
    return buf;
}

std::string cArg(DataType t, const interp::Value& v) {
    char buf[96];
    if (isFloatingType(t)) std::snprintf(buf, sizeof buf, "(%s)%a", cTypeName(t).c_str(), v.real);
    else std::snprintf(buf, sizeof buf, "(%s)0x%llxULL", cTypeName(t).c_str(), static_cast<unsigned long long>(v.bits));
    return buf;
}

std::string cShow(DataType t, const std::string& label, const std::string& call) {
    std::string p = "printf(\"" + label + " ";
    switch (t) {
    case FLOAT:
    case DOUBLE: return p + "%.17g\\n\", (double)" + call + ");";
    case CHAR_S:
    case INT_S:
    case INT64_S: return p + "%lld\\n\", (long long)" + call + ");";
    case POINTER: return p + "%llu\\n\", (unsigned long long)(unsigned)" + call + ");";
    default: return p + "%llu\\n\", (unsigned long long)" + call + ");";
    }
}

// The lines that differ, at most ten, or nothing.
std::string differences(const std::string& got, const std::string& want) {
    std::istringstream a(got), b(want);
    std::string la, lb, d;
    int shown = 0;
    while (shown < 10) {
        bool ga = static_cast<bool>(std::getline(a, la)), gb = static_cast<bool>(std::getline(b, lb));
        if (!ga && !gb) break;
        if (ga && gb && la == lb) continue;
        d += "assembly: " + (ga ? la : "<end>") + "\ninterpreter: " + (gb ? lb : "<end>") + "\n";
        ++shown;
    }
    return d;
}

// Runs every call in the interpreter; those with a value are called by a C
// driver of the sound assembly, which must print the same. Returns the
// number of calls compared.
unsigned compareWithInterpreter(ZOA_file& unit, const std::vector<Call>& calls) {
    std::string body, expected;
    unsigned compared = 0;
    {
        interp::Machine m(unit);
        for (const Call& c : calls) {
            interp::Result r = m.call(c.name, c.args);
            if (!r.ok()) continue;  // no C meaning (division by zero, out of range, ...)
            SUBPROG* sp = nullptr;
            for (SUBPROG* s : unit.getSubprogs())
                if (s->getName() == c.name.c_str()) sp = s;
            std::string call = c.name + "(";
            std::size_t i = 0;
            for (TEMP* t : sp->getAllArgTemps()) call += (i ? ", " : "") + cArg(t->getDataType(), c.args[i]), ++i;
            call += ")";
            std::string label = call;
            for (char& ch : label)
                if (ch == '"' || ch == '%') ch = '_';
            body += "    " + cShow(sp->getReturnType(), label, call) + "\n";
            expected += label + " " + shown(r.value) + "\n";
            ++compared;
        }
    }
    std::string driver = "#include <stdio.h>\n" + prototypes(unit) + "int main(void) {\n" + body + "    return 0;\n}\n";
    std::string text = soundAsm(unit);
    EXPECT_EQ(differences(runWithC({text}, {driver}), expected), "");
    return compared;
}

std::vector<interp::Value> samples(DataType t) {
    std::vector<interp::Value> v;
    if (isFloatingType(t)) {
        for (double d : {0.0, 2.5, -3.75, 1e-3, 123456.789, -2147483648.0, 3e9, 1.5e19, -0.0})
            v.push_back(interp::Value::floating(t, d));
        return v;
    }
    if (t == POINTER) {
        for (long long x : {0LL, 4096LL, 0xfffffff0LL}) v.push_back(interp::Value::pointer(static_cast<std::uint32_t>(x)));
        return v;
    }
    for (long long x : {0LL, 1LL, -1LL, 127LL, 200LL, -129LL, 65535LL, 0x7fffffffLL, 0x80000000LL, -5000000000LL,
                        0x7fffffffffffffffLL, static_cast<long long>(0x8000000000000001ULL), 33LL, 63LL})
        v.push_back(interp::Value::integer(t, x));
    return v;
}

// Every pair of value types through a conversion written without a cast, and
// every cast conversion from every type.
TEST(SoundAsmOps, ConversionsBetweenEveryPairOfTypes) {
    ZOA_file unit(true, true);
    std::vector<Call> calls;
    int n = 0;
    auto add = [&](DataType from, DataType to, UnopKind op) {
        if ((from == POINTER && isFloatingType(to)) || (to == POINTER && isFloatingType(from))) return;
        std::string name = "cv" + std::to_string(n++);
        SUBPROG* sp = unit.createSubprog(to, name.c_str(), false);
        TEMP* x = sp->getArgTemp(from);
        sp->getStartLabel()->addStmt(new MOVE(sp->getReturnTemp(), new UNOP(to, op, x)));
        for (const interp::Value& v : samples(from)) calls.push_back({name, {v}});
    };
    for (DataType from : VALUE_TYPES) {
        for (DataType to : VALUE_TYPES) add(from, to, CONV5);
        for (int op = CONV4; op <= CONV26; ++op) add(from, INT64_S, static_cast<UnopKind>(op));
    }
    EXPECT_GT(compareWithInterpreter(unit, calls), 900u);
}

// Every operator on two operands of each type, and on pairs of mixed types.
TEST(SoundAsmOps, OperatorsOnEveryTypeAndMixedTypes) {
    ZOA_file unit(true, true);
    std::vector<Call> calls;
    int n = 0;
    auto add = [&](DataType a, DataType b, BinopKind op, DataType result) {
        std::string name = "op" + std::to_string(n++);
        SUBPROG* sp = unit.createSubprog(result, name.c_str(), false);
        TEMP* x = sp->getArgTemp(a);
        TEMP* y = sp->getArgTemp(b);
        sp->getStartLabel()->addStmt(new MOVE(sp->getReturnTemp(), new BINOP(result, op, x, y)));
        std::vector<interp::Value> sa = samples(a), sb = samples(b);
        for (std::size_t i = 0; i < sa.size(); ++i)
            for (std::size_t j = i % 3; j < sb.size(); j += 3) calls.push_back({name, {sa[i], sb[j]}});
    };
    const BinopKind ops[] = {PLUS, MINUS, MUL, DIV, MOD, AND, OR, EQ, NE, LT, LE, GT, GE,
                             LSHIFT, RSHIFT, BITWISE_AND, BITWISE_OR, XOR};
    for (DataType t : VALUE_TYPES) {
        if (t == POINTER) continue;
        for (BinopKind op : ops) {
            if (isFloatingType(t) && (op == MOD || op >= LSHIFT)) continue;
            add(t, t, op, t);
        }
    }
    const DataType mixes[][2] = {{INT_S, INT_U}, {CHAR_S, INT_U}, {INT64_S, INT_U}, {INT_S, INT64_U},
                                 {CHAR_U, INT64_S}, {FLOAT, INT64_U}, {DOUBLE, INT_U}, {FLOAT, DOUBLE}};
    for (auto& m : mixes)
        for (BinopKind op : {PLUS, MINUS, MUL, DIV, LT, GE, EQ})
            add(m[0], m[1], op, isFloatingType(m[0]) ? DOUBLE : INT64_S);
    for (BinopKind op : {EQ, LT, GT, MINUS}) add(POINTER, POINTER, op, INT_S);
    add(POINTER, INT_S, PLUS, POINTER);
    EXPECT_GT(compareWithInterpreter(unit, calls), 2000u);
}

// ABS, NEG, NOT and BITWISE_NOT on every type, FLOAT results rounded like C's.
TEST(SoundAsmOps, UnaryOperatorsAndX87Results) {
    ZOA_file unit(true, true);
    std::vector<Call> calls;
    int n = 0;
    for (DataType t : VALUE_TYPES) {
        if (t == POINTER) continue;
        for (UnopKind op : {ABS, NEG, NOT, BITWISE_NOT}) {
            if (isFloatingType(t) && op == BITWISE_NOT) continue;
            std::string name = "un" + std::to_string(n++);
            DataType rt = op == NOT ? INT_S : t;
            SUBPROG* sp = unit.createSubprog(rt, name.c_str(), false);
            TEMP* x = sp->getArgTemp(t);
            sp->getStartLabel()->addStmt(new MOVE(sp->getReturnTemp(), new UNOP(rt, op, x)));
            for (const interp::Value& v : samples(t)) calls.push_back({name, {v}});
        }
    }
    // (a * b + c) / d in FLOAT: each step rounded to float.
    SUBPROG* sp = unit.createSubprog(FLOAT, "fmix", false);
    TEMP* a = sp->getArgTemp(FLOAT);
    TEMP* b = sp->getArgTemp(DOUBLE);
    sp->getStartLabel()->addStmt(new MOVE(
        sp->getReturnTemp(),
        new BINOP(FLOAT, DIV, new BINOP(FLOAT, PLUS, new BINOP(FLOAT, MUL, a, a), new UNOP(FLOAT, CONV13, b)), a)));
    for (double x : {1.1, 3.3, -7.25, 1e-20})
        calls.push_back({"fmix", {interp::Value::floating(FLOAT, x), interp::Value::floating(DOUBLE, x / 3)}});
    EXPECT_GT(compareWithInterpreter(unit, calls), 350u);
}

// Calls nested in arguments, of every argument kind, through a name and a pointer.
TEST(SoundAsmOps, NestedCalls) {
    ZOA_file unit(true, true);
    SUBPROG* mix = unit.createSubprog(DOUBLE, "mix", false);
    {
        TEMP* c = mix->getArgTemp(CHAR_S);
        TEMP* l = mix->getArgTemp(INT64_S);
        TEMP* f = mix->getArgTemp(FLOAT);
        TEMP* d = mix->getArgTemp(DOUBLE);
        TEMP* u = mix->getArgTemp(INT_U);
        mix->getStartLabel()->addStmt(new MOVE(
            mix->getReturnTemp(),
            new BINOP(DOUBLE, PLUS, new BINOP(DOUBLE, MUL, new BINOP(INT64_S, PLUS, c, l), f),
                      new BINOP(DOUBLE, MINUS, d, u))));
    }
    SUBPROG* top = unit.createSubprog(DOUBLE, "nest", false);
    {
        TEMP* x = top->getArgTemp(INT_S);
        TEMP* fp = top->getTemp(POINTER, 0, IN_USE_TEMP);
        top->getStartLabel()->addStmt(new MOVE(fp, unit.getName(SUBPROG_REF, "mix")));
        CALL* inner = new CALL(DOUBLE, fp,
                               {new UNOP(CHAR_S, CONV7, x), new UNOP(INT64_S, CONV24, x), new CONST(FLOAT, 0.5),
                                new CONST(DOUBLE, 0.25), new UNOP(INT_U, CONV17, x)});
        CALL* outer = new CALL(DOUBLE, "mix",
                               {new UNOP(CHAR_S, CONV7, new BINOP(INT_S, PLUS, x, new CONST(1))),
                                new BINOP(INT64_S, MUL, new UNOP(INT64_S, CONV24, x), new CONST(3000000000LL)),
                                new UNOP(FLOAT, CONV13, inner), inner, new CONST(INT_U, 7u)});
        top->getStartLabel()->addStmt(new MOVE(top->getReturnTemp(), outer));
    }
    std::vector<Call> calls;
    for (int v : {0, 1, -5, 300, 100000}) calls.push_back({"nest", {interp::Value::integer(INT_S, v)}});
    EXPECT_EQ(compareWithInterpreter(unit, calls), 5u);
}

// gcc-compiled callees find the stack 16-byte aligned however deep the
// operands and arguments around the call are.
TEST(SoundAsmOps, StackAlignedAtEveryCall) {
    ZOA_file unit(true, true);
    SUBPROG* sp = unit.createSubprog(INT_S, "deep", false);
    TEMP* x = sp->getArgTemp(INT_S);
    auto probe = [&](ExprBase* arg) { return new CALL(INT_S, "zoa_aligned", {arg}); };
    ExprBase* e = probe(x);
    for (int k = 0; k < 6; ++k)
        e = new BINOP(INT_S, PLUS, new UNOP(INT64_S, CONV24, x),
                      new CALL(INT64_S, "zoa_aligned64", {new CONST(DOUBLE, 1.0), e, new BINOP(INT_S, PLUS, x, probe(x))}));
    sp->getStartLabel()->addStmt(new MOVE(sp->getReturnTemp(), e));
    std::string text = soundAsm(unit);
    std::string driver =
        "#include <stdio.h>\n"
        "static int bad;\n"
        // In the callee itself: gcc calls a static function of its own file unaligned.
        "#define CHECK() if (((unsigned)__builtin_frame_address(0) + 8) % 16) bad++\n"
        "int zoa_aligned(int x) { CHECK(); return x; }\n"
        "long long zoa_aligned64(double d, int a, int b) { CHECK(); return (long long)d + a + b; }\n"
        "int deep(int);\n"
        "int main(void) { int r = deep(1); printf(\"%d %d\\n\", r, bad); return 0; }\n";
    EXPECT_EQ(runWithC({text}, {driver}), "25 0\n");
}

}  // namespace
