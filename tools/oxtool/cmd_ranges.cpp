// oxtool ranges: parses range text and prints the compacted set.
//
//   oxtool ranges '9,1-3,2-4' --merge '5-8' --negate 0 12
//
// The options apply in the order given. The output is the compacted range
// text (an empty line for an empty set) and the number of members. A text
// that is not accepted is reported by message number on standard error and
// gives exit status 8; a misused command gives 2. A number above 32 bits,
// which the library wraps, draws a warning (status 4). The command also adds a
// demo step that walks, merges, negates and dumps a small example.
#include "OxToolCommand.h"
#include "OxToolFiles.h"
#include "OxToolLint.h"

#include "oxbase/diag/OxMsg.h"
#include "oxbase/ranges/OxRangeList.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <iostream>
#include <string>

namespace {

/// Members of a compact list, counted in 64 bits (0-4294967295 has 2^32).
unsigned long long countMembers(const OxRangeList& list) {
    unsigned long long count = 0;
    for (unsigned int i = 0; i < list.getLength(); i++) {
        count += static_cast<unsigned long long>(list[i]->last) - list[i]->first + 1;
    }
    return count;
}

void printSet(OxRangeList& list) {
    list.compact();
    char* text = list.convertToString();
    std::printf("%s\n", text != nullptr ? text : "");
    std::printf("members: %llu\n", countMembers(list));
    delete[] text;
}

/// Parses `text` as range text, after warning of numbers that wrap.
bool buildList(const std::string& text, OxRangeList& list) {
    for (const OxToolRangeWrap& wrap : oxtoolRangeWraps(text)) {
        oxtoolReport(OxErrorWarning, "in \"" + text + "\" the number " + wrap.digits +
                                         " at position " + std::to_string(wrap.position) +
                                         " is above 4294967295 and wraps to " +
                                         std::to_string(wrap.wrapped));
    }
    OxRangeList parsed(text.c_str(), "range");
    if (parsed.isValid() != OxTrue) {
        return false; // the library logged why (293, 294)
    }
    list.merge(parsed);
    return true;
}

int runRanges(const OxToolContext& context) {
    // The numbers of every --negate first: a bad one is a usage error, and
    // nothing is done.
    for (const auto& option : context.options) {
        if (option.first == "negate") {
            std::string from = option.second.substr(0, option.second.find(' '));
            std::string to = option.second.substr(option.second.find(' ') + 1);
            long long ignored = 0;
            if (!oxtoolParseNumber(from, 0, 0xFFFFFFFFll, ignored) ||
                !oxtoolParseNumber(to, 0, 0xFFFFFFFFll, ignored)) {
                std::fprintf(stderr,
                             "oxtool ranges: --negate needs two numbers from 0 to 4294967295, "
                             "not '%s'\n",
                             option.second.c_str());
                return kOxToolUsage;
            }
        }
    }
    OxRangeList list;
    if (!buildList(context.operands[0], list)) {
        return kOxToolFailed;
    }
    for (const auto& option : context.options) {
        if (option.first == "merge") {
            if (!buildList(option.second, list)) {
                return kOxToolFailed;
            }
        } else if (option.first == "negate") {
            long long from = 0;
            long long to = 0;
            oxtoolParseNumber(option.second.substr(0, option.second.find(' ')), 0, 0xFFFFFFFFll,
                              from);
            oxtoolParseNumber(option.second.substr(option.second.find(' ') + 1), 0, 0xFFFFFFFFll,
                              to);
            if (list.getLength() == 0 || list.negate(static_cast<unsigned int>(from),
                                                     static_cast<unsigned int>(to)) != OxTrue) {
                oxtoolReport(
                    OxErrorError,
                    "cannot negate within " + std::to_string(from) + "-" + std::to_string(to) +
                        (list.getLength() == 0 ? ": the set is empty" : ": FROM is above TO"));
                return kOxToolFailed;
            }
        }
    }
    printSet(list);
    return 0;
}

// Demo: an unordered text with overlaps, compacted, walked, merged with a
// second set, negated within a span, and dumped.
int demoRanges(const OxToolDemoContext& context) {
    std::string logPath = oxtoolLibraryPath(oxtoolJoin(context.outDir, "ranges-demo.log"));
    OxMsg msg(oxtoolLibraryPath(context.messageFile).c_str(), nullptr, logPath.c_str(), nullptr);
    OxRangeList list("20-22 9,1-3,2-4", "page");
    if (list.isValid() != OxTrue) {
        return 1;
    }
    std::cout << "text \"20-22 9,1-3,2-4\" compacted:\n" << std::flush;
    printSet(list);
    std::cout << "walk:";
    unsigned int number = 0;
    for (OxBool more = list.getFirstEntry(number); more == OxTrue;) {
        std::cout << " " << number;
        number = list.getNextEntry(number);
        more = OxToBool(number != 0);
    }
    std::cout << "\n";
    OxRangeList extra("5-8,23", "page");
    list.merge(extra);
    std::cout << "merged with \"5-8,23\":\n" << std::flush;
    printSet(list);
    list.negate(0, 30);
    std::cout << "negated within 0-30:\n" << std::flush;
    printSet(list);
    std::ostrstream stream;
    list.dump(&stream);
    std::cout << oxtoolStreamText(stream) << std::flush;

    // A text with an error is reported by number (293) and gives an empty set.
    OxRangeList broken("1 , 2", "page");
    std::cout << "\"1 , 2\" is " << (broken.isValid() == OxTrue ? "valid" : "invalid") << "\n"
              << std::flush;
    return 0;
}

OxToolRegistration registration{
    {"ranges",
     "TEXT",
     "print the compacted range set and its member count",
     "Parses TEXT as range text (numbers and pairs joined by '-', separated by ',' or\n"
     "one blank), applies --merge and --negate in the order given, and prints the\n"
     "compacted set and the number of its members. Text that is not range text is\n"
     "logged by message (293, 294) and ends with status 8. Numbers are 32-bit: one\n"
     "above 4294967295 wraps around in the library, and oxtool warns of it.\n",
     {{"merge", "TEXT", "add the members of another range text"},
      {"negate", "FROM TO", "replace the set by the numbers of FROM..TO it lacks"}},
     1,
     1,
     runRanges,
     demoRanges,
     80}};
} // namespace
