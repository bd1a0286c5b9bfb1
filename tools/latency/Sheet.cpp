#include "latency/Sheet.h"

#include "UserError.h"

#include <X11/Xlib.h>
#include <X11/Xutil.h>

namespace
{

constexpr unsigned kDepth = 24; // bits a pixel: red, green and blue

} // namespace

struct Sheet::Server
{
    Display* display = nullptr;
    Pixmap pixmap = 0;
    GC context = nullptr;
    XFontStruct* font = nullptr;

    ~Server()
    {
        if (!display)
            return;
        if (font)
            XFreeFont(display, font);
        if (context)
            XFreeGC(display, context);
        if (pixmap)
            XFreePixmap(display, pixmap);
        XCloseDisplay(display);
    }
};

Sheet::Sheet(int width, int height)
    : m_server(std::make_unique<Server>()), m_width(width), m_height(height)
{
    m_server->display = XOpenDisplay(nullptr);
    if (!m_server->display)
        throw UserError("latency: there is no display to draw the histogram with");
    Display* const display = m_server->display;
    m_server->pixmap =
        XCreatePixmap(display, DefaultRootWindow(display), static_cast<unsigned>(width),
                      static_cast<unsigned>(height), kDepth);
    m_server->context = XCreateGC(display, m_server->pixmap, 0, nullptr);
    for (const char* name : {"9x15", "fixed"}) // every server has the second one
        if (!m_server->font)
            m_server->font = XLoadQueryFont(display, name);
    if (!m_server->font)
        throw UserError("latency: the X server has no font for the histogram");
    XSetFont(display, m_server->context, m_server->font->fid);
    Fill(0, 0, width, height, 0xFFFFFF);
}

Sheet::~Sheet() = default;

void Sheet::Fill(int x, int y, int width, int height, unsigned long colour)
{
    if (width <= 0 || height <= 0)
        return;
    XSetForeground(m_server->display, m_server->context, colour);
    XFillRectangle(m_server->display, m_server->pixmap, m_server->context, x, y,
                   static_cast<unsigned>(width), static_cast<unsigned>(height));
}

void Sheet::Write(int x, int y, const std::string& text, unsigned long colour)
{
    XSetForeground(m_server->display, m_server->context, colour);
    XDrawString(m_server->display, m_server->pixmap, m_server->context, x, y, text.c_str(),
                static_cast<int>(text.size()));
}

int Sheet::WidthOf(const std::string& text) const
{
    return XTextWidth(m_server->font, text.c_str(), static_cast<int>(text.size()));
}

std::vector<std::uint8_t> Sheet::Pixels() const
{
    std::vector<std::uint8_t> pixels;
    XImage* const image =
        XGetImage(m_server->display, m_server->pixmap, 0, 0, static_cast<unsigned>(m_width),
                  static_cast<unsigned>(m_height), AllPlanes, ZPixmap);
    if (!image)
        throw UserError("latency: the histogram cannot be read from the X server");
    for (int y = 0; y < m_height; ++y)
        for (int x = 0; x < m_width; ++x)
        {
            const unsigned long pixel = XGetPixel(image, x, y);
            for (const int shift : {16, 8, 0})
                pixels.push_back(static_cast<std::uint8_t>(pixel >> shift));
            pixels.push_back(255);
        }
    XDestroyImage(image);
    return pixels;
}
