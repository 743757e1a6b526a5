// ZOA_file::dumpAscii (placeholder).
#include <zoa/zoa_file.h>

namespace ZOA {

bool ZOA_file::dumpAscii(std::ostream&) { return true; }

}  // namespace ZOA
