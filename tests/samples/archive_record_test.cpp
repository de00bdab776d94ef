#include "ArchiveRecord.h"

#include <gtest/gtest.h>

#include <string>

namespace
{

const std::string Digest(64, 'a');

ArchiveRecord Sample()
{
    ArchiveRecord record;
    record.path = L"Klänge/日本.wav";
    record.checkOut = ArchiveCheckOut{"2031-05-17T08:30:00Z", L"anna", L"louder"};
    record.versions.push_back({"2031-05-16T08:30:00Z", L"ben", Digest, 17, 133'000'000'000'000'000, L"first"});
    record.versions.push_back({"2031-05-17T08:00:00Z", L"Änne", Digest, 0, 1, L""});
    return record;
}

std::string Replaced(const std::string& text, const std::string& what, const std::string& with)
{
    std::string result = text;
    const std::size_t position = result.find(what);
    EXPECT_NE(position, std::string::npos) << what;
    return result.replace(position, what.size(), with);
}

} // namespace

TEST(ArchiveRecord, IsReadAsItWasWritten)
{
    const std::string text = Sample().Format();

    const std::optional<ArchiveRecord> read = ArchiveRecord::Parse(text);

    ASSERT_TRUE(read);
    EXPECT_EQ(read->path, L"Klänge/日本.wav");
    ASSERT_TRUE(read->checkOut);
    EXPECT_EQ(read->checkOut->user, L"anna");
    EXPECT_EQ(read->checkOut->time, "2031-05-17T08:30:00Z");
    EXPECT_EQ(read->checkOut->comment, L"louder");
    ASSERT_EQ(read->versions.size(), 2u);
    EXPECT_EQ(read->versions[0].lastWrite, 133'000'000'000'000'000u);
    EXPECT_EQ(read->versions[0].size, 17u);
    EXPECT_EQ(read->Latest().user, L"Änne");
    EXPECT_EQ(read->Format(), text);
}

TEST(ArchiveRecord, KeepsTabsLineEndsAndBackslashesOfAComment)
{
    ArchiveRecord record = Sample();
    record.versions[0].comment = L"one\ttwo\r\nthree\\n\nend\n";

    const std::optional<ArchiveRecord> read = ArchiveRecord::Parse(record.Format());

    ASSERT_TRUE(read);
    EXPECT_EQ(read->versions[0].comment, record.versions[0].comment);
}

TEST(ArchiveRecord, TurnsALoneSurrogateOfACommentIntoAReplacementCharacter)
{
    ArchiveRecord record = Sample();
    record.versions[0].comment = L"bad \xD800 pair";

    const std::optional<ArchiveRecord> read = ArchiveRecord::Parse(record.Format());

    ASSERT_TRUE(read);
    EXPECT_EQ(read->versions[0].comment, L"bad \xFFFD pair");
}

TEST(ArchiveRecord, IsRefusedWhenItIsCutAnywhere)
{
    const std::string text = Sample().Format();
    for (std::size_t size = 0; size < text.size(); ++size)
    {
        EXPECT_FALSE(ArchiveRecord::Parse(text.substr(0, size))) << size;
    }
}

TEST(ArchiveRecord, IsRefusedWhenAFieldIsNotValid)
{
    const std::string text = Sample().Format();
    ASSERT_TRUE(ArchiveRecord::Parse(text));
    const auto refused = [&](const std::string& what, const std::string& with) {
        EXPECT_FALSE(ArchiveRecord::Parse(Replaced(text, what, with))) << what << " -> " << with;
    };

    refused("archive-record 1", "archive-record 2");
    refused("\npath\t", "\n");
    refused("path\t", "path\tx\t");
    refused("path\t", "path\t\\x");
    refused("path\t", "path\t\xFF");
    refused("path\t", std::string("path\t\0", 6));
    refused("\ncheckout", "\ncheckin");
    refused("\ncheckout", "\ncheckout\t2031-05-17T08:30:00Z\tx\ty\ncheckout");
    refused("\nversion\t1", "\nversion\t2");
    refused("\nversion\t2", "\nversion\t1");
    refused("2031-05-16", "2031-05-1x");
    refused("2031-05-16T", "2031-05-16T0");
    refused(Digest, Digest.substr(1));
    refused(Digest, std::string(64, 'A'));
    refused("\t17\t", "\t-17\t");
    refused("\t17\t", "\t17 \t");
    refused("\t17\t", "\t99999999999999999999\t");
    refused("\t17\t", "\t9223372036854775808\t");
    refused("\t17\t", "\t");
    refused("end\n", "end\nmore\n");
    refused("end\n", "\nend\n");
}

TEST(ArchiveRecord, WithoutAVersionIsRefused)
{
    EXPECT_FALSE(ArchiveRecord::Parse("archive-record 1\npath\ta\nend\n"));
}

TEST(ArchiveRecord, IsRefusedInBoundedTimeWhateverItContains)
{
    EXPECT_FALSE(ArchiveRecord::Parse(std::string(10 << 20, '\t')));
    EXPECT_FALSE(ArchiveRecord::Parse(std::string(10 << 20, '\n')));
    EXPECT_FALSE(ArchiveRecord::Parse("archive-record 1\npath\ta" + std::string(10 << 20, '\\') + "\nend\n"));
    EXPECT_FALSE(ArchiveRecord::Parse(std::string(100, '\0')));
}
