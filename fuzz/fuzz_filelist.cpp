// List files: reads the input as a list file. A plain OxFileList has no
// tree-walk callback, so a name that happens to be a directory adds nothing
// and no walk starts. Checked: the list file is read (it exists), and every
// name that entered the list is a non-empty text with no white space at
// either end and no line end, one name at most per line of the input.
#include "OxFuzzSupport.h"

#include "oxbase/io/OxFileList.h"

#include <algorithm>
#include <cctype>
#include <cstdint>
#include <cstring>
#include <string>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, size_t size) {
    oxfuzz::startMessages();
    static const std::string path = oxfuzz::scratchFile("input.lst");
    oxfuzz::writeFile(path, data, size);
    OxFileList list(path.c_str());
    OXFUZZ_CHECK(list.readListFiles() == OxTrue, "the list file was not read");
    const OxGList<char*>& names = list.getFileNameList();
    size_t lines = std::count(data, data + size, '\n') + 1;
    OXFUZZ_CHECK(names.getLength() <= lines, "%u names from %zu lines", names.getLength(), lines);
    for (unsigned int i = 0; i < names.getLength(); i++) {
        const char* name = names[i];
        OXFUZZ_CHECK(name != nullptr && *name != '\0', "name %u is empty", i);
        size_t length = std::strlen(name);
        OXFUZZ_CHECK(std::isspace(static_cast<unsigned char>(name[0])) == 0 &&
                         std::isspace(static_cast<unsigned char>(name[length - 1])) == 0 &&
                         std::strchr(name, '\n') == nullptr,
                     "name %u is not trimmed: \"%s\"", i, oxfuzz::shown(name).c_str());
    }
    std::ostrstream dumped;
    list.dump(&dumped);
    dumped.freeze(false);
    return 0;
}
