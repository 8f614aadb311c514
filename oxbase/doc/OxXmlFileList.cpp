// OxXmlFileList.cpp: the ".xml" filter of directory walks.
#include "oxbase/doc/OxXmlFileList.h"

#include "oxbase/core/OxString.h"

#include <cstring>

OxXmlFileList::OxXmlFileList() {
    ftwCallback = filterXMLFileList;
}

OxXmlFileList::OxXmlFileList(char const* listFile) : OxFileList(listFile) {
    ftwCallback = filterXMLFileList;
}

OxXmlFileList::~OxXmlFileList() = default;

int OxXmlFileList::filterXMLFileList(char const* path, OxStat const* status,
                                     OxFileTreeWalkType type, void* list) {
    (void)status;
    if (type != OxFTWFile) {
        return 0;
    }
    if (list == nullptr) {
        return -1;
    }
    if (path == nullptr) {
        return 0;
    }
    // The last "." of the whole path, the first character not counted.
    std::size_t length = std::strlen(path);
    const char* dot = nullptr;
    for (std::size_t i = length; i > 1; i--) {
        if (path[i - 1] == '.') {
            dot = path + i - 1;
            break;
        }
    }
    if (dot == nullptr || std::strncmp(dot, ".xml", 4) != 0) {
        return 0;
    }
    char* copy = OxString::dup(path);
    if (copy != nullptr) {
        static_cast<OxGList<char*>*>(list)->append(copy);
    }
    return 0;
}
