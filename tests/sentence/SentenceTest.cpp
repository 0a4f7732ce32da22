// Sentences for people, by pattern and parts.
#include "host/sentence/Say.h"
#include "host/sentence/SentenceError.h"

#include <gtest/gtest.h>

#include <stdexcept>
#include <string>
#include <vector>

using namespace movieconv;

namespace {

std::vector<std::string> PartsOf(const Sentence& sentence) {
    std::vector<std::string> texts;
    for (const Sentence& part : sentence.Parts())
        texts.push_back(part.Text());
    return texts;
}

} // namespace

TEST(Sentences, KeepTheirPatternAndTheirParts) {
    const struct {
        Sentence sentence;
        const char* text;
        const char* pattern;
        std::vector<std::string> parts;
    } cases[] = {
        {Say("it is cut off"), "it is cut off", "it is cut off", {}},
        {Say("\"{}\" has {:.2f} of {:>4}", "{} a", 1.005, 7),
         "\"{} a\" has 1.00 of    7",
         "\"{}\" has {:.2f} of {:>4}",
         {"{} a", "1.00", "   7"}},
        {Say("{}{}", std::string("a"), 'b'), "ab", "{}{}", {"a", "b"}},
        {Say("cannot read {}: {}", "x", Say("{} s late", 3)),
         "cannot read x: 3 s late",
         "cannot read {}: {}",
         {"x", "3 s late"}},
        {Say("{} of {}", SayAmount("1.2 GB"), SayCodec("h264")),
         "1.2 GB of h264",
         "{} of {}",
         {"1.2 GB", "h264"}},
    };
    for (const auto& test : cases) {
        EXPECT_EQ(test.sentence.Text(), test.text);
        EXPECT_STREQ(test.sentence.Pattern(), test.pattern);
        EXPECT_EQ(PartsOf(test.sentence), test.parts);
    }
    EXPECT_STREQ(cases[3].sentence.Parts()[1].Pattern(), "{} s late");
    EXPECT_EQ(cases[3].sentence.Parts()[0].Is(), Sentence::Kind::kName);
    EXPECT_EQ(cases[4].sentence.Parts()[0].Is(), Sentence::Kind::kAmount);
    EXPECT_EQ(cases[4].sentence.Parts()[1].Is(), Sentence::Kind::kCodec);
}

TEST(Sentences, AreListsAndNothing) {
    EXPECT_EQ(SayList({}).Text(), "");
    EXPECT_EQ(SayList({Say("title")}).Text(), "title");
    EXPECT_EQ(SayList({Say("title"), std::string("KEY")}).Text(), "title and KEY");
    EXPECT_EQ(SayList({Say("title"), std::string("KEY"), Say("flags")}).Text(), "title, KEY and flags");
    EXPECT_TRUE(Sentence().IsEmpty());
    EXPECT_EQ(Sentence().Pattern(), nullptr);
}

TEST(Sentences, ComeOutOfErrors) {
    const SentenceError told(Say("no thread can be started: {}", "limit"));
    EXPECT_STREQ(told.what(), "no thread can be started: limit");
    EXPECT_STREQ(WordsOf(told).Pattern(), "no thread can be started: {}");
    const Sentence other = WordsOf(std::runtime_error("else"));
    EXPECT_EQ(other.Text(), "else");
    EXPECT_EQ(other.Pattern(), nullptr);
}
