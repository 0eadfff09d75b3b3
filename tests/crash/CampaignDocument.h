// CampaignDocument.h: a document whose values follow from a seed, so that a reader knows what has to be in its file.

#pragma once

#include "FileXferBytes.h"
#include "KTFile.h"
#include "KTStreamUtil.h"

#include <cstdint>
#include <memory>
#include <random>
#include <string>

class CampaignDocument {
  public:
    explicit CampaignDocument(std::uint32_t seed) : m_Seed(seed) {}

    /// Writes the document to a new file, calling `step` before each of its objects. False if the file did not take it.
    template <typename Step> bool Save(KTFile const &file, Step step) const {
        std::unique_ptr<IKTStream> const stream(KTStreamUtil::CreateFileStreamWrite(
            file, FileXferBytes::kOpenWrite | FileXferBytes::kCreateOrTruncate, 0, 0));
        Transfer(*stream, step);
        stream->Flush();
        return stream->GetStreamState() == kKTStreamStateGood;
    }

    /// Whether the file holds this document, whole. Its values tell, not the stream's state: a read that takes a file's
    /// last bytes out of a fresh read-ahead buffer has reached the end of the stream, though nothing is missing.
    bool IsIn(KTFile const &file) const {
        std::unique_ptr<IKTStream> const stream(
            KTStreamUtil::CreateFileStreamRead(file, FileXferBytes::kOpenRead, 0, 0));
        unsigned char more = 0;
        return stream != nullptr && Transfer(*stream, [] {}) && stream->GetStreamState() != kKTStreamStateError &&
               stream->XferByte(&more, 1) == 0;
    }

  private:
    // One sequence for both directions. True if every value that passed was the document's own.
    template <typename Step> bool Transfer(IKTStream &stream, Step step) const {
        std::mt19937 random(m_Seed);
        bool isSame = Pass(stream, static_cast<int>(m_Seed));
        int const objects = static_cast<int>(random() % 3000);
        isSame = Pass(stream, objects) && isSame;
        for (int i = 0; i < objects && isSame; ++i) {
            step();
            isSame = Pass(stream, static_cast<int>(random()));
            KTReal const position(static_cast<double>(random()) / 16.0);
            KTReal real(position);
            isSame = stream.XferRealNumber(real) == position && isSame;
            KTString const title(("Slide " + std::string(random() % 200, 'a')).c_str());
            KTString text(title);
            isSame = stream.XferString(text, true, true) == title && isSame;
        }
        return isSame;
    }

    static bool Pass(IKTStream &stream, int value) {
        int passed = stream.IsReading() != 0 ? 0 : value;
        stream.XferInt32(passed);
        return passed == value;
    }

    std::uint32_t m_Seed;
};
