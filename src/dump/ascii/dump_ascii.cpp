// ZOA_file::dumpAscii: the text dump of every subprogram of the unit.
#include <zoa/zoa_file.h>

#include "dump/ascii/dump_tree.h"

namespace ZOA {

bool ZOA_file::dumpAscii(std::ostream& os) {
    if (!checkCurrent()) return false;
    StableIds ids;
    StableIds* stable = profile == Profile::SOUND ? &ids : nullptr;
    for (SUBPROG* sp : subprogs) DumpTree(sp, os, true, stable);
    return true;
}

}  // namespace ZOA
