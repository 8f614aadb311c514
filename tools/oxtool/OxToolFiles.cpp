// OxToolFiles.cpp: program location, scratch directories and whole files.
#include "OxToolFiles.h"

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <random>
#include <sstream>

namespace fs = std::filesystem;

namespace {
/// PATH separates its directories by ';' where paths use '\\' (Windows) and
/// by ':' elsewhere.
constexpr char kPathListSeparator = fs::path::preferred_separator == '\\' ? ';' : ':';

bool isSeparator(char c) {
    return c == '/' || c == '\\';
}
} // namespace

std::string oxtoolExecutablePath(const char* argv0) {
    if (argv0 == nullptr || *argv0 == '\0') {
        return "";
    }
    std::error_code error;
    std::string name = argv0;
    bool hasDirectory = name.find_first_of("/\\") != std::string::npos;
    if (hasDirectory) {
        fs::path found = fs::weakly_canonical(fs::absolute(name, error), error);
        return error ? "" : found.string();
    }
    const char* pathList = std::getenv("PATH");
    std::string list = pathList != nullptr ? pathList : "";
    std::stringstream directories(list);
    std::string directory;
    while (std::getline(directories, directory, kPathListSeparator)) {
        if (directory.empty()) {
            continue;
        }
        for (const char* suffix : {"", ".exe"}) {
            fs::path candidate = fs::path(directory) / (name + suffix);
            if (fs::is_regular_file(candidate, error)) {
                fs::path found = fs::weakly_canonical(fs::absolute(candidate, error), error);
                return error ? "" : found.string();
            }
        }
    }
    return "";
}

OxToolTempDir::OxToolTempDir() {
    std::error_code error;
    fs::path base = fs::temp_directory_path(error);
    if (error) {
        return;
    }
    std::random_device device;
    std::mt19937_64 generator((static_cast<unsigned long long>(device()) << 32) ^
                              static_cast<unsigned long long>(
                                  std::chrono::steady_clock::now().time_since_epoch().count()));
    for (int attempt = 0; attempt < 100; attempt++) {
        char name[40];
        std::snprintf(name, sizeof name, "oxtool-%016llx",
                      static_cast<unsigned long long>(generator()));
        fs::path candidate = base / name;
        if (fs::create_directory(candidate, error) && !error) {
            dir = candidate.string();
            return;
        }
    }
}

OxToolTempDir::~OxToolTempDir() {
    if (!dir.empty()) {
        std::error_code error;
        fs::remove_all(dir, error);
    }
}

std::string OxToolTempDir::file(const std::string& name) const {
    return (fs::path(dir) / name).string();
}

bool oxtoolReadBytes(const std::string& path, std::string& bytes) {
    std::ifstream in(fs::path(path), std::ios::in | std::ios::binary);
    if (!in) {
        return false;
    }
    std::ostringstream text;
    text << in.rdbuf();
    bytes = text.str();
    return !in.bad();
}

bool oxtoolWriteBytes(const std::string& path, const std::string& bytes) {
    std::ofstream out(fs::path(path), std::ios::out | std::ios::binary | std::ios::trunc);
    out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
    out.close();
    return !out.fail();
}

bool oxtoolCopyStdinTo(const std::string& path) {
    std::ofstream out(fs::path(path), std::ios::out | std::ios::binary | std::ios::trunc);
    char block[65536];
    while (std::cin.read(block, sizeof block) || std::cin.gcount() > 0) {
        out.write(block, std::cin.gcount());
    }
    out.close();
    return !out.fail() && !std::cin.bad();
}

bool oxtoolCopyToStdout(const std::string& path) {
    std::string bytes;
    if (!oxtoolReadBytes(path, bytes)) {
        return false;
    }
    std::fflush(stdout);
    bool written = std::fwrite(bytes.data(), 1, bytes.size(), stdout) == bytes.size();
    return std::fflush(stdout) == 0 && written;
}

std::string oxtoolLibraryPath(const std::string& path) {
    if (path.empty() || isSeparator(path[0])) {
        return path;
    }
    std::error_code error;
    fs::path absolute = fs::absolute(path, error);
    fs::path cwd = fs::current_path(error);
    if (error) {
        return path;
    }
    fs::path relative = absolute.lexically_relative(cwd);
    return relative.empty() ? path : relative.string();
}

bool oxtoolIsFile(const std::string& path) {
    std::error_code error;
    return fs::is_regular_file(path, error);
}
