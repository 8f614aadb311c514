// OxToolMessages.cpp: message file lookup, the session, and telling logged
// messages apart.
//
// The library hands a callback the formatted text only. The tool learns the
// rest as follows:
// - Severity: the library raises the error code before it calls the
//   callback, so the callback reads the code and sets it back to none; the
//   tool keeps the worst (oxtoolRaise) and the next message starts afresh.
// - Number and line: at start every number the library logs is formatted
//   once with marker arguments (OxMsg::LogToString). Where the markers stand
//   in the result, the real arguments stand in a real text, so the result
//   becomes a pattern; a logged text that matches the pattern of a number is
//   that number, and the numbers whose second argument is a document line
//   (566 to 569) give their line.
#include "OxToolMessages.h"

#include "OxToolCommand.h"
#include "OxToolFiles.h"

#include "oxbase/OxVersion.h"
#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxMsgNumbers.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <iostream>
#include <regex>

#ifndef OXTOOL_DEFAULT_DATA_DIR
#define OXTOOL_DEFAULT_DATA_DIR "data"
#endif

namespace fs = std::filesystem;

namespace {

constexpr unsigned int kMaxArguments = 5;

/// The pattern of one library number.
struct Pattern {
    unsigned int number = 0;
    std::regex expression;
    int lineGroup = 0; ///< sub-match holding the line, 0 for none
};

struct State {
    std::vector<Pattern> patterns;
    std::vector<OxToolMessage>* sink = nullptr;
    unsigned int lastPlaceLine = 0; ///< line of the last 566, for the error behind it
    bool lastWasPlace = false;
};

State& state() {
    static State instance;
    return instance;
}

std::string stringMarker(unsigned int index) {
    return std::string("\x1a") + static_cast<char>('A' + index) + "\x1a";
}

unsigned int numberMarker(unsigned int index) {
    return 3000000017u + index * 1000003u;
}

/// Formats `number` with markers of the kinds in `kinds`, one argument at a
/// time: each step adds the next argument with its real type.
template <unsigned int Depth, class... Arguments>
const char* formatWithMarkers(unsigned int number, const std::string& kinds,
                              const std::vector<std::string>& strings, Arguments... arguments) {
    if constexpr (Depth == kMaxArguments) {
        return OxMsg::LogToString(number, arguments...);
    } else {
        if (Depth >= kinds.size()) {
            return OxMsg::LogToString(number, arguments...);
        }
        if (kinds[Depth] == 's') {
            return formatWithMarkers<Depth + 1>(number, kinds, strings, arguments...,
                                                strings[Depth].c_str());
        }
        return formatWithMarkers<Depth + 1>(number, kinds, strings, arguments...,
                                            numberMarker(Depth));
    }
}

std::string escapeForRegex(const std::string& text) {
    static const std::string special = "\\^$.|?*+()[]{}";
    std::string escaped;
    for (char c : text) {
        if (special.find(c) != std::string::npos) {
            escaped += '\\';
        }
        escaped += c;
    }
    return escaped;
}

/// Whether the second argument of `number` is the line of a document.
bool carriesLine(unsigned int number) {
    return number == OxMsgXmlErrorPlace || number == OxMsgXmlEndTagMismatch ||
           number == OxMsgXmlSecondTopLevel || number == OxMsgXmlNulBytes;
}

/// The pattern of `number`, from its text formatted with markers.
bool buildPattern(unsigned int number, Pattern& pattern) {
    const char* kindsText = OxMsgLibraryArguments(number);
    std::string kinds = kindsText != nullptr ? kindsText : "";
    if (kinds.size() > kMaxArguments) {
        return false;
    }
    std::vector<std::string> strings;
    for (unsigned int i = 0; i < kMaxArguments; i++) {
        strings.push_back(stringMarker(i));
    }
    const char* formatted = formatWithMarkers<0>(number, kinds, strings);
    if (formatted == nullptr) {
        return false;
    }
    std::string text = formatted;
    // Where each argument landed: a text marker, or a number in one of the
    // forms a conversion of an unsigned argument prints.
    struct Place {
        size_t at;
        size_t length;
        unsigned int argument;
    };
    std::vector<Place> places;
    for (unsigned int i = 0; i < kinds.size(); i++) {
        std::vector<std::string> forms;
        if (kinds[i] == 's') {
            forms.push_back(strings[i]);
        } else {
            char buffer[3][32];
            std::snprintf(buffer[0], sizeof buffer[0], "%u", numberMarker(i));
            std::snprintf(buffer[1], sizeof buffer[1], "%d", static_cast<int>(numberMarker(i)));
            std::snprintf(buffer[2], sizeof buffer[2], "%x", numberMarker(i));
            forms.assign({buffer[0], buffer[1], buffer[2]});
        }
        for (const std::string& form : forms) {
            for (size_t at = text.find(form); at != std::string::npos;
                 at = text.find(form, at + form.size())) {
                places.push_back({at, form.size(), i});
            }
        }
    }
    std::sort(places.begin(), places.end(),
              [](const Place& a, const Place& b) { return a.at < b.at; });
    std::string expression;
    size_t position = 0;
    int group = 0;
    pattern.lineGroup = 0;
    for (const Place& place : places) {
        if (place.at < position) {
            return false; // overlapping forms: no reliable pattern
        }
        expression += escapeForRegex(text.substr(position, place.at - position));
        group++;
        expression += kinds[place.argument] == 's' ? "([\\s\\S]*?)" : "(-?[0-9A-Fa-f]+)";
        if (place.argument == 1 && carriesLine(number) && pattern.lineGroup == 0) {
            pattern.lineGroup = group;
        }
        position = place.at + place.length;
    }
    expression += escapeForRegex(text.substr(position));
    pattern.number = number;
    pattern.expression = std::regex(expression, std::regex::ECMAScript);
    return true;
}

void buildPatterns() {
    State& s = state();
    s.patterns.clear();
    std::ostringstream discard;
    std::streambuf* saved = std::cerr.rdbuf(discard.rdbuf());
    for (unsigned int i = 0; OxMsgLibraryNumber(i) != 0; i++) {
        Pattern pattern;
        if (buildPattern(OxMsgLibraryNumber(i), pattern)) {
            s.patterns.push_back(std::move(pattern));
        }
    }
    std::cerr.rdbuf(saved);
    // Numbers with a line first: their texts are the most specific.
    std::stable_sort(s.patterns.begin(), s.patterns.end(), [](const Pattern& a, const Pattern& b) {
        return (a.lineGroup != 0) > (b.lineGroup != 0);
    });
}

void identify(OxToolMessage& message) {
    State& s = state();
    for (const Pattern& pattern : s.patterns) {
        std::smatch match;
        if (std::regex_match(message.text, match, pattern.expression)) {
            message.number = pattern.number;
            if (pattern.lineGroup != 0) {
                message.line = static_cast<unsigned int>(
                    std::strtoul(match[pattern.lineGroup].str().c_str(), nullptr, 10));
            }
            break;
        }
    }
    // The error's own number follows the place of the error.
    if (message.line == 0 && s.lastWasPlace) {
        message.line = s.lastPlaceLine;
    }
    s.lastWasPlace = message.number == OxMsgXmlErrorPlace;
    s.lastPlaceLine = message.line;
}

void onMessage(const char* text, void*) {
    OxErrorCode severity = OxMsg::getErrorCode();
    OxMsg::setErrorCode(OxErrorNone);
    State& s = state();
    if (s.sink == nullptr) {
        oxtoolRaise(severity);
        return;
    }
    OxToolMessage message;
    message.severity = severity;
    message.text = text != nullptr ? text : "";
    identify(message);
    s.sink->push_back(std::move(message));
}

} // namespace

std::vector<std::string> oxtoolMessageFileCandidates(const std::string& executable) {
    std::vector<std::string> candidates;
    if (!executable.empty()) {
        // The prefix is the program's directory less the components of the
        // program directory below the prefix ("bin": one level up).
        fs::path prefix = fs::path(executable).parent_path();
        for (const fs::path& part : fs::path(OXBASE_BIN_DIR_FROM_PREFIX)) {
            if (!part.empty() && part != ".") {
                prefix = prefix.parent_path();
            }
        }
        candidates.push_back((prefix / OXBASE_DATA_DIR_FROM_PREFIX / OXBASE_MESSAGE_FILE)
                                 .lexically_normal()
                                 .string());
    }
    // The build's directories are written with '/'; the library takes only
    // the platform's separator (a backslash on Windows) as one.
    candidates.push_back(
        (fs::path(OXTOOL_DEFAULT_DATA_DIR) / OXBASE_MESSAGE_FILE).make_preferred().string());
    candidates.push_back(
        (fs::path(OXBASE_DATA_DIR) / OXBASE_MESSAGE_FILE).make_preferred().string());
    return candidates;
}

std::string oxtoolFindMessageFile(const std::string& executable) {
    for (const std::string& candidate : oxtoolMessageFileCandidates(executable)) {
        if (oxtoolIsFile(candidate)) {
            return candidate;
        }
    }
    return "";
}

OxToolMessageSession::OxToolMessageSession() = default;

OxToolMessageSession::~OxToolMessageSession() {
    stop();
}

bool OxToolMessageSession::start(const std::string& messageFile, const std::string& logFile,
                                 bool verbose) {
    stop();
    std::string messages = oxtoolLibraryPath(messageFile);
    std::string log = oxtoolLibraryPath(logFile);
    msg = std::make_unique<OxMsg>(messages.c_str(), nullptr, log.empty() ? nullptr : log.c_str(),
                                  nullptr);
    if (OxMsg::isValid() != OxTrue) {
        msg.reset();
        return false;
    }
    OxMsg::setVerboseState(verbose ? OxTrue : OxFalse);
    buildPatterns();
    OxMsg::setMsgCallback(onMessage);
    OxMsg::setMsgCallbackUserData(nullptr);
    return true;
}

void OxToolMessageSession::stop() {
    if (msg != nullptr) {
        OxErrorCode code = OxMsg::getErrorCode();
        msg.reset();
        OxMsg::setErrorCode(code);
    }
}

OxToolMessageCapture::OxToolMessageCapture(std::vector<OxToolMessage>* sink, bool offStderr,
                                           bool offLog)
    : previousSink(state().sink) {
    state().sink = sink;
    state().lastWasPlace = false;
    if (offStderr) {
        savedError = std::cerr.rdbuf(errors.rdbuf());
    }
    std::ofstream* log = OxMsg::getLogFile();
    if (offLog && log != nullptr) {
        // The stream's own buffer goes aside for a while; putting it back
        // clears any state the discarded writes left.
        savedLog = static_cast<std::ostream&>(*log).rdbuf(discardedLog.rdbuf());
    }
}

OxToolMessageCapture::~OxToolMessageCapture() {
    state().sink = previousSink;
    if (savedError != nullptr) {
        std::cerr.rdbuf(savedError);
    }
    std::ofstream* log = OxMsg::getLogFile();
    if (savedLog != nullptr && log != nullptr) {
        static_cast<std::ostream&>(*log).rdbuf(savedLog);
    }
}

const char* oxtoolSeverityName(OxErrorCode severity) {
    switch (severity) {
    case OxErrorNone:
        return "info";
    case OxErrorWarning:
        return "warning";
    case OxErrorError:
        return "error";
    case OxErrorSevere:
        return "severe";
    case OxErrorFatal:
        return "fatal";
    }
    return "unknown";
}
