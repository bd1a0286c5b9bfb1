#include "InkDocument.h"

#include <gtest/gtest.h>

namespace
{

Ink::Sample At(float x, double time = 0.0)
{
    Ink::Sample sample;
    sample.x = x;
    sample.time = time;
    return sample;
}

void Write(Ink::InkDocument& document, float from, float to)
{
    document.Begin(At(from));
    document.Add(At(to));
    document.End();
}

/// The places of a document's samples, a list a stroke.
std::vector<std::vector<float>> Places(const Ink::InkDocument& document)
{
    std::vector<std::vector<float>> places;
    for (const Ink::Stroke& stroke : document.Strokes())
    {
        places.emplace_back();
        for (const Ink::Sample& sample : stroke)
            places.back().push_back(sample.x);
    }
    return places;
}

using List = std::vector<std::vector<float>>;

TEST(InkDocument, KeepsEverySampleOfAStroke)
{
    Ink::InkDocument document;
    document.Begin(At(1));
    document.Add(At(2));
    document.Add(At(2)); // equal ones, too
    document.Add(At(3));
    EXPECT_TRUE(document.IsWriting());
    document.End();
    EXPECT_FALSE(document.IsWriting());
    EXPECT_EQ(Places(document), (List{{1, 2, 2, 3}}));
}

TEST(InkDocument, IgnoresMotionWhileNothingIsWritten)
{
    Ink::InkDocument document;
    document.Add(At(1));
    Write(document, 2, 3);
    document.Add(At(4));
    EXPECT_EQ(Places(document), (List{{2, 3}}));
}

TEST(InkDocument, ASecondBeginStartsAnotherStroke)
{
    Ink::InkDocument document;
    document.Begin(At(1));
    document.Begin(At(2));
    EXPECT_EQ(Places(document), (List{{1}, {2}}));
}

TEST(InkDocument, UndoTakesOneStrokeAfterTheOther)
{
    Ink::InkDocument document;
    Write(document, 1, 2);
    Write(document, 3, 4);
    EXPECT_TRUE(document.Undo());
    EXPECT_EQ(Places(document), (List{{1, 2}}));
    EXPECT_TRUE(document.Undo());
    EXPECT_EQ(Places(document), List{});
    EXPECT_FALSE(document.Undo());
}

TEST(InkDocument, UndoOfAStrokeInTheMakingDropsItsRest)
{
    Ink::InkDocument document;
    Write(document, 1, 2);
    document.Begin(At(3));
    EXPECT_TRUE(document.Undo());
    document.Add(At(4));
    EXPECT_EQ(Places(document), (List{{1, 2}}));
    EXPECT_FALSE(document.IsWriting());
}

TEST(InkDocument, UndoBringsBackWhatClearTook)
{
    Ink::InkDocument document;
    Write(document, 1, 2);
    Write(document, 3, 4);
    EXPECT_TRUE(document.Clear());
    EXPECT_EQ(Places(document), List{});
    Write(document, 5, 6);
    EXPECT_TRUE(document.Undo()); // the stroke
    EXPECT_TRUE(document.Undo()); // the clear
    EXPECT_EQ(Places(document), (List{{1, 2}, {3, 4}}));
    EXPECT_TRUE(document.Undo());
    EXPECT_EQ(Places(document), (List{{1, 2}}));
}

TEST(InkDocument, ClearOfAnEmptyPageIsNoStep)
{
    Ink::InkDocument document;
    EXPECT_FALSE(document.Clear());
    EXPECT_FALSE(document.Undo());
}

TEST(InkDocument, UndoLeavesWhatWasOpened)
{
    Ink::Recording opened;
    opened.strokes = {{At(1), At(2)}};
    Ink::InkDocument document(opened);
    Write(document, 3, 4);
    EXPECT_TRUE(document.Undo());
    EXPECT_FALSE(document.Undo());
    EXPECT_EQ(Places(document), (List{{1, 2}}));
    EXPECT_TRUE(document.Clear());
    EXPECT_TRUE(document.Undo());
    EXPECT_EQ(Places(document), (List{{1, 2}}));
}

TEST(InkDocument, EndsWithTheLastSampleOfStrokesAndHovers)
{
    EXPECT_EQ(Ink::InkDocument().EndTime(), 0.0);
    Ink::Recording opened;
    opened.strokes = {{At(1, 0.5), At(2, 1.5)}};
    EXPECT_EQ(Ink::InkDocument(opened).EndTime(), 1.5);
    opened.hovers = {{At(1, 1.5), At(2, 2.25)}};
    EXPECT_EQ(Ink::InkDocument(opened).EndTime(), 2.25);
}

} // namespace
