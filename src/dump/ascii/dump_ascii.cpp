// ZOA_file::dumpAscii: the text dump of every subprogram of the unit.
#include <zoa/zoa_file.h>

#include "dump/ascii/dump_tree.h"

namespace ZOA {

bool ZOA_file::dumpAscii(std::ostream& os) {
    if (!checkCurrent()) return false;
    for (SUBPROG* sp : subprogs) DumpTree(sp, os, true);
    return true;
}

}  // namespace ZOA
