// OxFileFind.cpp: OxFile::findFilesByExtension, the tree walk's client for
// collecting the files of a directory by their ending.
#include "oxbase/core/OxString.h"
#include "oxbase/io/OxFile.h"
#include "oxbase/io/OxFileTreeWalk.h"

#include <cstring>

namespace {

struct ExtensionSearch {
    OxGList<char*>* files;
    const char* extension;
    std::size_t extensionLength;
};

/// Collects every path (of any type) that ends in the extension and is
/// longer than it. Never stops the walk.
int collectByExtension(const char* path, const OxStat*, OxFileTreeWalkType, void* userData) {
    const ExtensionSearch* search = static_cast<const ExtensionSearch*>(userData);
    std::size_t length = std::strlen(path);
    if (length > search->extensionLength &&
        std::memcmp(path + length - search->extensionLength, search->extension,
                    search->extensionLength) == 0) {
        char* copy = OxString::dup(path);
        if (copy != nullptr) {
            search->files->append(copy);
        }
    }
    return 0;
}

} // namespace

OxBool OxFile::findFilesByExtension(const char* directory, OxGList<char*>& files,
                                    const char* extension, OxBool recursive) {
    if (directory == nullptr || extension == nullptr) {
        return OxFalse;
    }
    if (isDirectory(directory) != OxTrue) {
        return OxTrue;
    }
    ExtensionSearch search{&files, extension, std::strlen(extension)};
    OxFileTreeWalk* walk = new OxFileTreeWalk(directory, collectByExtension, 10,
                                              recursive == OxTrue ? -1 : 0, &search);
    walk->run();
    delete walk;
    return OxTrue;
}
