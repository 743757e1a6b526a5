// Escaping of user texts (names, strings, character constants) inside DOT labels.
#ifndef ZOA_DUMP_DOT_DOT_ESCAPE_H
#define ZOA_DUMP_DOT_DOT_ESCAPE_H

#include "support/text_sink.h"

#include <cstddef>

namespace ZOA {

// Appends s[0..n) so that Graphviz shows it as it is inside a quoted label:
// '"' and '\' get a backslash; in a record label (record) so do '{', '}', '|',
// '<' and '>', which would otherwise make fields and ports. Bytes below 0x20,
// 0x7f and bytes above it (which need not be UTF-8) are shown as "\xNN", the
// backslash itself escaped.
void appendDotEscaped(TextSink& text, const char* s, std::size_t n, bool record);

}  // namespace ZOA

#endif
