// Path operations of OxFile: every static text operation on texts from the
// input (split at NUL bytes into up to three texts; the last byte of the
// input gives the levels of getBaseName and getFileName), each result
// released with delete[] as the contract says. Checked, from the rules of
// the Windows path form (separator "\", an optional drive prefix "c:"):
//   - getBaseName gives a prefix of the path and getFileName a suffix, for
//     any levels; levels 0 gives a copy;
//   - stripFileExtension, ".", getFileExtension give the path back whenever
//     the path has a period after its first character;
//   - isAbsolutePath tells a rooted path; getAbsolutePath returns a rooted
//     path unchanged ("\" alone may get a drive) and ends any other in the
//     path less its drive prefix;
//   - getRelativePath drops the separators behind the root and keeps the
//     drive; pathToFileName is that less the drive with "\" as "_";
//   - makeFileSpec joins with exactly one "\" added where needed;
//   - cleanupFileName keeps the length and replaces exactly ( ) * - / [ ];
//   - compareFileSpecs is reflexive and symmetric.
#include "OxFuzzSupport.h"

#include "oxbase/io/OxFile.h"

#include <cctype>
#include <cstdint>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

namespace {

/// Owns a result of the path operations (a new[] array, or null).
using Text = std::unique_ptr<char[]>;

std::string textOf(const Text& text) {
    return text != nullptr ? oxfuzz::shown(text.get()) : std::string("(null)");
}

bool isPrefix(const char* part, const std::string& whole) {
    return std::strncmp(part, whole.c_str(), std::strlen(part)) == 0 &&
           std::strlen(part) <= whole.size();
}

bool isSuffix(const char* part, const std::string& whole) {
    size_t length = std::strlen(part);
    return length <= whole.size() && whole.compare(whole.size() - length, length, part) == 0;
}

bool hasDrive(const std::string& path) {
    return path.size() >= 2 && std::isalpha(static_cast<unsigned char>(path[0])) != 0 &&
           path[1] == ':';
}

bool isRooted(const std::string& path) {
    size_t root = hasDrive(path) ? 3 : 1;
    return path.size() >= root && path[root - 1] == '\\';
}

void checkComponents(const std::string& path, unsigned int levels) {
    for (unsigned int level : {0u, 1u, levels}) {
        Text base(OxFile::getBaseName(path.c_str(), level));
        Text name(OxFile::getFileName(path.c_str(), level));
        OXFUZZ_CHECK(base == nullptr || isPrefix(base.get(), path),
                     "getBaseName(\"%s\", %u) gave %s, no prefix", oxfuzz::shown(path).c_str(),
                     level, textOf(base).c_str());
        OXFUZZ_CHECK(name == nullptr || isSuffix(name.get(), path),
                     "getFileName(\"%s\", %u) gave %s, no suffix", oxfuzz::shown(path).c_str(),
                     level, textOf(name).c_str());
        if (level == 0) {
            for (const Text* copy : {&base, &name}) {
                OXFUZZ_CHECK(path.empty() ? *copy == nullptr
                                          : *copy != nullptr && path == copy->get(),
                             "levels 0 of \"%s\" gave %s", oxfuzz::shown(path).c_str(),
                             textOf(*copy).c_str());
            }
        }
    }
    Text one(OxFile::getBaseName(path.c_str()));
    Text same(OxFile::getBaseName(path.c_str(), 1));
    OXFUZZ_CHECK((one == nullptr && same == nullptr) ||
                     (one != nullptr && same != nullptr && std::strcmp(one.get(), same.get()) == 0),
                 "getBaseName(path) differs from getBaseName(path, 1)");
    Text file(OxFile::getFileName(path.c_str()));
    Text fileOne(OxFile::getFileName(path.c_str(), 1));
    OXFUZZ_CHECK(
        (file == nullptr && fileOne == nullptr) ||
            (file != nullptr && fileOne != nullptr && std::strcmp(file.get(), fileOne.get()) == 0),
        "getFileName(path) differs from getFileName(path, 1)");
}

void checkExtension(const std::string& path) {
    Text extension(OxFile::getFileExtension(path.c_str()));
    Text stem(OxFile::stripFileExtension(path.c_str()));
    size_t period = path.size() > 1 ? path.find_last_of('.') : std::string::npos;
    if (period == 0) {
        period = std::string::npos;
    }
    if (period == std::string::npos) {
        OXFUZZ_CHECK(extension == nullptr && stem == nullptr,
                     "\"%s\" has no period but gave %s and %s", oxfuzz::shown(path).c_str(),
                     textOf(extension).c_str(), textOf(stem).c_str());
        return;
    }
    std::string joined = std::string(stem != nullptr ? stem.get() : "") + "." +
                         (extension != nullptr ? extension.get() : "");
    OXFUZZ_CHECK(stem != nullptr && joined == path &&
                     (extension == nullptr) == (period + 1 == path.size()),
                 "\"%s\" split into %s and %s", oxfuzz::shown(path).c_str(), textOf(stem).c_str(),
                 textOf(extension).c_str());
}

void checkRootAndRelative(const std::string& path) {
    bool rooted = isRooted(path);
    OXFUZZ_CHECK((OxFile::isAbsolutePath(path.c_str()) == OxTrue) == rooted,
                 "isAbsolutePath(\"%s\")", oxfuzz::shown(path).c_str());
    Text absolute(OxFile::getAbsolutePath(path.c_str()));
    OXFUZZ_CHECK(absolute != nullptr, "getAbsolutePath(\"%s\") gave null",
                 oxfuzz::shown(path).c_str());
    if (rooted) {
        OXFUZZ_CHECK(path == absolute.get() || (path == "\\" && isSuffix("\\", absolute.get())),
                     "getAbsolutePath of the rooted \"%s\" gave %s", oxfuzz::shown(path).c_str(),
                     textOf(absolute).c_str());
    } else {
        std::string rest = hasDrive(path) ? path.substr(2) : path;
        OXFUZZ_CHECK(isSuffix(rest.c_str(), absolute.get()) &&
                         absolute.get()[std::strlen(absolute.get()) - rest.size() - 1] == '\\',
                     "getAbsolutePath(\"%s\") gave %s", oxfuzz::shown(path).c_str(),
                     textOf(absolute).c_str());
    }

    Text relative(OxFile::getRelativePath(path.c_str()));
    Text flat(OxFile::pathToFileName(path.c_str()));
    if (path.empty()) {
        OXFUZZ_CHECK(relative == nullptr && flat == nullptr, "an empty path gave %s and %s",
                     textOf(relative).c_str(), textOf(flat).c_str());
        return;
    }
    size_t root = hasDrive(path) ? 3 : 1;
    std::string expected = path;
    if (path.size() >= root) {
        size_t from = path.find_first_not_of('\\', root - 1);
        expected = (root == 3 ? path.substr(0, 2) : std::string()) +
                   (from == std::string::npos ? std::string() : path.substr(from));
    }
    OXFUZZ_CHECK(relative != nullptr && expected == relative.get(),
                 "getRelativePath(\"%s\") gave %s, expected \"%s\"", oxfuzz::shown(path).c_str(),
                 textOf(relative).c_str(), oxfuzz::shown(expected).c_str());
    std::string name = expected.size() >= 2 && expected[1] == ':' ? expected.substr(2) : expected;
    for (char& c : name) {
        c = c == '\\' ? '_' : c;
    }
    OXFUZZ_CHECK(flat != nullptr && name == flat.get(),
                 "pathToFileName(\"%s\") gave %s, expected \"%s\"", oxfuzz::shown(path).c_str(),
                 textOf(flat).c_str(), oxfuzz::shown(name).c_str());
}

void checkCleanup(const std::string& path) {
    std::vector<char> copy(path.begin(), path.end());
    copy.push_back('\0');
    char* result = OxFile::cleanupFileName(copy.data());
    OXFUZZ_CHECK(result == copy.data() && std::strlen(result) == path.size(),
                 "cleanupFileName changed the length of \"%s\"", oxfuzz::shown(path).c_str());
    for (size_t i = 0; i < path.size(); i++) {
        bool replaced = std::strchr("()*-/[]", path[i]) != nullptr;
        OXFUZZ_CHECK(result[i] == (replaced ? '_' : path[i]), "cleanupFileName(\"%s\") at %zu",
                     oxfuzz::shown(path).c_str(), i);
    }
}

void checkPair(const char* first, const char* second) {
    Text fileSpec(OxFile::makeFileSpec(first, second));
    std::string expected;
    if (first == nullptr || second == nullptr) {
        expected = first != nullptr ? first : (second != nullptr ? second : "");
    } else {
        expected = first;
        if (expected.empty() || expected.back() != '\\') {
            expected += '\\';
        }
        expected += second;
    }
    OXFUZZ_CHECK(expected.empty() ? fileSpec == nullptr
                                  : fileSpec != nullptr && expected == fileSpec.get(),
                 "makeFileSpec gave %s, expected \"%s\"", textOf(fileSpec).c_str(),
                 oxfuzz::shown(expected).c_str());
    if (first == nullptr || second == nullptr) {
        return;
    }
    OxBool forward = OxFile::compareFileSpecs(first, second);
    OXFUZZ_CHECK(forward == OxFile::compareFileSpecs(second, first),
                 "compareFileSpecs is not symmetric");
    OXFUZZ_CHECK(OxFile::compareFileSpecs(first, first) == OxTrue,
                 "compareFileSpecs(a, a) is OxFalse for \"%s\"", oxfuzz::shown(first).c_str());
    if (std::strcmp(first, second) == 0) {
        OXFUZZ_CHECK(forward == OxTrue, "equal texts compare unequal");
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, size_t size) {
    oxfuzz::startMessages();
    std::string input(reinterpret_cast<const char*>(data), size);
    std::vector<std::string> texts;
    size_t start = 0;
    while (texts.size() < 3) {
        size_t end = input.find('\0', start);
        texts.push_back(input.substr(start, end - start));
        if (end == std::string::npos) {
            break;
        }
        start = end + 1;
    }
    unsigned int levels = size > 0 ? data[size - 1] % 8 : 2;
    for (const std::string& text : texts) {
        checkComponents(text, levels);
        checkExtension(text);
        checkRootAndRelative(text);
        checkCleanup(text);
    }
    const char* second = texts.size() > 1 ? texts[1].c_str() : nullptr;
    const char* third = texts.size() > 2 ? texts[2].c_str() : nullptr;
    checkPair(texts[0].c_str(), second);
    checkPair(second, third);
    checkPair(third, texts[0].c_str());
    return 0;
}
