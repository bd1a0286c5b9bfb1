#include "gles/AttributeScanner.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

using Nib::GLES::AttributeScanner;
using Texts = std::vector<std::string>;

namespace
{

Texts Found(const std::string& source)
{
    Texts names;
    AttributeScanner scanner(source);
    for (std::string_view name = scanner.Next(); !name.empty(); name = scanner.Next())
        names.emplace_back(name);
    return names;
}

} // namespace

// ---- declarations -------------------------------------------------------------------------------

TEST(AttributeScanner, FindsDeclarationsInTheirOrder)
{
    EXPECT_EQ(Found("attribute vec2 a_pos;\nattribute vec4 a_color;\n"),
              (Texts{"a_pos", "a_color"}));
    EXPECT_EQ(Found("attribute vec4 z;\nattribute vec4 a;\nvoid main() {}"), (Texts{"z", "a"}));
}

TEST(AttributeScanner, FindsNothingInNothing)
{
    EXPECT_EQ(Found(""), Texts{});
    EXPECT_EQ(Found(" "), Texts{});
}

TEST(AttributeScanner, FindsNothingWithoutTheWord)
{
    EXPECT_EQ(Found("in vec2 a_pos;\nvoid main() { gl_Position = vec4(0); }\n"), Texts{});
}

TEST(AttributeScanner, NeedsABlankBehindTheWord)
{
    EXPECT_EQ(Found("attribute\tvec2 a_pos;"), Texts{});
    EXPECT_EQ(Found("attribute\nvec2 a_pos;"), Texts{});
    EXPECT_EQ(Found("attributes vec2 a_pos;"), Texts{});
    EXPECT_EQ(Found("attribute"), Texts{});
}

TEST(AttributeScanner, KnowsTheWordInItsOwnSpellingOnly)
{
    EXPECT_EQ(Found("Attribute vec2 a_pos;"), Texts{});
}

TEST(AttributeScanner, NamesHaveLettersDigitsAndUnderscores)
{
    EXPECT_EQ(Found("attribute vec2 _a9Z_;"), Texts{"_a9Z_"});
    EXPECT_EQ(Found("attribute vec2 9;"), Texts{"9"});
}

TEST(AttributeScanner, NamesEndAtAnythingElse)
{
    EXPECT_EQ(Found("attribute vec2 a[2];"), Texts{"a"});
    EXPECT_EQ(Found("attribute vec2 a ;"), Texts{"a"});
    EXPECT_EQ(Found("attribute vec2 a, b;"), Texts{"a"});
    EXPECT_EQ(Found("attribute vec2 a\n;"), Texts{"a"});
    EXPECT_EQ(Found("attribute vec2 a\xC3\xA4;"), Texts{"a"});
}

// ---- the start of a statement -------------------------------------------------------------------

TEST(AttributeScanner, TakesDeclarationsLedByBlanks)
{
    EXPECT_EQ(Found("   attribute vec2 p;"), Texts{"p"});
    EXPECT_EQ(Found("\n\t attribute vec2 p;"), Texts{"p"});
    EXPECT_EQ(Found("attribute vec2 p; attribute vec2 q;"), (Texts{"p", "q"}));
}

TEST(AttributeScanner, TakesDeclarationsBehindALineOrAStatement)
{
    EXPECT_EQ(Found("#version 100\nattribute vec2 p;"), Texts{"p"});
    EXPECT_EQ(Found("precision highp float;attribute vec2 p;"), Texts{"p"});
}

TEST(AttributeScanner, SkipsTheWordInsideAWord)
{
    EXPECT_EQ(Found("xattribute vec2 p;"), Texts{});
    EXPECT_EQ(Found("myattribute vec2 p;\nattribute vec2 q;"), Texts{"q"});
}

TEST(AttributeScanner, SkipsTheWordBehindAnotherWord)
{
    EXPECT_EQ(Found("uniform attribute vec2 p;"), Texts{});
    EXPECT_EQ(Found("varying attribute vec2 p;"), Texts{});
    EXPECT_EQ(Found("invariant\tattribute vec2 p;\nattribute vec2 q;"), Texts{"q"});
}

TEST(AttributeScanner, TakesAnythingButALetterInFront)
{
    EXPECT_EQ(Found("} attribute vec2 p;"), Texts{"p"});
    EXPECT_EQ(Found("1attribute vec2 p;"), Texts{"p"});
    EXPECT_EQ(Found("_attribute vec2 p;"), Texts{"p"});
    EXPECT_EQ(Found("// attribute vec2 p;"), Texts{"p"}) << "a comment is text like any other";
}

TEST(AttributeScanner, TakesACarriageReturnForAnyOtherCharacter)
{
    EXPECT_EQ(Found("attribute vec2 p;\r\nattribute vec2 q;\r\n"), (Texts{"p", "q"}));
    EXPECT_EQ(Found("#version 100\rattribute vec2 p;"), Texts{});
}

TEST(AttributeScanner, SkipsAWordThatEndsTheText)
{
    EXPECT_EQ(Found("my attribute "), Texts{});
}

// ---- what stands between the word and the name --------------------------------------------------

TEST(AttributeScanner, SkipsAnyNumberOfBlanks)
{
    EXPECT_EQ(Found("attribute    vec2    p;"), Texts{"p"});
}

TEST(AttributeScanner, TakesTheTypeForTheNameBehindAQualifier)
{
    EXPECT_EQ(Found("attribute highp vec4 a;"), Texts{"vec4"});
}

TEST(AttributeScanner, SkipsOccurrencesWithoutAName)
{
    EXPECT_EQ(Found("attribute vec2 * p; \nattribute vec2 q;"), Texts{"q"});
    EXPECT_EQ(Found("attribute vec2[2] p;\nattribute vec2 q;"), Texts{"q"});
    EXPECT_EQ(Found("attribute vec2\tp;\nattribute vec2 q;"), Texts{"q"});
    EXPECT_EQ(Found("attribute vec2\np;\nattribute vec2 q;"), Texts{"q"});
    EXPECT_EQ(Found("attribute p;\nattribute vec2 q;"), Texts{"q"});
}

TEST(AttributeScanner, AnOccurrenceWithoutATypeHasNoNameEither)
{
    EXPECT_EQ(Found("attribute *;\nattribute vec2 q;"), Texts{"q"});
    EXPECT_EQ(Found("attribute ;\nattribute vec2 q;"), Texts{"q"});
}

// ---- the end of the text ------------------------------------------------------------------------

TEST(AttributeScanner, ANameThatEndsTheTextIsNotAdded)
{
    EXPECT_EQ(Found("attribute vec2 p"), Texts{});
    EXPECT_EQ(Found("attribute vec2 p;\nattribute vec2 q"), Texts{"p"});
}

TEST(AttributeScanner, TextThatEndsBeforeTheNameHasNone)
{
    EXPECT_EQ(Found("attribute "), Texts{});
    EXPECT_EQ(Found("attribute    "), Texts{});
    EXPECT_EQ(Found("attribute vec2"), Texts{});
    EXPECT_EQ(Found("attribute vec2 "), Texts{});
    EXPECT_EQ(Found("attribute vec2   "), Texts{});
}

TEST(AttributeScanner, GoesOnBehindTheName)
{
    EXPECT_EQ(Found("attribute vec2 attribute vec2 p;"), Texts{"attribute"});
    EXPECT_EQ(Found("attribute attribute attribute;attribute vec2 p;"), (Texts{"attribute", "p"}));
    EXPECT_EQ(Found("attribute vec2 p,\nattribute vec2 q;"), (Texts{"p", "q"}));
}

TEST(AttributeScanner, GivesNothingAfterTheLastName)
{
    AttributeScanner scanner("attribute vec2 p;");
    EXPECT_EQ(scanner.Next(), "p");
    EXPECT_EQ(scanner.Next(), "");
    EXPECT_EQ(scanner.Next(), "");
}
