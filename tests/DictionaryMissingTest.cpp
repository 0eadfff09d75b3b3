// DictionaryMissingTest.cpp: a process-wide dictionary that could not be made. Native build only, which sees inside.

#include "KTException.h"
#include "KTRequireDictionary.h"
#include "KTStringDictionary.h"
#include "LogLines.h"

#include <gtest/gtest.h>

TEST(DictionaryMissingTest, IsReportedAndThrown) {
    LogLines lines;
    try {
        KTRequireDictionary(nullptr);
        FAIL() << "there is no dictionary";
    } catch (KTLCException const &problem) {
        EXPECT_EQ(KTString("kKTErrorInternal"), problem.GetReason());
        EXPECT_EQ(KTString("KTPublicUtils"), problem.GetFile());
        EXPECT_EQ(159, problem.GetLine());
    }
    EXPECT_EQ((std::vector<std::string>{"Assert failed: KTStringDictionary::GetStringDictionary() at "
                                        "source/private/utils/KTPublicUtils:159"}),
              lines.Take());
}

TEST(DictionaryMissingTest, OneThatIsThereIsGivenBack) {
    KTStringDictionary *const dictionary = KTStringDictionary::GetStringDictionary();
    EXPECT_EQ(dictionary, &KTRequireDictionary(dictionary));
}
