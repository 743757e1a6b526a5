// The generator's assembly mode: what the assembly output translates, three-address code.
#ifndef ZOA_FUZZ_GEN_ASM_H
#define ZOA_FUZZ_GEN_ASM_H

#include "fuzz/builder.h"

namespace ZOA::fuzz {

// INT_S/INT_U/CHAR types, PLUS, MINUS, MUL, relations and CONV4 on leaves;
// the AsmQuirk bits let in the constructs that compute another value.
class AsmBuilder : public Builder {
public:
    using Builder::Builder;

protected:
    DataType anyType(bool allowReal) override;
    ExprBase* exprInner(DataType t, unsigned depth) override;
    bool voidResults() const override { return false; }
    DataType tableElement() override { return chance(50) ? CHAR_S : CHAR_U; }
    bool makesStrings() const override { return false; }
    bool indexFromCounters() override { return true; }
    bool refusesAddress(unsigned size) const override { return size == 1 && !(quirks & BYTE_MEMORY); }
    bool scalesByDoubling(unsigned size) const override { return size > 1 && !(quirks & SCALED_INDEX); }
    StmtBase* wrapped(StmtBase* s) override;
    void added(StmtBase* s) override;
    void newLabel() override;
    bool assignsFromMemory() override { return chance(25); }
    void storeInto(DataType t, ExprBase* address) override;
    ExprBase* callArgument(DataType p) override { return operand(p); }
    DataType relationType(DataType u) override;
    ExprBase* relationOperand(DataType u) override { return operand(u); }
    bool fillsThroughTemp() const override { return true; }
    bool tablesThroughPointer() const override { return true; }

private:
    ExprBase* operand(DataType t);
    static bool holdsByteRegister(StmtBase* s);

    LABEL* byteLabel = nullptr;  // where byteHolds counts
    unsigned byteHolds = 0;
};

}  // namespace ZOA::fuzz

#endif
