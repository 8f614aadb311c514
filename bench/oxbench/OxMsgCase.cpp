// OxBase side of the message case: OxMsg::Log by number, each message
// formatted from the message file and written to the log file with a flush.
// The log file is reopened (truncated) before each run.
#include "OxBench.h"

#include "oxbase/diag/OxMsg.h"

#include <memory>
#include <string>

namespace oxbench {
namespace {

class OxMsgLog : public Runner {
public:
    bool prepare(const Corpus& corpus, std::string& note) override {
        logDir = corpus.logDir;
        count = corpus.nbMessages;
        // The child process starts its own message subsystem over the bench
        // message file.
        messages = std::make_unique<OxMsg>(corpus.messageFile.c_str(), nullptr, "oxbase.log",
                                           logDir.c_str());
        if (OxMsg::isValid() != OxTrue || OxMsg::getLogFile() == nullptr) {
            note = "the message subsystem did not start";
            return false;
        }
        return true;
    }
    Outcome run() override {
        // A fresh log file for each run, as the reference opens its own.
        messages->closeLogFile();
        messages->openLogFile("oxbase.log", logDir.c_str());
        Outcome outcome;
        outcome.ok = OxMsg::getLogFile() != nullptr;
        for (std::size_t i = 0; i < count; i++) {
            OxMsg::Log(kBenchMessage, "bracket", static_cast<int>(i),
                       static_cast<unsigned int>(i % 97));
        }
        OxMsg::getLogFile()->flush();
        outcome.amount = static_cast<double>(count);
        return outcome;
    }
    bool countsItems() const override { return true; }

private:
    std::unique_ptr<OxMsg> messages;
    std::string logDir;
    std::size_t count = 0;
};

Registration oxMsgLog("messages", "OxBase OxMsg::Log by number",
                      [] { return std::make_unique<OxMsgLog>(); });

} // namespace
} // namespace oxbench
