// TextFacts.cpp: counting a text and sending it through every kind of text the library knows.

#include "TextFacts.h"

#include <algorithm>
#include <cmath>

namespace {

constexpr KTString::size_type kPiece = 1U << 16;

bool IsSpace(unsigned short unit) {
    return unit == ' ' || (unit >= 0x09 && unit <= 0x0D) || unit == 0x85 || unit == 0xA0 || unit == 0x1680 ||
           (unit >= 0x2000 && unit <= 0x200A) || unit == 0x2028 || unit == 0x2029 || unit == 0x202F || unit == 0x205F ||
           unit == 0x3000;
}

// The end of the piece that starts at `start`: behind the first line end after kPiece units.
KTString::size_type PieceEnd(KTString const &text, KTString::size_type start) {
    KTString::size_type const lineEnd = text.find_first_of(KTString("\r\n"), std::min(text.size(), start + kPiece));
    if (lineEnd == KTString::npos) {
        return text.size();
    }
    return lineEnd + (text[lineEnd] == '\r' && text[lineEnd + 1] == '\n' ? 2 : 1); // at the end stands a zero unit
}

void CountUnits(KTString const &piece, TextFacts &facts) {
    bool inWord = false;
    for (unsigned short const unit : piece) {
        bool const isSpace = IsSpace(unit);
        facts.words += !isSpace && !inWord ? 1 : 0;
        inWord = !isSpace;
        facts.nonAscii += unit > 0x7F ? 1 : 0;
        facts.replacements += unit == 0xFFFD ? 1 : 0;
    }
    facts.units += piece.size();
}

std::vector<KTString> LinesOf(KTString piece) {
    if (piece.Contains(KTString("\r"))) {
        piece.ReplaceAll2(KTString("\r\n"), KTString("\n")).ReplaceAll2(KTString("\r"), KTString("\n"));
    }
    std::vector<KTString> lines = piece.Split(KTString("\n"));
    if (lines.back().empty()) { // behind the last line end there is no line
        lines.pop_back();
    }
    return lines;
}

bool OtherTextsAgree(KTString const &piece) {
    std::wstring const wide = piece.GetWstring();
    // The constructors from pointers end at a zero unit.
    KTString const untilZero = piece.substr(0, piece.find(static_cast<unsigned short>(0)));
    CComBSTR const automation(static_cast<KTUInt32>(wide.size()), wide.c_str());
    return KTString(wide.c_str()) == untilZero && KTString(piece.c_str()) == untilZero &&
           KTString(piece.GetOString()) == piece && KTString(automation, automation.Length()) == piece;
}

bool SurvivesUtf8(KTString const &piece) { return KTString(OString::FromUTF8(piece.GetUTF8String())) == piece; }

} // namespace

TextFacts &TextFacts::operator+=(TextFacts const &other) {
    units += other.units;
    lines += other.lines;
    words += other.words;
    nonAscii += other.nonAscii;
    replacements += other.replacements;
    pieces += other.pieces;
    losslessPieces += other.losslessPieces;
    agreeingPieces += other.agreeingPieces;
    return *this;
}

TextFacts ExamineText(KTString const &text, std::function<void(KTString const &)> const &eachLine) {
    TextFacts facts;
    KTString::size_type start = 0;
    while (start < text.size()) {
        KTString::size_type const end = PieceEnd(text, start);
        KTString const piece = text.substr(start, end - start);
        start = end;
        CountUnits(piece, facts);
        ++facts.pieces;
        facts.losslessPieces += SurvivesUtf8(piece) ? 1 : 0;
        facts.agreeingPieces += OtherTextsAgree(piece) ? 1 : 0;
        for (KTString const &line : LinesOf(piece)) {
            ++facts.lines;
            eachLine(line);
        }
    }
    return facts;
}

bool NumbersSurvive(KTUInt64 number) {
    auto const small = static_cast<int>(number & 0x7FFFFFFF);
    double const real = static_cast<double>(small) / 8.0; // three digits behind the point are enough
    KTString decimal;
    KTString hexadecimal;
    KTString unsignedNumber;
    KTString large;
    KTString pointer;
    KTString fraction;
    decimal.AppendNumber(small);
    hexadecimal.AppendNumber(small, KTString("%04x"));
    unsignedNumber.AppendUNumber(static_cast<unsigned int>(number));
    large.AppendUInt64(~number);
    pointer.AppendPointer(&number);
    fraction.AppendRealNumber(KTReal(real), 3);
    return decimal.GetIntValue() == static_cast<KTUInt32>(small) &&
           hexadecimal.GetIntValue(std::hex) == static_cast<KTUInt32>(small) &&
           unsignedNumber.GetIntValue() == static_cast<KTUInt32>(number) && large.GetUInt64Value() == ~number &&
           pointer.GetUInt64Value() == reinterpret_cast<KTUInt64>(&number) &&
           std::abs(fraction.GetDoubleValue() - real) < 0.0005;
}
