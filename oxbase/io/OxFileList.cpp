// OxFileList.cpp: list files, directory expansion and the name lists.
#include "oxbase/io/OxFileList.h"

#include "oxbase/core/OxString.h"
#include "oxbase/core/detail/OxNoMemory.h"
#include "oxbase/platform/detail/OxPlatformFs.h"
#include "oxbase/platform/detail/OxPlatformPath.h"

#include <cctype>
#include <cstring>
#include <iostream>
#include <memory>
#include <string>

using namespace oxbase::detail;

namespace {

/// Room for a line of 519 characters and its terminator.
const std::streamsize lineBufferSize = 520;

void releaseNames(OxGList<char*>& names) {
    for (unsigned int i = 0; i < names.getLength(); i++) {
        delete[] names[i];
    }
    names.makeEmpty();
}

} // namespace

OxFileList::OxFileList() = default;

OxFileList::OxFileList(const char* listFile) {
    addListFile(listFile);
}

OxFileList::~OxFileList() {
    delete[] listFilePath;
    listFilePath = nullptr;
    releaseNames(listFiles);
    releaseNames(fileNames);
}

void OxFileList::add(const char* name) {
    if (name == nullptr) {
        return;
    }
    OxStat status;
    if (OxPlatformStat(name, &status) != 0 || !OxPlatformIsDirectoryMode(status)) {
        char* copy = OxString::dup(name);
        if (copy != nullptr) {
            OxString::stripWhite(copy);
            fileNames.append(copy);
        }
        return;
    }
    if (ftwCallback == nullptr) {
        return; // nothing could decide which files of the directory to keep
    }
    OxFileTreeWalk* walk = new OxFileTreeWalk(name, ftwCallback, 10, &fileNames);
    walk->run();
    delete walk;
}

void OxFileList::addListFile(const char* name) {
    char* copy = OxString::dup(name);
    if (copy != nullptr) {
        listFiles.append(copy);
    }
}

void OxFileList::setListFilePath(const char* path) {
    char* copy = OxString::dup(path);
    delete[] listFilePath;
    listFilePath = copy;
}

OxBool OxFileList::isComment(const char* text) const {
    return OxToBool(text != nullptr && text[0] == '#');
}

OxBool OxFileList::isEmpty(const char* text) const {
    if (text == nullptr) {
        return OxTrue;
    }
    if (text[0] == '\0') {
        return OxFalse;
    }
    for (const char* p = text; *p != '\0'; p++) {
        if (!std::isspace(static_cast<unsigned char>(*p))) {
            return OxFalse;
        }
    }
    return OxTrue;
}

char* OxFileList::stripComment(char* text) {
    if (text == nullptr) {
        return text;
    }
    bool quoted = false;
    for (char* p = text; *p != '\0'; p++) {
        if (*p == '"') {
            quoted = !quoted;
        } else if (*p == '#' && !quoted) {
            *p = '\0';
            break;
        }
    }
    return text;
}

bool OxFileList::readListFile(const char* name) {
    std::unique_ptr<std::ifstream> in(OxPlatformOpenInput(name, false));
    std::string second;
    if (!in->is_open() || !in->good()) {
        in.reset();
        if (listFilePath == nullptr) {
            std::cerr << "Unable to open list file.\n"
                      << "  Tried " << name << "\n"
                      << std::flush;
            return false;
        }
        second = OxPlatformJoinPath(listFilePath, name);
        in.reset(OxPlatformOpenInput(second.c_str(), false));
        if (!in->is_open() || !in->good()) {
            std::cerr << "Unable to open list file.\n"
                      << "  Tried " << name << " and " << second << "\n"
                      << std::flush;
            return false;
        }
    }
    char line[lineBufferSize];
    // getline fails on a line that does not fit, which ends this file.
    while (in->getline(line, lineBufferSize)) {
        if (isComment(line) == OxTrue) {
            continue;
        }
        stripComment(line);
        OxString::stripWhite(line);
        if (line[0] == '\0') {
            continue;
        }
        add(line);
    }
    return true;
}

OxBool OxFileList::readListFiles() {
    for (unsigned int i = 0; i < listFiles.getLength(); i++) {
        bool read = false;
        if (listFiles[i] == nullptr) {
            continue;
        }
        if (!withMemory([&] { read = readListFile(listFiles[i]); })) {
            reportNoMemory(); // the names read before stay, each whole
            return OxFalse;
        }
        if (!read) {
            return OxFalse;
        }
    }
    return OxTrue;
}

std::ostrstream* OxFileList::dump(std::ostrstream* s) const {
    if (s == nullptr) {
        return s;
    }
    *s << "---- OxFileList\n";
    *s << "Files containing the lists of files to be processed:\n";
    for (unsigned int i = 0; i < listFiles.getLength(); i++) {
        *s << (listFiles[i] != nullptr ? listFiles[i] : "") << "\n";
    }
    *s << "File names in this file list:\n";
    for (unsigned int i = 0; i < fileNames.getLength(); i++) {
        *s << (fileNames[i] != nullptr ? fileNames[i] : "") << "\n";
    }
    *s << "---- End of OxFileList\n";
    return s;
}
