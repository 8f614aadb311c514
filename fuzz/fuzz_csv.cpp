// Feeds arbitrary bytes to the CSV reader as a table file and writes what it
// read out again. Run with -close_fd_mask=3 to keep the reports off the
// terminal.
#include "oxbase/doc/OxCsvFile.h"

#include <cstdint>
#include <fstream>
#include <string>
#include <unistd.h>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, size_t size) {
    static const std::string path = "/tmp/oxbase-fuzz-" + std::to_string(getpid()) + ".csv";
    static const std::string copy = "/tmp/oxbase-fuzz-" + std::to_string(getpid()) + "-copy.csv";
    {
        std::ofstream out(path, std::ios::binary | std::ios::trunc);
        out.write(reinterpret_cast<const char*>(data), static_cast<std::streamsize>(size));
    }
    char separator = size > 0 && data[0] == ';' ? ';' : ',';
    OxCsvFile table(path.c_str(), OxFile::OxIOInput, separator);
    table.readFile();
    std::ostrstream text;
    table.dump(&text);
    text.freeze(false);
    if (table.open(copy.c_str(), OxFile::OxIOOutput) == 0) {
        table.writeFile();
    }
    return 0;
}
