// OxInput and OxPrt::printHex: runs a program of reads, taken from the
// input, over a file that is the rest of the input, and checks every step
// against a model of the stream kept here (position, end-of-file and failure
// flags):
//   - a typed read of n bytes on a clean stream with n bytes left gives the
//     big-endian value (decoded here by shifts) and moves by n; with fewer
//     left it returns the bytes delivered, leaves the variable alone and the
//     stream failed; on a failed stream it returns 0;
//   - the block read returns its length, or 0 when it runs past the end (the
//     bytes that came stay in the buffer);
//   - readUStoC / readDECUStoC store the masked bytes and count as the
//     layout says; getline stores at most size - 1 bytes up to the delimiter,
//     terminated, and answers OxTrue exactly when the stream stays clean;
//   - seek moves anywhere from 0 to a little past the end without touching
//     the state; getFilePosition is the position, -1 once the failure flag
//     is set (a getline that reaches the end sets the end-of-file flag alone);
//   - readValue(OxInput &) of each geometry class on a clean stream either
//     keeps it clean and moves by its result, or fails it and returns every
//     byte that was left; on a failed stream it returns 0;
//   - hexDump of the file is "OxInput (Binary File):" and a line end, then
//     printHex of all its bytes at offset 0, whose rows are checked here
//     byte by byte (position column, two hex digits per byte, the bar in
//     column 55, the text column, the empty line behind a short last row).
// Input: the first byte is the length of the program, which follows; the
// rest is the file. Each program byte is one step; some take the next
// program byte as their operand.
#include "OxFuzzSupport.h"

#include "oxbase/diag/OxPrt.h"
#include "oxbase/geom/OxBBox.h"
#include "oxbase/geom/OxBSphere.h"
#include "oxbase/geom/OxColor.h"
#include "oxbase/geom/OxRot.h"
#include "oxbase/geom/OxVec.h"
#include "oxbase/io/OxInput.h"

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

namespace {

/// A readValue(OxInput &) form of a geometry class: one line per class.
struct GeometryReader {
    const char* name;
    long long (*read)(OxInput& input);
};

template <class T> long long readGeometry(OxInput& input) {
    T value;
    return value.readValue(input);
}

/// The float forms read with a scale factor.
template <class T> long long readScaled(OxInput& input) {
    T value;
    return value.readValue(input, 2.0f);
}

const GeometryReader kGeometryReaders[] = {
    {"OxVec2d", readGeometry<OxVec2d>},     {"OxVec3d", readGeometry<OxVec3d>},
    {"OxVec4d", readGeometry<OxVec4d>},     {"OxColor", readGeometry<OxColor>},
    {"OxRot", readGeometry<OxRot>},         {"OxRot2d", readGeometry<OxRot2d>},
    {"OxBBox", readGeometry<OxBBox>},       {"OxBBoxf", readScaled<OxBBoxf>},
    {"OxBRect", readGeometry<OxBRect>},     {"OxBSphere", readGeometry<OxBSphere>},
    {"OxBSpheref", readScaled<OxBSpheref>},
};
constexpr unsigned int kGeometryCount = sizeof kGeometryReaders / sizeof kGeometryReaders[0];

/// The stream's expected state: position and the two flags that matter.
struct Model {
    const std::uint8_t* bytes;
    long long length;
    long long position = 0;
    bool atEnd = false;  ///< the end-of-file flag
    bool failed = false; ///< the failure flag

    bool clean() const { return !atEnd && !failed; }
    long long left() const { return position < length ? length - position : 0; }
    /// A read that runs past the end: both flags; returns the bytes delivered.
    long long runOut() {
        long long delivered = left();
        position = position < length ? length : position;
        atEnd = true;
        failed = true;
        return delivered;
    }
    /// The position the stream tells: -1 once the failure flag is set.
    long long told() const { return failed ? -1 : position; }
};

template <class T, class Value = T> void checkRead(OxInput& input, Model& model, const char* type) {
    T value;
    std::memset(&value, 0x5a, sizeof value);
    T before = value;
    long long result = input.read(value);
    const long long size = sizeof(Value);
    if (model.clean() && model.left() >= size) {
        auto expected = static_cast<T>(oxfuzz::bigEndian<Value>(model.bytes + model.position));
        OXFUZZ_CHECK(result == size && oxfuzz::sameBits(value, expected),
                     "read(%s) at %lld answered %lld with another value", type, model.position,
                     result);
        model.position += size;
        return;
    }
    long long expected = model.clean() ? model.runOut() : 0;
    OXFUZZ_CHECK(result == expected && oxfuzz::sameBits(value, before),
                 "read(%s) at %lld of %lld answered %lld, expected %lld", type, model.position,
                 model.length, result, expected);
}

template <class Byte> void checkBlockRead(OxInput& input, Model& model, unsigned int count) {
    std::vector<Byte> buffer(count + 1, static_cast<Byte>(0x5a));
    long long result = input.read(buffer.data(), count);
    long long expected = 0;
    if (!model.clean()) {
        model.failed = true; // the stream's read fails at once and says so
    } else if (count == 0) {
        expected = 0; // nothing to read: the state stays as it is
    } else if (model.left() >= count) {
        OXFUZZ_CHECK(std::memcmp(buffer.data(), model.bytes + model.position, count) == 0,
                     "read of %u bytes at %lld gave other bytes", count, model.position);
        model.position += count;
        expected = count;
    } else {
        long long delivered = model.runOut();
        OXFUZZ_CHECK(std::memcmp(buffer.data(), model.bytes + model.length - delivered,
                                 static_cast<size_t>(delivered)) == 0,
                     "the bytes before the end did not stay in the buffer");
    }
    OXFUZZ_CHECK(result == expected, "read of %u bytes answered %lld, expected %lld", count, result,
                 expected);
    OXFUZZ_CHECK(buffer[count] == static_cast<Byte>(0x5a), "read of %u bytes wrote more", count);
}

/// readUStoC (`dec` false) or readDECUStoC (`dec` true) of `count` characters.
void checkCharacters(OxInput& input, Model& model, unsigned int count, bool dec) {
    unsigned int units = dec ? (count + 1) >> 1 : count;
    std::vector<char> buffer(2 * units + 1, '\x5a');
    unsigned int stored = 12345;
    long long result = dec ? input.readDECUStoC(buffer.data(), count, stored)
                           : input.readUStoC(buffer.data(), count, stored);
    long long expected = dec ? units : 2LL * units;
    unsigned int expectedStored = 0;
    for (unsigned int unit = 0; unit < units; unit++) {
        if (!model.clean()) {
            expected = 0;
            break;
        }
        if (model.left() < 2) {
            expected = model.runOut();
            break;
        }
        const std::uint8_t* pair = model.bytes + model.position;
        model.position += 2;
        if (dec) {
            bool half = unit + 1 == units && count % 2 == 1;
            OXFUZZ_CHECK(buffer[2 * unit] == (pair[0] & 0x7f) &&
                             buffer[2 * unit + 1] == (pair[1] & 0x7f),
                         "readDECUStoC unit %u", unit);
            expectedStored += half ? 1 : 2;
        } else {
            OXFUZZ_CHECK(buffer[unit] == (pair[1] & 0x7f), "readUStoC unit %u", unit);
            expectedStored++;
        }
    }
    OXFUZZ_CHECK(result == expected && stored == expectedStored,
                 "%s(%u) answered %lld storing %u, expected %lld storing %u",
                 dec ? "readDECUStoC" : "readUStoC", count, result, stored, expected,
                 expectedStored);
}

void checkGetline(OxInput& input, Model& model, unsigned int size, char delimiter) {
    std::vector<char> buffer(size + 1, '\x5a');
    OxBool result = input.getline(buffer.data(), size, delimiter);
    if (!model.clean()) {
        model.failed = true; // the stream's getline fails at once and says so
        OXFUZZ_CHECK(result == OxFalse, "getline on a stream that is not clean answered OxTrue");
        return;
    }
    // The stream's getline: at most size - 1 bytes, up to the delimiter
    // (taken, not stored) or the end (the end-of-file flag); a full buffer
    // not followed by the delimiter, or nothing taken at all, fails it.
    long long start = model.position;
    long long taken = 0;
    while (taken + 1 < size && start + taken < model.length &&
           model.bytes[start + taken] != static_cast<std::uint8_t>(delimiter)) {
        taken++;
    }
    if (start + taken >= model.length) {
        model.position = model.length > start ? model.length : start;
        model.atEnd = true;
        model.failed = taken == 0;
    } else if (model.bytes[start + taken] == static_cast<std::uint8_t>(delimiter)) {
        model.position = start + taken + 1;
    } else {
        model.position = start + taken;
        model.failed = true;
    }
    OXFUZZ_CHECK((result == OxTrue) == model.clean(), "getline(%u, 0x%02x) at %lld answered %d",
                 size, static_cast<unsigned char>(delimiter), start, result);
    OXFUZZ_CHECK((taken == 0 || std::memcmp(buffer.data(), model.bytes + start,
                                            static_cast<size_t>(taken)) == 0) &&
                     buffer[taken] == '\0' && buffer[size] == '\x5a',
                 "getline(%u) at %lld stored other bytes", size, start);
}

void checkSeek(OxInput& input, Model& model, std::uint8_t operand) {
    // A target from 0 to 8 bytes past the end, reached from each origin.
    long long target = operand % (model.length + 9);
    unsigned int direction = operand % 3;
    long long origin = direction == 0 ? 0 : (direction == 1 ? model.position : model.length);
    OxBool result = input.seek(static_cast<int>(target - origin), direction);
    OXFUZZ_CHECK(result == OxTrue, "seek(%lld, %u) answered OxFalse", target - origin, direction);
    model.position = target;
}

void checkGeometry(OxInput& input, Model& model, const GeometryReader& reader) {
    long long result = reader.read(input);
    if (!model.clean()) {
        OXFUZZ_CHECK(result == 0, "%s::readValue on a failed stream answered %lld", reader.name,
                     result);
        return;
    }
    if (input.isGood() == OxTrue) {
        OXFUZZ_CHECK(result >= 0 && input.getFilePosition() == model.position + result,
                     "%s::readValue answered %lld and moved from %lld to %lld", reader.name, result,
                     model.position, input.getFilePosition());
        model.position += result;
    } else {
        long long left = model.left();
        OXFUZZ_CHECK(result == left,
                     "%s::readValue failed the stream with %lld left, answered %lld", reader.name,
                     left, result);
        model.runOut();
    }
}

/// Checks the rows of printHex(bytes, count) at offset 0.
void checkHexRows(const std::string& text, const std::uint8_t* bytes, size_t count) {
    size_t rows = count / 16;
    size_t rest = count % 16;
    size_t expectedSize = rows * 74 + (rest != 0 ? 75 : 0);
    OXFUZZ_CHECK(text.size() == expectedSize, "printHex of %zu bytes wrote %zu characters, not %zu",
                 count, text.size(), expectedSize);
    for (size_t row = 0; row * 16 < count; row++) {
        const char* line = text.data() + row * 74;
        char position[8];
        std::snprintf(position, sizeof position, "%06zx ", row * 16);
        OXFUZZ_CHECK(std::memcmp(line, position, 7) == 0, "row %zu has no position %s", row,
                     position);
        for (size_t c = 0; c < 16; c++) {
            size_t i = row * 16 + c;
            char hex[4] = {' ', ' ', ' ', '\0'};
            char shown = ' ';
            if (i < count) {
                std::snprintf(hex, sizeof hex, "%02x ", bytes[i]);
                shown = bytes[i] >= 0x20 && bytes[i] <= 0x7f ? static_cast<char>(bytes[i]) : '.';
            }
            OXFUZZ_CHECK(std::memcmp(line + 7 + 3 * c, hex, 3) == 0 && line[57 + c] == shown,
                         "row %zu, column %zu: byte %zu is not shown as 0x%02x", row, c, i,
                         i < count ? bytes[i] : 0);
        }
        OXFUZZ_CHECK(std::memcmp(line + 55, "| ", 2) == 0 && line[73] == '\n',
                     "row %zu has no bar or line end", row);
    }
    if (rest != 0) {
        OXFUZZ_CHECK(text.back() == '\n' && text[text.size() - 2] == '\n',
                     "the short last row has no empty line behind it");
    }
}

void checkHexDump(const std::string& path, const std::uint8_t* bytes, size_t count) {
    std::ostrstream printed;
    OxPrt::printHex(&printed, bytes, count);
    std::string rows(printed.str(), static_cast<size_t>(printed.pcount()));
    printed.freeze(false);
    checkHexRows(rows, bytes, count);

    OxInput input(path.c_str(), OxFile::FILE_MODE_BINARY);
    std::ostrstream dumped;
    OxBool result = input.hexDump(&dumped);
    std::string text(dumped.str(), static_cast<size_t>(dumped.pcount()));
    dumped.freeze(false);
    if (count == 0) {
        OXFUZZ_CHECK(result == OxFalse && text.empty(), "hexDump of an empty file");
        return;
    }
    OXFUZZ_CHECK(result == OxTrue && text == "OxInput (Binary File):\n" + rows,
                 "hexDump of %zu bytes differs from printHex", count);

    // Any offset, for the sanitizers: a first row that starts inside a row.
    std::ostrstream shifted;
    OxPrt::printHex(&shifted, bytes, count, bytes[0] * 7u);
    shifted.freeze(false);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, size_t size) {
    oxfuzz::startMessages();
    static const std::string path = oxfuzz::scratchFile("input.bin");
    oxfuzz::Program program(data, size);
    const std::uint8_t* bytes = program.bytes;
    size_t length = program.size;
    oxfuzz::writeFile(path, bytes, length);

    OxInput input(path.c_str(), OxFile::FILE_MODE_BINARY);
    OXFUZZ_CHECK(
        input.isGood() == OxTrue && input.getFileLength() == static_cast<long long>(length),
        "the file of %zu bytes opened with the length %lld", length, input.getFileLength());
    Model model{bytes, static_cast<long long>(length)};
    for (size_t pc = 0; pc < program.length; pc++) {
        std::uint8_t step = program.steps[pc];
        std::uint8_t operand = program.operand(pc);
        if (oxfuzz::tracing()) {
            std::fprintf(stderr, "step %zu: %u (kind %u), operand %u, at %lld%s\n", pc, step,
                         step % 17, operand, model.position, model.clean() ? "" : ", not clean");
        }
        switch (step % 17) {
        case 0:
            checkRead<char>(input, model, "char");
            break;
        case 1:
            checkRead<unsigned char>(input, model, "unsigned char");
            break;
        case 2:
            checkRead<short>(input, model, "short");
            break;
        case 3:
            checkRead<unsigned short>(input, model, "unsigned short");
            break;
        case 4:
            checkRead<int>(input, model, "int");
            break;
        case 5:
            checkRead<unsigned int>(input, model, "unsigned int");
            break;
        case 6:
            checkRead<long long, std::uint32_t>(input, model, "long long");
            break;
        case 7:
            checkRead<float>(input, model, "float");
            break;
        case 8:
            checkRead<double>(input, model, "double");
            break;
        case 9:
            checkBlockRead<char>(input, model, operand);
            pc++;
            break;
        case 10:
            checkBlockRead<unsigned char>(input, model, operand);
            pc++;
            break;
        case 11:
            checkCharacters(input, model, operand % 64, false);
            pc++;
            break;
        case 12:
            checkCharacters(input, model, operand % 64, true);
            pc++;
            break;
        case 13:
            checkGetline(input, model, 1 + step / 17 % 8, '\n');
            break;
        case 14:
            checkGetline(input, model, 1 + operand % 32, static_cast<char>(step));
            pc++;
            break;
        case 15:
            checkSeek(input, model, operand);
            pc++;
            break;
        default:
            checkGeometry(input, model, kGeometryReaders[operand % kGeometryCount]);
            pc++;
            break;
        }
        OXFUZZ_CHECK((input.isGood() == OxTrue) == model.clean() &&
                         (input.eof() == OxTrue) == model.atEnd,
                     "after step %zu (%u) the stream is good %d, at its end %d", pc, step,
                     input.isGood(), input.eof());
        OXFUZZ_CHECK(input.getFilePosition() == model.told(),
                     "after step %zu (%u) the position is %lld, expected %lld", pc, step,
                     input.getFilePosition(), model.told());
    }
    checkHexDump(path, bytes, length);
    return 0;
}
