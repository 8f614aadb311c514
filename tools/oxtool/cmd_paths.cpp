// oxtool paths: shows what each path operation of OxFile makes of the given
// paths, with the Windows text rules that hold on every platform.
//
//   oxtool paths 'c:\parts\wheel.xml' 'assembly\hub.bin'
//
// Texts are shown in double quotes, a null result as <null>. The command also
// adds a demo step that writes typed values with OxOutput and reads them back
// with OxInput and OxMemory.
#include "OxToolCommand.h"
#include "OxToolFiles.h"

#include "oxbase/diag/OxMsg.h"
#include "oxbase/io/OxFile.h"
#include "oxbase/io/OxInput.h"
#include "oxbase/io/OxMemory.h"
#include "oxbase/io/OxOutput.h"

#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

namespace {

void showText(const char* label, char* text) {
    if (text == nullptr) {
        std::printf("  %-20s <null>\n", label);
    } else {
        std::printf("  %-20s \"%s\"\n", label, text);
    }
    delete[] text;
}

void showBool(const char* label, OxBool value) {
    std::printf("  %-20s %s\n", label, value == OxTrue ? "true" : "false");
}

void showPath(const char* path) {
    std::printf("\"%s\"\n", path);
    showText("getBaseName", OxFile::getBaseName(path));
    showText("getFileName", OxFile::getFileName(path));
    showText("getRelativePath", OxFile::getRelativePath(path));
    showText("getAbsolutePath", OxFile::getAbsolutePath(path));
    showText("pathToFileName", OxFile::pathToFileName(path));
    showText("getFileExtension", OxFile::getFileExtension(path));
    showText("stripFileExtension", OxFile::stripFileExtension(path));
    std::vector<char> copy(path, path + std::strlen(path) + 1);
    OxFile::cleanupFileName(copy.data());
    std::printf("  %-20s \"%s\"\n", "cleanupFileName", copy.data());
    showBool("isAbsolutePath", OxFile::isAbsolutePath(path));
    showBool("exists", OxFile::exists(path));
    showBool("isDirectory", OxFile::isDirectory(path));
    showBool("isRegularFile", OxFile::isRegularFile(path));
}

int runPaths(const OxToolContext& context) {
    for (const std::string& path : context.operands) {
        showPath(path.c_str());
    }
    return 0;
}

// Demo: a few paths, then typed values written big-endian and read back.
int demoPaths(const OxToolDemoContext& context) {
    std::string logPath = oxtoolLibraryPath(oxtoolJoin(context.outDir, "paths-demo.log"));
    OxMsg msg(oxtoolLibraryPath(context.messageFile).c_str(), nullptr, logPath.c_str(), nullptr);
    for (const char* path : {"c:\\parts\\wheel.xml", "assembly\\hub.bin", "\\\\srv\\share\\f"}) {
        showPath(path);
    }

    std::string binPath = oxtoolJoin(context.outDir, "values.bin");
    {
        OxOutput out(binPath.c_str(), OxFile::FILE_MODE_BINARY);
        if (out.isGood() != OxTrue) {
            return 1;
        }
        out.write('X');
        out.write(static_cast<short>(-2));
        out.write(16909060);
        out.write(1.0f);
        out.write(3.14159265358979);
    }
    OxInput in(binPath.c_str(), OxFile::FILE_MODE_BINARY);
    if (in.isGood() != OxTrue) {
        return 1;
    }
    char c = 0;
    short s = 0;
    int i = 0;
    float f = 0;
    double d = 0;
    long long total = in.read(c) + in.read(s) + in.read(i) + in.read(f) + in.read(d);
    std::printf("OxInput  %lld bytes: char %c, short %d, int %d, float %g, double %.14g\n", total,
                c, s, i, static_cast<double>(f), d);

    // The whole file in memory, with the one spare byte the bounds rule wants.
    std::vector<unsigned char> bytes(static_cast<size_t>(in.getFileLength()) + 1, 0);
    in.seek(0, 0);
    in.read(bytes.data(), static_cast<unsigned int>(in.getFileLength()));
    OxMemory memory(bytes.data(), static_cast<unsigned int>(bytes.size()));
    c = 0, s = 0, i = 0, f = 0, d = 0;
    total = memory.read(c) + memory.read(s) + memory.read(i) + memory.read(f) + memory.read(d);
    std::printf("OxMemory %lld bytes: char %c, short %d, int %d, float %g, double %.14g\n", total,
                c, s, i, static_cast<double>(f), d);

    std::ostrstream hex;
    in.hexDump(&hex);
    std::fputs(oxtoolStreamText(hex).c_str(), stdout);
    return 0;
}

OxToolRegistration registration{
    {"paths",
     "PATH...",
     "show what each path operation makes of the paths",
     "Shows what each path operation of OxFile makes of each PATH. The operations\n"
     "follow the Windows text rules on every platform: '\\' separates, \"c:\" is a drive,\n"
     "and a POSIX path such as /usr/share/a.xml has no separator they know of (its\n"
     "base name is the whole text). PATH is a text here, \"-\" included; exists,\n"
     "isDirectory and isRegularFile ask the file system.\n",
     {},
     1,
     -1,
     runPaths,
     demoPaths,
     30}};

} // namespace
