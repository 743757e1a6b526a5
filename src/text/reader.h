// The builder of the text reader: turns checked S-expressions into a unit through the public API.
#ifndef ZOA_TEXT_READER_H
#define ZOA_TEXT_READER_H

#include <zoa/text.h>

#include "text/sexpr.h"

namespace ZOA::text {

// Builds the unit the single top-level (unit ...) form describes. Declarations
// (subprograms, temps, labels, names, prototypes) run in the order written;
// the statements of every (block ...) run after the whole form was read, so a
// block may mention anything the unit declares.
void buildUnit(const SItems& forms, Result& result, const std::string& fileName,
               const Flavour* flavour);

}  // namespace ZOA::text

#endif
