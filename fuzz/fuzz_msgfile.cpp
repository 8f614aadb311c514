// Feeds arbitrary bytes to the message-file reader as a message file. The
// texts read are printf formats from the input, so nothing is formatted here:
// the target is the reader and the release of what it built. Run with
// -close_fd_mask=2 to keep the reader's reports off the terminal.
#include "oxbase/diag/OxMsg.h"

#include <cstdint>
#include <fstream>
#include <string>
#include <unistd.h>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, size_t size) {
    static const std::string path = "/tmp/oxbase-fuzz-" + std::to_string(getpid()) + ".msg";
    {
        std::ofstream out(path, std::ios::binary | std::ios::trunc);
        out.write(reinterpret_cast<const char*>(data), static_cast<std::streamsize>(size));
    }
    OxMsg msg(path.c_str(), nullptr, nullptr, nullptr);
    return 0;
}
