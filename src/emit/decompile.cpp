// ZOA_file::decompile: the fixed sequence that drives one emitter over a unit.
#include "emit/c/decompile_c.h"
#include "emit/x86/decompile_asm.h"
#include "emit/x86/sound/sound_x86.h"

#include <zoa/zoa_file.h>

#include <memory>
#include <ostream>

namespace ZOA {

bool ZOA_file::decompile(std::ostream& os) {
    if (!checkCurrent()) return false;
    if (profile == Profile::SOUND && asmMode) {
        {
            SoundX86 x86(os, *this);
            x86.writeUnit();
        }
        names.clear();
        subprogs.clear();
        callPrototypes.clear();
        return true;
    }
    if (profile == Profile::SOUND && !asmMode) {
        DecompileC c(os, isGcc, true);
        if (!c.writeSoundUnit(*this, getDiagnosticStream())) return false;
        names.clear();
        subprogs.clear();
        callPrototypes.clear();
        return true;
    }
    std::unique_ptr<DecompileBase> emitter;
    if (asmMode) {
        auto* x86 = new DecompileASM(os, isGcc);
        x86->setNoteStream(getDiagnosticStream());
        emitter.reset(x86);
    } else {
        emitter.reset(new DecompileC(os, isGcc));
    }

    for (NAME* n : names) emitter->defineName(n);
    os << std::endl;
    for (auto& entry : callPrototypes) emitter->declareCallPrototype(entry.second);
    for (auto& entry : subprogPrototypes) emitter->declareSubprogPrototype(entry.second);
    for (auto& entry : namePrototypes) emitter->declareNamePrototype(entry.second);
    os << std::endl << std::endl;
    for (SUBPROG* sp : subprogs) emitter->emitSubprogram(sp);
    emitter.reset();

    names.clear();
    subprogs.clear();
    callPrototypes.clear();
    return true;
}

}  // namespace ZOA
