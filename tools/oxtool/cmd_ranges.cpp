// oxtool ranges: parses range text and prints the compacted set.
//
//   oxtool ranges '9,1-3,2-4' --merge '5-8' --negate 0 12
//
// The options apply in the order given. The output is the compacted range
// text (an empty line for an empty set) and the number of members. A text
// that is not accepted is reported by message number on standard error and
// gives exit status 1; a misused command gives 2. The command also adds a
// demo step that walks, merges, negates and dumps a small example.
#include "OxToolCommand.h"

#include "oxbase/diag/OxMsg.h"
#include "oxbase/ranges/OxRangeList.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <iostream>
#include <string>

#ifndef OXTOOL_DEFAULT_DATA_DIR
#define OXTOOL_DEFAULT_DATA_DIR "data"
#endif

namespace {

/// A decimal number of at most 32 bits, digits only.
bool parseNumber(const char* text, unsigned int& value) {
    if (text == nullptr || *text == '\0' || std::strspn(text, "0123456789") != std::strlen(text)) {
        return false;
    }
    unsigned long long result = 0;
    for (const char* p = text; *p != '\0'; p++) {
        result = result * 10 + static_cast<unsigned long long>(*p - '0');
        if (result > 0xFFFFFFFFull) {
            return false;
        }
    }
    value = static_cast<unsigned int>(result);
    return true;
}

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

int usage() {
    std::fprintf(stderr, "usage: oxtool ranges TEXT [--negate FROM TO] [--merge TEXT]\n");
    return 2;
}

int runRanges(int argc, char** argv) {
    if (argc < 2) {
        return usage();
    }
    OxMsg msg("oxbase.msg", OXTOOL_DEFAULT_DATA_DIR, nullptr, nullptr);
    OxRangeList list(argv[1], "range");
    if (list.isValid() != OxTrue) {
        return 1;
    }
    for (int i = 2; i < argc; i++) {
        if (std::strcmp(argv[i], "--merge") == 0 && i + 1 < argc) {
            OxRangeList other(argv[++i], "range");
            if (other.isValid() != OxTrue) {
                return 1;
            }
            list.merge(other);
        } else if (std::strcmp(argv[i], "--negate") == 0 && i + 2 < argc) {
            unsigned int from = 0;
            unsigned int to = 0;
            if (!parseNumber(argv[i + 1], from) || !parseNumber(argv[i + 2], to)) {
                return usage();
            }
            i += 2;
            if (list.negate(from, to) != OxTrue) {
                std::fprintf(stderr, "oxtool ranges: cannot negate within %u-%u\n", from, to);
                return 1;
            }
        } else {
            return usage();
        }
    }
    printSet(list);
    return 0;
}

// Demo: an unordered text with overlaps, compacted, walked, merged with a
// second set, negated within a span, and dumped.
int demoRanges(const OxToolDemoContext& context) {
    std::string logPath = oxtoolJoin(context.outDir, "ranges-demo.log");
    OxMsg msg("oxbase.msg", context.dataDir.c_str(), logPath.c_str(), nullptr);
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

OxToolRegistration registration{{"ranges", "TEXT [--negate FROM TO] [--merge TEXT]",
                                 "print the compacted range set and its member count", runRanges,
                                 demoRanges, 80}};
} // namespace
