#ifndef TERMINAL_PAGE_H
#define TERMINAL_PAGE_H

#include <cstddef>
#include <cstdio>
#include <memory>
#include <nib/nib.h>
#include <string>
#include <vector>

/// A page of a few pixels that drawing goes to as long as it lives; its end prints each of them as
/// a character. It stands in for a window where there is none. Used in a task.
class TerminalPage
{
public:
    TerminalPage(int width, int height) : m_width(width), m_height(height)
    {
        Nib::TextureDescriptor descriptor;
        descriptor.width = width;
        descriptor.height = height;
        m_texture =
            Nib::RendererFactory::CreateTextureObject(descriptor, nullptr, nullptr, 0, nullptr);
        m_target = Nib::RendererFactory::CreateOffscreenRenderTarget(m_texture);
        m_target->ClearColor(0.0f, 0.0f, 0.0f, 0.0f);
    }

    TerminalPage(const TerminalPage&) = delete;
    TerminalPage& operator=(const TerminalPage&) = delete;

    ~TerminalPage()
    {
        const auto width = static_cast<std::size_t>(m_width);
        std::vector<unsigned char> pixels(width * static_cast<std::size_t>(m_height) * 4);
        Nib::IRenderTarget::BufferDescriptor buffer;
        buffer.pixels = pixels.data();
        m_target->ReadPixels(0, 0, m_width, m_height, buffer);
        for (auto row = static_cast<std::size_t>(m_height); row-- > 0;) // GL's first is the lowest
        {
            std::string line;
            for (std::size_t column = 0; column < width; ++column)
                line += pixels[(row * width + column) * 4 + 3] != 0 ? '#' : ' ';
            line.erase(line.find_last_not_of(' ') + 1);
            std::puts(line.c_str());
        }
        m_target->Release();
        m_texture->Release();
    }

private:
    int m_width;
    int m_height;
    Nib::ITextureObject* m_texture;
    Nib::IOffscreenRenderTarget* m_target;
};

#endif
