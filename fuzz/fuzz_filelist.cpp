// Feeds arbitrary bytes to the file-list reader as a list file. A plain
// OxFileList has no tree-walk callback, so a name that happens to be a
// directory adds nothing and no walk starts. Run with -close_fd_mask=3.
#include "oxbase/io/OxFileList.h"

#include <cstdint>
#include <fstream>
#include <string>
#include <unistd.h>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, size_t size) {
    static const std::string path = "/tmp/oxbase-fuzz-" + std::to_string(getpid()) + ".lst";
    {
        std::ofstream out(path, std::ios::binary | std::ios::trunc);
        out.write(reinterpret_cast<const char*>(data), static_cast<std::streamsize>(size));
    }
    OxFileList list(path.c_str());
    list.readListFiles();
    std::ostrstream dumped;
    list.dump(&dumped);
    dumped.freeze(false);
    return 0;
}
