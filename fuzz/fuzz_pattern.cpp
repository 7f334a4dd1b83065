// Fuzz target: the pattern scanner of field typing (dtPattern and the branchLength /
// lengthSpec pair it drives).
//
// The input is the pattern: Latin-1 bytes, one code unit each, or UTF-16LE code units
// when it begins with the byte-order mark FF FE. It is handed over null-terminated in a
// buffer of exactly its size, so a read past the terminator is caught by the address
// sanitizer. The scan must end, stay inside the text, and set nothing but the
// precision (and that only to a positive count).
#include "FieldTyping.h"
#include "FuzzSupport.h"

#include <cstddef>
#include <cstdint>
#include <memory>

namespace {

const BuiltinTypes& builtins() {
    static const BuiltinTypes instance;
    return instance;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    const bool utf16 = size >= 2 && data[0] == 0xFF && data[1] == 0xFE;
    const size_t units = utf16 ? (size - 2) / 2 : size;
    std::unique_ptr<char16_t[]> text(new char16_t[units + 1]);
    for (size_t i = 0; i < units; ++i)
        text[i] = utf16 ? static_cast<char16_t>(data[2 + 2 * i] | (data[3 + 2 * i] << 8))
                        : static_cast<char16_t>(data[i]);
    text[units] = 0;
    size_t length = 0;
    while (text[length] != 0)
        ++length;
    const char16_t* const begin = text.get();
    const char16_t* const end = begin + length;

    zrfuzz::LogKeeper log;
    const ZrDType* stringType = builtins().builtinByName(u"string");
    ZRFUZZ_CHECK(stringType != nullptr);

    ZrDType type = *stringType;
    dtPattern(type, begin);
    ZRFUZZ_CHECK(type.Precision() == stringType->Precision() || type.Precision() >= 1);
    ZRFUZZ_CHECK(type.Length() == stringType->Length());
    ZRFUZZ_CHECK(type.DecimalPlaces() == stringType->DecimalPlaces());
    ZRFUZZ_CHECK(type.Usage() == stringType->Usage());

    // The two scanners on their own, from the start: each stops inside the text.
    const char16_t* cursor = begin;
    const long branch = branchLength(cursor);
    ZRFUZZ_CHECK(branch >= -1);
    ZRFUZZ_CHECK(cursor >= begin && cursor <= end);

    cursor = begin;
    const long bound = lengthSpec(cursor);
    ZRFUZZ_CHECK(bound >= -1);
    ZRFUZZ_CHECK(cursor >= begin && cursor <= end);
    return 0;
}
