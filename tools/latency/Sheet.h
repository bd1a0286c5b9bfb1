#ifndef NIB_TOOLS_LATENCY_SHEET_H
#define NIB_TOOLS_LATENCY_SHEET_H

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

/// A white picture that boxes and words are put on, drawn by the X server, which has the letters.
/// Colours are 0xRRGGBB, places are pixels from the top left corner.
class Sheet
{
public:
    /// Throws UserError when there is no display.
    Sheet(int width, int height);
    ~Sheet();

    Sheet(const Sheet&) = delete;
    Sheet& operator=(const Sheet&) = delete;

    void Fill(int x, int y, int width, int height, unsigned long colour);

    /// @p y is the line that the letters stand on.
    void Write(int x, int y, const std::string& text, unsigned long colour);

    int WidthOf(const std::string& text) const;

    /// RGBA, top row first.
    std::vector<std::uint8_t> Pixels() const;

private:
    struct Server;
    std::unique_ptr<Server> m_server;
    int m_width;
    int m_height;
};

#endif
