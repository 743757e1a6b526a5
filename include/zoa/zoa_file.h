// ZOA_file: one translation unit, its subprograms, file-level names and prototypes.
#ifndef ZOA_ZOA_FILE_H
#define ZOA_ZOA_FILE_H

#include <zoa/enums.h>
#include <zoa/export.h>
#include <zoa/expr.h>
#include <zoa/memmgr.h>
#include <zoa/subprog.h>

#include <iosfwd>
#include <list>
#include <map>
#include <string>

namespace ZOA {

// Which texts the outputs write.
//  - EXACT (the default): the library's fixed texts, byte for byte, as golden
//    tests and existing clients expect them, quirks included.
//  - SOUND: every output means what the tree means and works as written: the
//    C compiles on its own with gcc -m32 and computes what the tree says, the
//    assembly assembles with GNU as, the DOT renders with Graphviz, and two
//    runs of a dump give the same bytes. Diagnostic texts (node statistics,
//    notes) go to the diagnostic stream, never into the output.
enum class Profile { EXACT, SOUND };

// Constructing a ZOA_file rewinds the arena: every node of an earlier unit is
// given up. Build, output and abandon one unit at a time, on one thread.
//
// Misuse the library catches, and what it cannot:
//  - A unit whose arena was rewound under it (a later ZOA_file was constructed,
//    or MemMgr::rewind called, while it was alive) is stale: isCurrent() is
//    false, and decompile, dumpDot and dumpAscii write nothing to the output
//    stream, put one line on the diagnostic stream and return false. The unit
//    itself still exists; only its nodes are gone.
//  - A node kept from an earlier unit and put into a later unit's tree is not
//    detected (a node carries no stamp of its unit): its bytes belong to the
//    later unit's nodes, and may now form a cycle. The outputs still finish on
//    such a tree, as on any pointer graph (see below), but what they write for
//    the stale node means nothing.
//
// Output operations write onto the caller's stream and return true (false
// only for a stale unit, see above):
//  - decompile: C source (GCC flavour when isGcc, MSVC otherwise) or, in
//    assembly mode, 32-bit x86 assembly for the GNU assembler (Intel syntax).
//    Afterwards the unit forgets its subprograms, file-level names and call
//    prototypes; a second decompile writes only the remaining prototypes.
//    The C uses the type names uint64 and int64 without defining them. Where
//    the tree leaves the C open it stays compilable: a STATIC_DATA_REF made
//    from a constant is referred to as ng<id>/nl<id>, as it is defined; a data
//    name without values is defined as "static char ng<id>[1];" (arrays) or
//    "static <type><text>;" (static data); a string literal inside an array
//    initializer is written as the quoted literal; in the MSVC flavour a label
//    address moved into a temporary is stored with "MOV t<id>, EAX". Missing
//    (null) children print as nothing.
//    In assembly, a NAME is written as .La<id> (label address), its text
//    (function, extern and text-made data names) or ng<id>/nl<id>; data and
//    string names are addresses ("OFFSET FLAT:sym"), static and extern data
//    are dword values ("DWORD PTR sym"). A null POINTER constant is 0.
//    In the sound profile the assembly comes from a back end of its own: it
//    assembles with `as --32` as written, is position independent (links into
//    PIE and non-PIE programs) and computes what the C means, with array
//    names stepping by bytes. Where the tree leaves C open: a data name made
//    from a text without values is a private one-byte object; a POINTER
//    constant holding text is written as that operand text; a missing child
//    reads as zero; a jump without a target and control falling off the last
//    label stop at ud2; alloca takes its memory below the operands of the
//    statement, which move down with the stack.
//  - dumpDot: one Graphviz digraph per subprogram; node statistics go to the
//    diagnostic stream. Operators beyond the classic ones are labelled
//    with their enumerator names ("BITWISE_AND", "CONV4"), a POINTER constant
//    holding a null pointer with "(char *)0"; null children get no edge.
//  - dumpAscii: an indented text dump of every subprogram. Every line ends with
//    std::endl; addresses identify the nodes; the stream's flags apply to the
//    numbers. A label met again on its own jump path is written without its
//    statement beneath (so jump cycles terminate); a null child shows a null
//    identity and no block; a null POINTER constant shows "Value: (char *)0";
//    a call with neither name nor pointer shows "Function Pointer: " and an
//    empty line. An annotation shows as "class " and the qualified name of its
//    dynamic C++ class (e.g. "class tools::Note"), from run-time type information.
//
// Any pointer graph a client can build is written in finite time and stack,
// including cycles made with the nodes' copy assignments (`*s = SEQ(s, 0)`,
// `*b = BINOP(INT_S, PLUS, b, y)`). Every walk follows at most MAX_WALK_DEPTH
// (zoa/nesting.h) levels of children; where a walk reaches that bound the
// rest of what it was writing for the statement of a label (for the dumps:
// the subprogram's label) is left out, and the outputs say so with CUT_NOTE:
// the C inside "/* */" in place of the expression or statement, the assembly
// on a "# " line, the ASCII dump on a line of its own. The DOT graph leaves
// the nodes below out. A SEQ that contains itself ends the trace ordering of
// the label that reached it; every label is still printed. Trees within the
// bound print whole and exactly as before.
//
// In the sound profile (see Profile):
//  - decompile (C): first refuses, with one "error: sound C: ..." line per
//    problem on the diagnostic stream and nothing written (the unit keeps its
//    contents; returns false): a subprogram, called function or function or
//    data name text that is not a C identifier, is a C keyword or is spelled
//    like a name the output makes (t<n>, LAB<n>, ng<n>, nl<n>, int64,
//    uint64, zoa_builtin_*); a text naming both a function and data, or data of two kinds;
//    two subprograms of one name; a call with no name and no pointer; a POINTER
//    constant holding C text; a call C cannot make as the tree says (another
//    argument count than a unit or C library function takes, or an external
//    function called with two return types). Otherwise it writes the guarded
//    int64/uint64 typedefs, a declaration of every external function
//    (emit/call_signatures.h: C library functions as their headers declare
//    them, disagreeing calls give "T f(fixed, ...)"; "static" is dropped),
//    every subprogram's prototype, name prototypes, then data and
//    subprograms. Array-kind data names are written "((char *)ng<id>)", so
//    address arithmetic on them counts bytes (the interpreter agrees); moved
//    values, fixed call arguments and initializer elements are converted to
//    their destination's type with a cast; INT64_U constants end in ULL;
//    FLOAT/DOUBLE constants have 9/17 significant digits, infinities and NaNs
//    are __builtin_inf()/__builtin_nan("") (GCC) or overflowing constant
//    expressions (MSVC; a NaN's sign and payload are not kept); string texts
//    are decoded like C escapes (core/string_text.h) and written back with
//    octal escapes; a discarded value is cast to void; a value asked of a void
//    function is 0; the operands of AND, OR and NOT are compared with 0, so no
//    number stands where C wants a truth value. GCC flavour only: a subprogram
//    or external function named like a GCC built-in (index, nan, abs, ...;
//    not the C library functions called as their headers declare them) is
//    spelled zoa_builtin_<name> in the text and keeps its own symbol through
//    an asm label (`int zoa_builtin_abs(int ) __asm__("abs");`), so GCC
//    neither refuses its declaration nor folds its calls as the built-in's at
//    any level (the label assumes ELF symbols, without a leading underscore;
//    the MSVC text keeps the name); a static subprogram is declared unused,
//    and pragmas switch off the style warnings that valid machine-made
//    expressions draw (-Wtautological-compare, -Wbool-compare,
//    -Wint-in-bool-context, -Wbool-operation, -Wshift-overflow, -Wshift-count-overflow and
//    -negative, -Wdiv-by-zero, -Woverflow, -Wmain).
//  - dumpDot and dumpAscii: identities are numbers in order of appearance
//    ("@<n>" in the ASCII dump, null "0"); DOT labels escape what Graphviz
//    reads as record syntax, quotes, backslashes and non-printing bytes, and
//    a CHAR_U constant shows its decimal value.
class ZOA_API ZOA_file {
public:
    ZOA_file(bool isGcc, bool asmMode);
    ZOA_file(bool isGcc, bool asmMode, Profile profile);
    ~ZOA_file();
    ZOA_file(const ZOA_file&) = delete;
    ZOA_file& operator=(const ZOA_file&) = delete;

    bool IsGcc() const { return isGcc; }
    // False once a later unit has rewound the arena under this one.
    bool isCurrent() const { return arenaGeneration == MemMgr::getGeneration(); }
    bool IsAsmMode() const { return asmMode; }
    unsigned int getMemoryUsage();

    Profile getProfile() const { return profile; }
    // The profile can change at any time; it is read when an output is written.
    void setProfile(Profile p) { profile = p; }
    // Where the outputs' diagnostic texts go (the DOT dump's node statistics,
    // the assembly output's note): the given stream, or with null the
    // profile's default, std::cout in the exact profile and std::cerr in the
    // sound one. The stream must outlive the output calls.
    void setDiagnosticStream(std::ostream* os) { diagnostics = os; }
    std::ostream& getDiagnosticStream() const;

    // A new subprogram, appended to the unit; with addPrototype it is also
    // entered in the subprogram prototypes under its name.
    SUBPROG* createSubprog(DataType returnType, const char* name, bool addPrototype);

    // Deduplicated file-level names, numbered by the count of recorded names (0
    // first, again 0 after decompile). They match as SUBPROG's local names do
    // (an empty value list included). A new SUBPROG_REF name whose function has
    // no subprogram here gets a prototype; one found again does not.
    NAME* getName(NameKind k, const char* text);
    NAME* getName(CONST* c);
    NAME* getName(const std::list<ExprBase*>& values);
    NAME* getName(LABEL* l);  // a new LABEL_REF name on every call, not recorded

    // File-level data that is never merged, numbered as getName's names; see
    // SUBPROG::createData and createZeroData.
    NAME* createData(const std::list<ExprBase*>& values);
    NAME* createData(CONST* c);
    NAME* createZeroData(unsigned int bytes);

    // Records a prototype for the called function when no subprogram of the
    // unit has its name (decided now); a later call of the same name replaces
    // it. A call through a pointer goes under the empty name; null is ignored.
    void addFunctionPrototype(CALL* call);

    bool decompile(std::ostream& os);
    bool dumpDot(std::ostream& os);
    bool dumpAscii(std::ostream& os);

    const std::list<SUBPROG*>& getSubprogs() const { return subprogs; }
    const std::list<NAME*>& getNames() const { return names; }
    const std::map<std::string, CALL*>& getCallPrototypes() const { return callPrototypes; }
    const std::map<std::string, SUBPROG*>& getSubprogPrototypes() const { return subprogPrototypes; }
    const std::map<std::string, NAME*>& getNamePrototypes() const { return namePrototypes; }

private:
    bool needsPrototype(const std::string& name) const;
    void addFunctionPrototype(SUBPROG* sp);
    void addFunctionPrototype(NAME* n);
    // For the output operations: true when the unit is current; otherwise says
    // so on the diagnostic stream.
    bool checkCurrent() const;

    bool isGcc;
    bool asmMode;
    Profile profile = Profile::EXACT;
    std::ostream* diagnostics = nullptr;
    unsigned long long arenaGeneration = 0;  // the arena's rewind count at construction
    std::list<SUBPROG*> subprogs;
    std::list<NAME*> names;
    std::map<std::string, CALL*> callPrototypes;
    std::map<std::string, SUBPROG*> subprogPrototypes;
    std::map<std::string, NAME*> namePrototypes;
};

}  // namespace ZOA

#endif
