// Runs a subprogram of a unit on given arguments, with the meaning of the C text
// the C emitter writes for it on the 32-bit target.
#ifndef ZOA_INTERP_H
#define ZOA_INTERP_H

#include <zoa/zoa_file.h>

#include <cstdint>
#include <iosfwd>
#include <memory>
#include <string>
#include <vector>

namespace ZOA::interp {

// The C type of a value: the declared types of the tree, plus what the C text
// makes of them (an array name is a pointer to its elements, or a char pointer
// for a unit in the sound profile, "(int*)" a pointer
// to int, a constant too large for int a long long).
enum class CType { SCHAR, UCHAR, INT, UINT, LLONG, ULLONG, FLOAT, DOUBLE, POINTER, VOID };

// A value: integers and addresses in `bits` (signed ones sign-extended to 64
// bits, addresses are 32-bit), FLOAT and DOUBLE in `real`. `scale` is the size
// of what a POINTER points at (1 for char *), which pointer arithmetic uses.
struct Value {
    CType type = CType::VOID;
    std::uint64_t bits = 0;
    double real = 0;
    unsigned int scale = 1;

    static Value integer(DataType t, long long v);   // v converted to t as C assignment would
    static Value floating(DataType t, double v);
    static Value pointer(std::uint32_t address);
    static Value of(CType t, std::uint64_t bits);
    long long asSigned() const { return static_cast<long long>(bits); }
};

// C type of a declared type (POINTER is char *).
CType ctypeOf(DataType t);

// Prints a value as the differential driver's C program prints it: integers in
// decimal by their signedness (chars as ints), FLOAT with "%.9g", DOUBLE with
// "%.17g", an address as "ptr", VOID as "void".
std::string format(const Value& v);

// Why a run stopped without a value.
enum class Status {
    OK,
    DIVISION_BY_ZERO,     // '/' or '%' by zero, or the most negative value by -1
    BAD_ADDRESS,          // a load, store, jump or call at an address outside every block
    UNKNOWN_FUNCTION,     // a call of a name that is neither a subprogram nor a host function
    STEP_LIMIT,           // more steps than Options::maxSteps
    DEPTH_LIMIT,          // calls or expressions nested deeper than Options::maxDepth
    UNDEFINED,            // with Options::strictC: what C leaves undefined (see there)
    NO_MEANING,           // a tree the C text gives no meaning: null children, bad kinds,
                          // a read of an unset temporary, falling off the end, ...
};

const char* toString(Status s);

struct Options {
    // Statements and expression nodes evaluated by one call, nested calls included.
    std::uint64_t maxSteps = 10000000;
    // Nesting of calls plus nesting of expressions being evaluated.
    unsigned int maxDepth = 2000;
    // Also stop, with UNDEFINED, on what a C compiler may assume never happens:
    // signed overflow, shifts by a negative count or by the width or more,
    // left shifts of negative values, floating results that are not exact in
    // their type (excess precision could change them), a floating value out
    // of the range of the integer it is converted to, and reads of memory
    // never written. Without it the tree's own meaning applies: two's
    // complement wrap-around, shift counts taken modulo the operand's width,
    // unwritten memory reads as zero.
    bool strictC = false;
    // Where the host function puts writes (nothing is written when null).
    std::ostream* out = nullptr;
};

struct Result {
    Status status = Status::OK;
    Value value;          // the return value (type VOID for a VOID subprogram)
    std::string message;  // what went wrong, for a status other than OK
    std::uint64_t steps = 0;
    bool ok() const { return status == Status::OK; }
};

// One machine for one unit: static data keeps its contents from one call to
// the next, as it does in the compiled program. Host functions: malloc, alloca,
// free, strlen, puts, abs, and zoa_vsum(int n, ...), the wrapping int sum of
// its n further arguments (each an int or a promoted char; the differential
// campaigns' driver defines it in C). Label and subprogram addresses are distinct values
// outside the data blocks. The unit must outlive the machine and must not be
// decompiled before the runs (decompile forgets the subprograms). Never throws
// on a bad tree: every problem comes back as a status.
class Machine {
public:
    explicit Machine(ZOA_file& unit, Options options = {});
    ~Machine();
    Machine(const Machine&) = delete;
    Machine& operator=(const Machine&) = delete;

    // Calls the first subprogram of that name; each argument is converted to
    // its parameter's type as C assignment would. Missing arguments are an error.
    Result call(const std::string& subprog, const std::vector<Value>& args);

private:
    struct Impl;
    std::unique_ptr<Impl> impl;
};

// One call on a fresh machine.
Result run(ZOA_file& unit, const std::string& subprog, const std::vector<Value>& args,
           const Options& options = {});

}  // namespace ZOA::interp

#endif
