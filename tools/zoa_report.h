// The zoa tool's messages: FILE:LINE:COL, the severity, the source line and a caret.
#ifndef ZOA_TOOLS_ZOA_REPORT_H
#define ZOA_TOOLS_ZOA_REPORT_H

#include <zoa/text.h>

#include <iosfwd>
#include <string>
#include <string_view>

namespace zoa_tool {

enum class Severity { ERROR, WARNING };

// True when standard error is a terminal and NO_COLOR is unset or empty.
bool colourWanted();

class Reporter {
public:
    // `source` is the text the positions refer to; it must outlive the reporter.
    Reporter(std::ostream& os, std::string_view source, bool colour) : os(os), source(source), colour(colour) {}

    // "FILE:LINE:COL: error: message", then the source line and a caret under
    // the column. `where` carries the file, line and column; its message is
    // ignored. Without a place (`placed` false) the excerpt is left out.
    void report(const ZOA::text::Diagnostic& where, Severity severity, const std::string& message,
                bool placed = true);
    // "zoa: FILE: error: message", for what has no line.
    void fileError(const std::string& file, const std::string& message);

private:
    void excerpt(unsigned int line, unsigned int column);
    void paint(const char* code, std::string_view text);

    std::ostream& os;
    std::string_view source;
    bool colour;
};

}  // namespace zoa_tool

#endif
