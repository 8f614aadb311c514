// oxtool hexdump: the printHex table of a whole file on standard output.
//
//   oxtool hexdump FILE        ("-": standard input)
//
// Rows of 16 bytes: the position in hexadecimal, the bytes, and the text
// column, where bytes outside 0x20..0x7F show as ".". A last row that is not
// full is padded so that its bar lines up, and followed by an empty line.
// The file is read in blocks; each block is a whole number of rows, so the
// output is the same as one printHex over the whole file.
#include "OxToolCommand.h"
#include "OxToolFiles.h"

#include "oxbase/diag/OxPrt.h"

#include <algorithm>
#include <cstdio>
#include <fstream>
#include <iostream>
#include <string>
#include <vector>

namespace {
constexpr size_t kBlockSize = 64 * 1024; // a multiple of the row length 16

// Writes the table of at most `limit` bytes of `in` to standard output.
// False when the stream fails before its end.
bool hexdump(std::istream& in, size_t limit) {
    OxPrt prt;
    std::vector<char> block(kBlockSize);
    size_t offset = 0;
    while (offset < limit) {
        size_t want = std::min(kBlockSize, limit - offset);
        in.read(block.data(), static_cast<std::streamsize>(want));
        size_t got = static_cast<size_t>(in.gcount());
        if (got == 0) {
            break;
        }
        OxPrt::printHex(prt.getStr(), reinterpret_cast<const unsigned char*>(block.data()), got,
                        offset);
        char* text = prt.flushToString();
        if (text != nullptr) {
            std::fputs(text, stdout);
            delete[] text;
        }
        offset += got;
        if (got < want) {
            break;
        }
    }
    std::fflush(stdout);
    return !in.bad();
}

int runHexdump(const OxToolContext& context) {
    const std::string& path = context.operands[0];
    if (path == "-") {
        if (!hexdump(std::cin, static_cast<size_t>(-1))) {
            oxtoolReport(OxErrorError, "read error on standard input");
            return kOxToolFailed;
        }
        return 0;
    }
    std::ifstream in(path, std::ios::in | std::ios::binary);
    if (!in || !oxtoolIsFile(path)) {
        oxtoolReport(OxErrorError, "cannot open " + path);
        return kOxToolFailed;
    }
    if (!hexdump(in, static_cast<size_t>(-1))) {
        oxtoolReport(OxErrorError, "read error in " + path);
        return kOxToolFailed;
    }
    return 0;
}

// Demo: the first 64 bytes of the default message file.
int demoHexdump(const OxToolDemoContext& context) {
    std::string path = oxtoolJoin(context.dataDir, "oxbase.msg");
    std::ifstream in(path, std::ios::in | std::ios::binary);
    if (!in) {
        std::fprintf(stderr, "oxtool hexdump: cannot open %s\n", path.c_str());
        return 1;
    }
    std::cout << "---- first 64 bytes of " << path << "\n" << std::flush;
    return hexdump(in, 64) ? 0 : 1;
}

OxToolRegistration registration{
    {"hexdump",
     "FILE",
     "print the bytes of a file as a hexadecimal table",
     "Prints FILE (\"-\": standard input) in rows of 16 bytes: the position in\n"
     "hexadecimal, the bytes, and the text column, where bytes outside 0x20..0x7F show\n"
     "as \".\".\n",
     {},
     1,
     1,
     runHexdump,
     demoHexdump,
     20}};
} // namespace
