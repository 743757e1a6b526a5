// SUBPROG: one function of the unit, with its temp pool, labels and local names.
#ifndef ZOA_SUBPROG_H
#define ZOA_SUBPROG_H

#include <zoa/expr.h>
#include <zoa/memmgr.h>
#include <zoa/stmt.h>
#include <zoa/tree_base.h>

#include <list>

namespace ZOA {

using TempList = ArenaList<TEMP*>;
using NameList = ArenaList<NAME*>;
using LabelMap = ArenaMap<unsigned int, LABEL*>;

// The root of one function's tree. Construction makes the start label (id 0,
// PROLOGUE_LABEL), the return label (id 1, EPILOGUE_LABEL) and, unless the
// return type is VOID, the return temporary (id 0). Temp, label and local-name
// ids each count up from 0 within the subprogram.
class ZOA_API SUBPROG : public TreeBase {
public:
    SUBPROG(DataType returnType, const char* name);
    ~SUBPROG() override;

    NodeType getNodeType() override { return SUBPROG_NODE; }
    void accept(VisitorBase* v) override;

    const String& getName() const { return name; }
    DataType getReturnType() const { return returnType; }
    TEMP* getReturnTemp() const { return returnTemp; }
    LABEL* getStartLabel() const { return startLabel; }
    LABEL* getReturnLabel() const { return returnLabel; }
    void makeStatic() { staticFlag = true; }
    bool isStatic() const { return staticFlag; }
    void makeExtern() { externFlag = true; }
    bool isExtern() const { return externFlag; }
    const TempList& getAllTemps() const { return allTemps; }
    const TempList& getAllArgTemps() const { return argTemps; }
    const NameList& getAllLocalNames() const { return localNames; }
    const LabelMap& getAllLabels() const { return labels; }

    unsigned int createTempId() { return tempIdCounter++; }
    unsigned int createNameId() { return nameIdCounter++; }
    unsigned int createLabelId() { return labelIdCounter++; }

    // A temporary from the pool: the oldest AVAILABLE_TEMP one of type t (a
    // BUF_TEMP of exactly size bytes when size is not 0, a plain one otherwise)
    // comes back IN_USE_TEMP; failing that a new one is made in state `state`
    // (a BUF_TEMP of size bytes, type POINTER, when size is not 0).
    TEMP* getTemp(DataType t, unsigned int size, TempState state);
    // A new argument temporary; the order of calls is the parameter order.
    TEMP* getArgTemp(DataType t);
    // Returns an IN_USE_TEMP temporary to the pool; other states are left alone.
    void freeTemp(TEMP* t);
    void freeAllTemps();

    LABEL* createNewLabel(LabelKind k);
    // Removes the label's id from the label map; the return label pointer
    // becomes null if it was the return label, the start label pointer is
    // kept. A null label, or one whose id is not in the map, is ignored.
    void freeDeadLabel(LABEL* l);

    // Deduplicated local names (declaredLocal set); a match consumes no id.
    // The list overload matches element by element, so an empty list returns
    // the first name made from text, or else a new CONST_ARRAY_REF with no
    // values. getName(LABEL*) makes a new LABEL_REF name on every call and
    // records nothing.
    NAME* getName(NameKind k, const char* text);
    NAME* getName(CONST* c);
    NAME* getName(const std::list<ExprBase*>& values);
    NAME* getName(LABEL* l);

    // Local data that is never merged (NAME::isPrivateData), with the next
    // local name id: a DATA_ARRAY_REF holding the values (an empty list gives
    // a one-byte array), a STATIC_DATA_REF holding c (a null c: an INT_S 0),
    // or `bytes` zero-filled bytes (a DATA_ARRAY_REF with no values whose
    // getZeroBytes() is bytes; 0 bytes still get one byte of storage).
    NAME* createData(const std::list<ExprBase*>& values);
    NAME* createData(CONST* c);
    NAME* createZeroData(unsigned int bytes);

    // First match in list order, or null; private data never matches. Integer values match on all 64 bits,
    // FLOAT and DOUBLE on == (so NaN never matches), POINTER elements by node
    // identity; POINTER and VOID constants never match a single constant, and
    // a list element that is not a CONST where a value is needed never matches.
    static NAME* getMatchingName(const char* text, const NameList& names);
    static NAME* getMatchingName(NameKind k, const char* text, const NameList& names);
    static NAME* getMatchingName(CONST* c, const NameList& names);
    static NAME* getMatchingName(const std::list<ExprBase*>& values, const NameList& names);
    static NAME* getMatchingName(const char* text, const std::list<NAME*>& names);
    static NAME* getMatchingName(NameKind k, const char* text, const std::list<NAME*>& names);
    static NAME* getMatchingName(CONST* c, const std::list<NAME*>& names);
    static NAME* getMatchingName(const std::list<ExprBase*>& values, const std::list<NAME*>& names);

    // Does nothing; returns true.
    bool optimize() { return true; }

private:
    friend class TreeRewriter;
    void addLabel(LABEL* l);
    void replaceReturnLabel(LABEL* l);

    String name;
    DataType returnType;
    TEMP* returnTemp = nullptr;
    LABEL* startLabel = nullptr;
    LABEL* returnLabel = nullptr;
    bool staticFlag = false;
    bool externFlag = false;
    TempList allTemps;
    TempList argTemps;
    NameList localNames;
    LabelMap labels;
    unsigned int tempIdCounter = 0;
    unsigned int nameIdCounter = 0;
    unsigned int labelIdCounter = 0;
};

}  // namespace ZOA

#endif
