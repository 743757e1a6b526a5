// The generator's odd mode.
#ifndef ZOA_FUZZ_GEN_ODD_H
#define ZOA_FUZZ_GEN_ODD_H

#include "fuzz/builder.h"
#include "fuzz/gen_c.h"

namespace ZOA::fuzz {

// The C mode's expressions and the common statements, then odd additions.
class OddBuilder : public CBuilder {
public:
    using CBuilder::CBuilder;

protected:
    bool staticDataLeaf(DataType) override { return false; }
    bool tableUsable(const Table& tb, DataType t, bool forStore) const override {
        return Builder::tableUsable(tb, t, forStore);
    }
    bool stringAddresses() const override { return false; }
    bool callsThroughPointer() override { return false; }
    bool computedJumps() const override { return false; }
    bool hostCalls() const override { return false; }
    bool allocatesRegions() override { return false; }
    bool tablePointersWritable() const override { return false; }
    bool localTable() override { return false; }
    void finish() override;
};

}  // namespace ZOA::fuzz

#endif
