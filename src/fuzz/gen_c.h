// The generator's C mode: every operator and type where the C text has a defined meaning.
#ifndef ZOA_FUZZ_GEN_C_H
#define ZOA_FUZZ_GEN_C_H

#include "fuzz/builder.h"

namespace ZOA::fuzz {

// The expression grammar of the C mode, also used by the odd mode.
class CBuilder : public Builder {
public:
    using Builder::Builder;

protected:
    DataType anyType(bool allowReal) override;
    ExprBase* exprInner(DataType t, unsigned depth) override;

    // Constructs only the C mode draws (the odd mode keeps to the common ones).
    bool staticDataLeaf(DataType t) override { return chance(5) && isIntegerType(t); }
    bool tableUsable(const Table& tb, DataType t, bool) const override { return tb.elem == t; }
    bool stringAddresses() const override { return true; }
    bool callsThroughPointer() override { return chance(25); }
    bool computedJumps() const override { return true; }
    bool hostCalls() const override { return true; }
    bool allocatesRegions() override { return chance(30); }
    bool tablePointersWritable() const override { return true; }
    bool localTable() override { return chance(30); }
};

}  // namespace ZOA::fuzz

#endif
