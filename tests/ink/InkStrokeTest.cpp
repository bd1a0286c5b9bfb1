#include "InkStroke.h"

#include <gtest/gtest.h>
#include <vector>

namespace
{

using Ink::BrushKind;
using Ink::InkPiece;
using Ink::InkStroke;

constexpr float kPlaces[] = {0.0f, 9.0f, 17.0f, 40.0f, 41.0f, 90.0f};

/// The pieces of a stroke that is taken after every @p every points.
std::vector<InkPiece> PiecesOf(BrushKind kind, int every)
{
    std::vector<InkPiece> pieces;
    InkStroke stroke(Ink::DefaultStyle(kind));
    int count = 0;
    for (const float place : kPlaces)
    {
        stroke.Add({20 + place, 30 + place * place / 40, 6});
        if (++count % every == 0)
            pieces.push_back(stroke.Take());
    }
    stroke.End();
    pieces.push_back(stroke.Take());
    return pieces;
}

std::vector<float> NumbersOf(const std::vector<InkPiece>& pieces)
{
    std::vector<float> numbers;
    for (const InkPiece& piece : pieces)
    {
        for (const Ink::Vertex& vertex : piece.band)
            numbers.insert(numbers.end(), {vertex.x, vertex.y, vertex.inside});
        for (const Ink::Dab& dab : piece.dabs)
            numbers.insert(numbers.end(), {dab.x, dab.y, dab.alongX, dab.alongY, dab.breadth,
                                           dab.opacity, dab.roll});
    }
    return numbers;
}

TEST(InkStroke, PenAndMarkerGiveBandsAndStampsGiveDabs)
{
    for (const BrushKind kind : {BrushKind::Pen, BrushKind::Marker})
    {
        const InkPiece piece = PiecesOf(kind, 100).front();
        EXPECT_FALSE(piece.band.empty());
        EXPECT_TRUE(piece.dabs.empty());
    }
    const InkPiece piece = PiecesOf(BrushKind::Stamp, 100).front();
    EXPECT_TRUE(piece.band.empty());
    EXPECT_FALSE(piece.dabs.empty());
}

TEST(InkStroke, InkIsTheSameHoweverItIsTaken)
{
    for (const BrushKind kind : {BrushKind::Pen, BrushKind::Marker, BrushKind::Stamp})
    {
        const std::vector<float> whole = NumbersOf(PiecesOf(kind, 100));
        EXPECT_GT(whole.size(), 100u);
        EXPECT_EQ(NumbersOf(PiecesOf(kind, 1)), whole);
        EXPECT_EQ(NumbersOf(PiecesOf(kind, 2)), whole);
    }
}

TEST(InkStroke, FirstPieceAloneStartsTheStroke)
{
    const std::vector<InkPiece> pieces = PiecesOf(BrushKind::Marker, 1);
    ASSERT_EQ(pieces.size(), 7u);
    for (std::size_t i = 0; i < pieces.size(); ++i)
        EXPECT_EQ(pieces[i].startsStroke, i == 0) << i;
}

TEST(InkStroke, StartWaitsForTheFirstInk)
{
    InkStroke stroke(Ink::DefaultStyle(BrushKind::Pen));
    EXPECT_TRUE(stroke.Take().IsEmpty());
    stroke.Add({20, 30, 6});
    const InkPiece piece = stroke.Take();
    EXPECT_FALSE(piece.IsEmpty());
    EXPECT_TRUE(piece.startsStroke);
}

TEST(InkStroke, PiecesCarryTheStyle)
{
    InkStroke stroke({BrushKind::Stamp, {0.25f, 0.5f, 0.75f, 1.0f}, 33.0f});
    for (int i = 0; i < 2; ++i)
    {
        stroke.Add({20.0f + 50.0f * static_cast<float>(i), 30, 6});
        const InkPiece piece = stroke.Take();
        EXPECT_EQ(piece.style.kind, BrushKind::Stamp);
        EXPECT_EQ(piece.style.colour.green, 0.5f);
        EXPECT_EQ(piece.style.width, 33.0f);
    }
}

TEST(InkPiece, BoundsHoldTheInk)
{
    InkPiece piece;
    EXPECT_TRUE(piece.Bounds().IsEmpty());
    piece.dabs = {{100, 50, 6, 8, 5, 1, 0}}; // 10 long, 5 broad: corners within 15
    EXPECT_EQ(piece.Bounds().left, 85.0f);
    EXPECT_EQ(piece.Bounds().top, 35.0f);
    EXPECT_EQ(piece.Bounds().right, 115.0f);
    EXPECT_EQ(piece.Bounds().bottom, 65.0f);
    piece.dabs.clear();
    piece.band = {{1, 2, 0}, {5, 3, 0}, {4, 9, 0}};
    EXPECT_EQ(piece.Bounds().left, 1.0f);
    EXPECT_EQ(piece.Bounds().top, 2.0f);
    EXPECT_EQ(piece.Bounds().right, 5.0f);
    EXPECT_EQ(piece.Bounds().bottom, 9.0f);
}

} // namespace
