// ZOA_file::dumpDot (placeholder).
#include <zoa/zoa_file.h>

namespace ZOA {

bool ZOA_file::dumpDot(std::ostream&) { return true; }

}  // namespace ZOA
