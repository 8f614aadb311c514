// OxMemory: runs a program of reads and seeks, taken from the input, over a
// buffer that is the rest of the input, and checks every step against a
// model of the reader kept here:
//   - a read of n bytes succeeds exactly when offset + n < length (the last
//     byte is never handed out), gives the big-endian value of the bytes at
//     the offset (decoded here by shifts) and moves by n; a failed read
//     returns 0 and changes neither the target nor the offset;
//   - a relative seek that lands before the start clamps to the start, one
//     at or past the length to the last byte; a seek from the beginning takes
//     0 to the length and clamps beyond it; OxFalse exactly when clamped
//     (a direction outside the enumeration cannot be passed without undefined
//     behaviour, so it is not tried);
//   - readValue(OxMemory &) of each geometry class returns the bytes it
//     consumed: the offset moves by exactly its result.
// Input: the first byte is the length of the program, which follows; the
// rest is the buffer. Each program byte is one step; some take the next
// program byte as their operand.
#include "OxFuzzSupport.h"

#include "oxbase/geom/OxVec.h"
#include "oxbase/io/OxMemory.h"

#include <cstdint>
#include <cstring>
#include <vector>

namespace {

/// A readValue(OxMemory &) form of a geometry class: one line per class.
struct GeometryReader {
    const char* name;
    long long (*read)(OxMemory& memory);
};

template <class T> long long readGeometry(OxMemory& memory) {
    T value;
    return value.readValue(memory);
}

const GeometryReader kGeometryReaders[] = {
    {"OxVec2d", readGeometry<OxVec2d>},
    {"OxVec3d", readGeometry<OxVec3d>},
    {"OxVec4d", readGeometry<OxVec4d>},
};
constexpr unsigned int kGeometryCount = sizeof kGeometryReaders / sizeof kGeometryReaders[0];

/// The reader's expected state.
struct Model {
    const std::uint8_t* bytes;
    std::uint64_t length;
    std::uint64_t offset = 0;

    bool fits(std::uint64_t size) const { return offset < length && size < length - offset; }
    std::uint64_t lastByte() const { return length != 0 ? length - 1 : 0; }
};

template <class T> void checkRead(OxMemory& memory, Model& model, const char* type) {
    T value;
    std::memset(&value, 0x5a, sizeof value);
    T before = value;
    int result = memory.read(value);
    if (model.fits(sizeof(T))) {
        T expected = oxfuzz::bigEndian<T>(model.bytes + model.offset);
        OXFUZZ_CHECK(result == static_cast<int>(sizeof(T)) && oxfuzz::sameBits(value, expected),
                     "read(%s) at %llu answered %d with another value", type,
                     static_cast<unsigned long long>(model.offset), result);
        model.offset += sizeof(T);
    } else {
        OXFUZZ_CHECK(result == 0 && oxfuzz::sameBits(value, before),
                     "read(%s) at %llu of %llu answered %d", type,
                     static_cast<unsigned long long>(model.offset),
                     static_cast<unsigned long long>(model.length), result);
    }
}

template <class Byte> void checkBlockRead(OxMemory& memory, Model& model, unsigned int count) {
    std::vector<Byte> target(count + 1, static_cast<Byte>(0x5a));
    int result = memory.read(target.data(), count);
    if (model.fits(count)) {
        OXFUZZ_CHECK(
            result == static_cast<int>(count) &&
                (count == 0 || std::memcmp(target.data(), model.bytes + model.offset, count) == 0),
            "read of %u bytes at %llu answered %d", count,
            static_cast<unsigned long long>(model.offset), result);
        model.offset += count;
    } else {
        OXFUZZ_CHECK(result == 0, "a read of %u bytes past the bound answered %d", count, result);
    }
    OXFUZZ_CHECK(target[count] == static_cast<Byte>(0x5a), "a read of %u bytes wrote more", count);
}

void checkSeekCurrent(OxMemory& memory, Model& model, std::int64_t move) {
    std::uint64_t target = model.offset + static_cast<std::uint64_t>(move);
    OxBool expected = OxTrue;
    if (static_cast<std::int64_t>(target) < 0) {
        target = 0;
        expected = OxFalse;
    } else if (target >= model.length) {
        target = model.lastByte();
        expected = OxFalse;
    }
    OxBool result = memory.seek(static_cast<size_t>(move), OxMemory::DIR_CURRENT);
    OXFUZZ_CHECK(result == expected, "seek(%lld) from %llu answered %d",
                 static_cast<long long>(move), static_cast<unsigned long long>(model.offset),
                 result);
    model.offset = target;
}

void checkSeekBegin(OxMemory& memory, Model& model, std::uint64_t offset) {
    OxBool expected = offset <= model.length ? OxTrue : OxFalse;
    OxBool result = memory.seek(static_cast<size_t>(offset), OxMemory::DIR_BEGIN);
    OXFUZZ_CHECK(result == expected, "seek(%llu, DIR_BEGIN) of %llu answered %d",
                 static_cast<unsigned long long>(offset),
                 static_cast<unsigned long long>(model.length), result);
    model.offset = expected == OxTrue ? offset : model.lastByte();
}

void checkGeometry(OxMemory& memory, Model& model, const GeometryReader& reader) {
    long long before = memory.getCurOffset();
    long long result = reader.read(memory);
    OXFUZZ_CHECK(result >= 0 && memory.getCurOffset() - before == result,
                 "%s::readValue answered %lld and moved by %lld", reader.name, result,
                 memory.getCurOffset() - before);
    model.offset += static_cast<std::uint64_t>(result);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, size_t size) {
    oxfuzz::startMessages();
    oxfuzz::Program program(data, size);
    std::vector<std::uint8_t> buffer(program.bytes, program.bytes + program.size);
    Model model{buffer.data(), buffer.size()};
    OxMemory memory(buffer.data(), static_cast<unsigned int>(buffer.size()));
    OXFUZZ_CHECK(memory.getLength() == buffer.size(), "getLength %zu of %zu", memory.getLength(),
                 buffer.size());

    for (size_t pc = 0; pc < program.length; pc++) {
        std::uint8_t step = program.steps[pc];
        std::uint8_t operand = program.operand(pc);
        switch (step % 16) {
        case 0:
            checkRead<char>(memory, model, "char");
            break;
        case 1:
            checkRead<unsigned char>(memory, model, "unsigned char");
            break;
        case 2:
            checkRead<short>(memory, model, "short");
            break;
        case 3:
            checkRead<unsigned short>(memory, model, "unsigned short");
            break;
        case 4:
            checkRead<int>(memory, model, "int");
            break;
        case 5:
            checkRead<unsigned int>(memory, model, "unsigned int");
            break;
        case 6:
            checkRead<float>(memory, model, "float");
            break;
        case 7:
            checkRead<double>(memory, model, "double");
            break;
        case 8:
            checkBlockRead<char>(memory, model, operand);
            pc++;
            break;
        case 9:
            checkBlockRead<unsigned char>(memory, model, operand);
            pc++;
            break;
        case 10:
            checkSeekCurrent(memory, model, static_cast<std::int8_t>(operand));
            pc++;
            break;
        case 11:
            // Far moves both ways: the two's complement of a large number.
            checkSeekCurrent(memory, model,
                             (step & 0x10) != 0 ? INT64_MIN + operand : -operand * 65536LL);
            pc++;
            break;
        case 12:
            checkSeekBegin(memory, model, operand);
            pc++;
            break;
        default:
            checkGeometry(memory, model, kGeometryReaders[operand % kGeometryCount]);
            pc++;
            break;
        }
        OXFUZZ_CHECK(static_cast<std::uint64_t>(memory.getCurOffset()) == model.offset,
                     "after step %zu (%u) the offset is %lld, expected %llu", pc, step,
                     memory.getCurOffset(), static_cast<unsigned long long>(model.offset));
    }
    std::ostrstream dumped;
    memory.dump(&dumped);
    dumped.freeze(false);
    return 0;
}
