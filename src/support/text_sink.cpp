// TextSink: deep indentation in chunks.
#include "support/text_sink.h"

namespace ZOA {

TextSink& TextSink::writeBlanks(unsigned int n) {
    static const char blanks[] = "                                                                ";
    constexpr unsigned int perChunk = (sizeof(blanks) - 1) / 4;
    while (n > perChunk) {
        write(blanks, perChunk * 4);
        n -= perChunk;
    }
    if (n) write(blanks, n * 4);
    return *this;
}

}  // namespace ZOA
