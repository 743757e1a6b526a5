// The zoa tool's messages, with the source line and a caret as compilers print them.
#include "zoa_report.h"

#include <algorithm>
#include <cstdlib>
#include <ostream>
#include <unistd.h>

namespace zoa_tool {

namespace {

// Columns of a long line shown around the caret.
constexpr std::size_t WINDOW = 120;

const char* const BOLD = "1";
const char* const RED = "1;31";
const char* const MAGENTA = "1;35";
const char* const GREEN = "1;32";

}  // namespace

bool colourWanted() {
    const char* noColour = std::getenv("NO_COLOR");
    return isatty(STDERR_FILENO) && !(noColour && *noColour);
}

void Reporter::paint(const char* code, std::string_view text) {
    if (colour) os << "\033[" << code << 'm' << text << "\033[0m";
    else os << text;
}

void Reporter::report(const ZOA::text::Diagnostic& where, Severity severity, const std::string& message,
                      bool placed) {
    // text::format spells the place; the severity after it is ours.
    ZOA::text::Diagnostic place = where;
    place.message.clear();
    std::string prefix = ZOA::text::format(place);
    const std::string_view fixed = " error: ";
    if (prefix.size() >= fixed.size() && prefix.compare(prefix.size() - fixed.size(), fixed.size(), fixed) == 0)
        prefix.resize(prefix.size() - fixed.size());
    paint(BOLD, prefix);
    os << ' ';
    paint(severity == Severity::ERROR ? RED : MAGENTA, severity == Severity::ERROR ? "error:" : "warning:");
    os << ' ';
    paint(BOLD, message);
    os << '\n';
    if (placed) excerpt(where.line, where.column);
}

void Reporter::fileError(const std::string& file, const std::string& message) {
    paint(BOLD, "zoa: " + file + ":");
    os << ' ';
    paint(RED, "error:");
    os << ' ' << message << '\n';
}

void Reporter::excerpt(unsigned int line, unsigned int column) {
    if (line == 0) return;
    std::size_t start = 0;
    for (unsigned int l = 1; l < line; ++l) {
        std::size_t newline = source.find('\n', start);
        if (newline == std::string_view::npos) return;
        start = newline + 1;
    }
    std::size_t end = std::min(source.find('\n', start), source.size());
    if (end > start && source[end - 1] == '\r') --end;
    std::string_view text = source.substr(start, end - start);
    if (text.find_first_not_of(" \t") == std::string_view::npos) return;  // nothing to point into

    std::size_t at = std::min<std::size_t>(column ? column - 1 : 0, text.size());
    std::size_t from = 0, to = text.size();
    if (text.size() > WINDOW) {
        from = at > WINDOW / 2 ? at - WINDOW / 2 : 0;
        to = std::min(text.size(), from + WINDOW);
    }
    std::string shown = from ? "..." : "";
    std::string caret(shown.size(), ' ');
    for (std::size_t i = from; i < to; ++i) {
        unsigned char c = static_cast<unsigned char>(text[i]);
        // Control bytes would move the terminal's cursor; one '?' each keeps the columns.
        shown += (c < 0x20 && c != '\t') || c == 0x7f ? '?' : text[i];
        if (i >= at) continue;
        if (c == '\t') caret += '\t';
        else if ((c & 0xC0) != 0x80) caret += ' ';  // one blank per character, not per UTF-8 byte
    }
    if (to < text.size()) shown += "...";
    os << shown << '\n';
    paint(GREEN, caret + "^");
    os << '\n';
}

}  // namespace zoa_tool
