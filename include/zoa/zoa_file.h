// ZOA_file: one translation unit, its subprograms, file-level names and prototypes.
#ifndef ZOA_ZOA_FILE_H
#define ZOA_ZOA_FILE_H

#include <zoa/enums.h>
#include <zoa/export.h>
#include <zoa/expr.h>
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
// Output operations write onto the caller's stream and always return true:
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
class ZOA_API ZOA_file {
public:
    ZOA_file(bool isGcc, bool asmMode);
    ZOA_file(bool isGcc, bool asmMode, Profile profile);
    ~ZOA_file();
    ZOA_file(const ZOA_file&) = delete;
    ZOA_file& operator=(const ZOA_file&) = delete;

    bool IsGcc() const { return isGcc; }
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

    bool isGcc;
    bool asmMode;
    Profile profile = Profile::EXACT;
    std::ostream* diagnostics = nullptr;
    std::list<SUBPROG*> subprogs;
    std::list<NAME*> names;
    std::map<std::string, CALL*> callPrototypes;
    std::map<std::string, SUBPROG*> subprogPrototypes;
    std::map<std::string, NAME*> namePrototypes;
};

}  // namespace ZOA

#endif
