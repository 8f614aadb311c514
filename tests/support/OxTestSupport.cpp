#include "support/OxTestSupport.h"

#include "oxbase/diag/OxMsg.h"

#include <atomic>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <random>
#include <sstream>

#ifndef _WIN32
#include <csignal>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>
#endif

namespace oxtest {

TempDir::TempDir() {
    static std::atomic<unsigned> counter{0};
    std::random_device seed;
    std::filesystem::path base = std::filesystem::temp_directory_path();
    for (;;) {
        std::filesystem::path candidate =
            base / ("oxbase-test-" + std::to_string(seed()) + "-" + std::to_string(counter++));
        std::error_code error;
        if (std::filesystem::create_directory(candidate, error)) {
            dir = candidate.string();
            return;
        }
    }
}

TempDir::~TempDir() {
    std::error_code error;
    // Make everything writable and searchable again, so that tests that take
    // permissions away do not leave debris behind.
    for (auto it = std::filesystem::recursive_directory_iterator(
             dir, std::filesystem::directory_options::skip_permission_denied, error);
         !error && it != std::filesystem::recursive_directory_iterator(); it.increment(error)) {
        if (!it->is_symlink()) {
            std::filesystem::permissions(it->path(), std::filesystem::perms::owner_all,
                                         std::filesystem::perm_options::add, error);
        }
    }
    std::filesystem::remove_all(dir, error);
}

std::string native(std::string path) {
    for (char& c : path) {
        if (c == '/') {
            c = kSep;
        }
    }
    return path;
}

std::string TempDir::file(const std::string& name) const {
    return dir + kSep + native(name);
}

std::string readFile(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    std::ostringstream bytes;
    bytes << in.rdbuf();
    return bytes.str();
}

std::string readText(const std::string& path) {
    std::string bytes = readFile(path);
#ifdef _WIN32
    std::string text;
    text.reserve(bytes.size());
    for (size_t i = 0; i < bytes.size(); i++) {
        if (bytes[i] == '\r' && i + 1 < bytes.size() && bytes[i + 1] == '\n') {
            continue; // the '\n' follows
        }
        if (bytes[i] == '\n' && (i == 0 || bytes[i - 1] != '\r')) {
            text += "<LF without CR>";
        }
        text += bytes[i];
    }
    return text;
#else
    return bytes;
#endif
}

std::string textBytes(const std::string& text) {
#ifdef _WIN32
    std::string bytes;
    bytes.reserve(text.size() + text.size() / 8);
    for (char c : text) {
        if (c == '\n') {
            bytes += '\r';
        }
        bytes += c;
    }
    return bytes;
#else
    return text;
#endif
}

void writeFile(const std::string& path, const std::string& bytes) {
    std::ofstream out(path, std::ios::binary | std::ios::trunc);
    out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
}

std::string dataFile(const std::string& name) {
    return native(std::string(OXBASE_DATA_DIR) + "/" + name);
}

std::string streamText(std::ostrstream& stream) {
    // str() freezes the buffer; thaw it again so the stream stays usable.
    const char* text = stream.str();
    std::string copy(text, static_cast<size_t>(stream.pcount()));
    stream.freeze(false);
    return copy;
}

MessageLog::MessageLog(const std::string& lines) {
    writeFile(dir.file("test.msg"), lines);
    msg = std::make_unique<OxMsg>(dir.file("test.msg").c_str(), nullptr, "test.log",
                                  dir.path().c_str());
    OxMsg::setMsgCallback([](const char* text, void* userData) {
        static_cast<std::vector<std::string>*>(userData)->push_back(text);
    });
    OxMsg::setMsgCallbackUserData(&texts);
}

MessageLog::~MessageLog() {
    OxMsg::setMsgCallback(nullptr);
}

std::vector<std::string> MessageLog::take() {
    std::vector<std::string> result;
    for (std::string text : texts) {
        while (!text.empty() && text.back() == '\n') {
            text.pop_back();
        }
        if (!text.empty()) {
            result.push_back(text);
        }
    }
    texts.clear();
    return result;
}

#ifndef _WIN32
bool canFork() {
    return true;
}

std::string inChild(const std::function<std::string()>& body, ChildLimits limits) {
    int ends[2];
    if (pipe(ends) != 0) {
        return "no pipe";
    }
    std::cout.flush();
    std::cerr.flush();
    pid_t child = fork();
    if (child < 0) {
        close(ends[0]);
        close(ends[1]);
        return "no fork";
    }
    if (child == 0) {
        close(ends[0]);
        std::string result;
        if (limits.dropRights && (setgid(65534) != 0 || setuid(65534) != 0)) {
            result = "cannot drop rights";
        } else {
            if (limits.fileSizeLimit != 0) {
                std::signal(SIGXFSZ, SIG_IGN);
                rlimit limit{limits.fileSizeLimit, limits.fileSizeLimit};
                setrlimit(RLIMIT_FSIZE, &limit);
            }
            result = body();
        }
        ssize_t written = write(ends[1], result.data(), result.size());
        _exit(written == static_cast<ssize_t>(result.size()) ? 0 : 1);
    }
    close(ends[1]);
    std::string result;
    char buffer[4096];
    for (ssize_t got; (got = read(ends[0], buffer, sizeof buffer)) > 0;) {
        result.append(buffer, static_cast<size_t>(got));
    }
    close(ends[0]);
    int status = 0;
    waitpid(child, &status, 0);
    if (!WIFEXITED(status) || WEXITSTATUS(status) != 0) {
        return result + " [child ended abnormally, status " + std::to_string(status) + "]";
    }
    return result;
}
#else
bool canFork() {
    return false;
}

std::string inChild(const std::function<std::string()>&, ChildLimits) {
    return "no fork on this platform";
}
#endif

CommandResult runCommand(const std::string& command, const std::string& input) {
    TempDir outputs;
    std::string line = command;
#ifdef _WIN32
    line += " < \"" + (input.empty() ? std::string("NUL") : input) + "\"";
#else
    line += " < \"" + (input.empty() ? std::string("/dev/null") : input) + "\"";
#endif
    line += " > \"" + outputs.file("out") + "\" 2> \"" + outputs.file("err") + "\"";
#ifdef _WIN32
    // cmd /c drops the first and the last quote of a line that starts with
    // one; a pair around the whole line keeps those of the command.
    line = "\"" + line + "\"";
#endif
    std::cout.flush();
    int raw = std::system(line.c_str());
    CommandResult result;
#ifdef _WIN32
    result.status = raw;
#else
    result.status = raw != -1 && WIFEXITED(raw) ? WEXITSTATUS(raw) : -1;
#endif
    result.out = readFile(outputs.file("out"));
    result.err = readFile(outputs.file("err"));
#ifdef _WIN32
    // Text written to a redirected standard stream ends its lines with CR LF
    // (Wine's cmd adds one more CR); the tests compare lines.
    for (std::string* text : {&result.out, &result.err}) {
        std::string lines;
        for (size_t i = 0; i < text->size(); i++) {
            size_t end = text->find_first_not_of('\r', i);
            if ((*text)[i] == '\r' && end != std::string::npos && (*text)[end] == '\n') {
                i = end - 1;
                continue;
            }
            lines += (*text)[i];
        }
        *text = lines;
    }
#endif
    return result;
}

} // namespace oxtest
