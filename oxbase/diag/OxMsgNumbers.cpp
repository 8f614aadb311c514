#include "oxbase/diag/OxMsgNumbers.h"

namespace {

struct LoggedMessage {
    unsigned int number;
    const char* arguments;
};

// Every number the library logs with the kinds of its arguments, by number.
constexpr LoggedMessage kLogged[] = {
    {OxMsgFileOpen, "s"},
    {OxMsgFileRead, "s"},
    {OxMsgFileShortRead, "s"},
    {OxMsgStreamEnd, ""},
    {OxMsgStreamFailed, ""},
    {OxMsgStreamBad, ""},
    {OxMsgMemoryPastEnd, ""},
    {OxMsgMemoryBeforeStart, ""},
    {OxMsgMemoryBeyondEnd, ""},
    {OxMsgMatrixSingular, ""},
    {OxMsgFileWrite, "s"},
    {OxMsgDirectoryCreate, "s"},
    {OxMsgNotADirectory, "s"},
    {OxMsgFileRemoveExisting, "s"},
    {OxMsgFileClose, "s"},
    {OxMsgNoMemory, "s"},
    {OxMsgRangeSyntax, "sus"},
    {OxMsgRangeBackwards, "suu"},
    {OxMsgFileRemove, "ss"},
    {OxMsgCwdUnreadable, "s"},
    {OxMsgXmlNoQuote, ""},
    {OxMsgXmlNoDeclaration, ""},
    {OxMsgXmlInnerDeclaration, ""},
    {OxMsgXmlBadTagEnd, ""},
    {OxMsgXmlErrorPlace, "suus"},
    {OxMsgXmlEndTagMismatch, "suuss"},
    {OxMsgXmlSecondTopLevel, "suus"},
    {OxMsgXmlNulBytes, "suu"},
    {OxMsgCsvWritten, "s"},
    {OxMsgXmlWritten, "s"},
};

} // namespace

unsigned int OxMsgLibraryNumber(unsigned int index) {
    return index < sizeof kLogged / sizeof kLogged[0] ? kLogged[index].number : 0;
}

const char* OxMsgLibraryArguments(unsigned int number) {
    for (const LoggedMessage& message : kLogged) {
        if (message.number == number) {
            return message.arguments;
        }
    }
    return nullptr;
}
