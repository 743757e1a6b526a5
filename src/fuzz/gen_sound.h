// The generator's C mode in the sound profile: also what only the sound C text means.
#ifndef ZOA_FUZZ_GEN_SOUND_H
#define ZOA_FUZZ_GEN_SOUND_H

#include "fuzz/gen_c.h"

namespace ZOA::fuzz {

class SoundCBuilder : public CBuilder {
public:
    using CBuilder::CBuilder;

protected:
    CONST* floatingConstant(DataType t) override;
    ExprBase* tableOffset(ExprBase* idx, unsigned elemSize) override;
    NAME* makeTable(const std::list<ExprBase*>& values) override;
    ExprBase* functionAddress(const Fn& f) override;
    void hostCall() override;
    void finish() override;
};

}  // namespace ZOA::fuzz

#endif
