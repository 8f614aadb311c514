// Message capture for the document tests: starts the message subsystem on a
// message file of its own, whose texts spell out every argument, and collects
// what is logged.
#ifndef OXBASE_TESTS_DOC_OXXMLTESTMESSAGES_H
#define OXBASE_TESTS_DOC_OXXMLTESTMESSAGES_H

#include "oxbase/diag/OxMsg.h"
#include "support/OxTestSupport.h"

#include <memory>
#include <string>
#include <vector>

namespace oxtest {

class XmlMessages {
public:
    XmlMessages() {
        writeFile(dir.file("xml.msg"), "0 messages of the document tests\n"
                                       "1,I,0open %s\n"
                                       "2,I,0read %s\n"
                                       "3,I,0seek %s\n"
                                       "18,I,0eof\n"
                                       "19,I,0fail\n"
                                       "20,I,0bad\n"
                                       "179,I,0write %s\n"
                                       "560,I,0e560\n"
                                       "561,I,0e561\n"
                                       "562,I,0e562\n"
                                       "564,I,0e564\n"
                                       "566,I,0at %s|%u|%u|%s\n"
                                       "567,I,0mismatch %s|%u|%u|%s|%s\n"
                                       "568,I,0second %s|%u|%u|%s\n"
                                       "569,I,0nul %s|%u|%u\n"
                                       "579,I,0written %s\n");
        msg = std::make_unique<OxMsg>(dir.file("xml.msg").c_str(), nullptr, "xml.log",
                                      dir.path().c_str());
        OxMsg::setMsgCallback(collect);
        OxMsg::setMsgCallbackUserData(&texts);
    }
    ~XmlMessages() { OxMsg::setMsgCallback(nullptr); }

    /// The texts logged so far, without a line end: "e561".
    /// Empty texts are left out.
    std::vector<std::string> take() {
        std::vector<std::string> result;
        for (const std::string& text : texts) {
            if (text.empty()) {
                continue; // a print object flushing nothing at its end
            }
            std::string body = text;
            while (!body.empty() && body.back() == '\n') {
                body.pop_back();
            }
            result.push_back(body);
        }
        texts.clear();
        return result;
    }

    TempDir dir;

private:
    static void collect(const char* text, void* userData) {
        static_cast<std::vector<std::string>*>(userData)->push_back(text);
    }

    std::vector<std::string> texts;
    std::unique_ptr<OxMsg> msg;
};

} // namespace oxtest

#endif
