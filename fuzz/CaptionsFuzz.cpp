// CaptionsFuzz.cpp: any bytes as a caption file, against a plain model.
//
// Input: a byte for the split mode, then the file.

#include "CaptionRows.h"
#include "ReaderInput.h"
#include "ReaderModel.h"

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const *data, std::size_t size) {
    if (size == 0) {
        return 0;
    }
    unsigned int const mode = data[0] % 8;
    std::string const file(reinterpret_cast<char const *>(data) + 1, size - 1);
    auto const expected = ModelRows(ModelFileLines(file, false, FromLatin1), mode);
    auto const rows = ReadCaptionRows(StreamOn(file).get(), mode);
    Check(rows.size() == expected.size());
    for (std::size_t i = 0; i < rows.size(); ++i) {
        Check(rows[i].size() == expected[i].size());
        for (std::size_t j = 0; j < rows[i].size(); ++j) {
            Check(UnitsOf(rows[i][j]) == expected[i][j]);
        }
    }
    return 0;
}
