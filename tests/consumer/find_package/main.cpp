// A consumer of the CMake package: starts the messages on the installed
// message file, reads and writes an XML document, and checks that the
// package's version and data directory agree with the version header.
//
//   consumer WORKDIR [--header-dir]   0 when all went as it should
#include "oxbase/OxBase.h"
#include "oxbase/OxVersion.h"
#include "oxbase/diag/OxMsgNumbers.h"

#include <cstdio>
#include <cstring>
#include <fstream>
#include <string>

int main(int argc, char** argv) {
    if (argc < 2) {
        std::fprintf(stderr, "usage: consumer WORKDIR [--header-dir]\n");
        return 2;
    }
    std::string work = argv[1];
    if (std::strcmp(OXBASE_VERSION_STRING, CONSUMER_VERSION) != 0) {
        std::fprintf(stderr, "version header %s, package %s\n", OXBASE_VERSION_STRING,
                     CONSUMER_VERSION);
        return 1;
    }
    // The header names the data directory of the prefix it was installed to;
    // a package extracted elsewhere keeps the one it was built for.
    if (argc > 2 && std::strcmp(OXBASE_DATA_DIR, CONSUMER_DATA_DIR) != 0) {
        std::fprintf(stderr, "header data dir %s, package %s\n", OXBASE_DATA_DIR,
                     CONSUMER_DATA_DIR);
        return 1;
    }
    OxMsg msg(OXBASE_MESSAGE_FILE, CONSUMER_DATA_DIR, "consumer.log", work.c_str());
    if (OxMsg::isValid() != OxTrue) {
        std::fprintf(stderr, "no message file in %s\n", CONSUMER_DATA_DIR);
        return 1;
    }
    OxLimits::initTolerances();
    std::string in = work + "/in.xml";
    std::ofstream(in) << "<?xml version=\"1.0\"?>\n<assembly>\n <part name=\"a\"/>\n</assembly>\n";
    OxXmlFile doc(in.c_str(), OxFile::OxIOInput);
    if (doc.readFile() != OxTrue || doc.getRoot()->getChildByName("part") == nullptr) {
        return 1;
    }
    std::string out = work + "/out.xml";
    doc.open(out.c_str(), OxFile::OxIOOutput);
    if (doc.writeFile() != OxTrue) {
        return 1;
    }
    OxMsg::Log(OxMsgMemoryBeforeStart); // a warning, by the installed file's text
    std::printf("OxBase %s: read and wrote %s, error code %d\n", OXBASE_VERSION_STRING,
                out.c_str(), static_cast<int>(OxMsg::getErrorCode()));
    return OxMsg::getErrorCode() == OxErrorWarning ? 0 : 1;
}
