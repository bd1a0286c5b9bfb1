#include "PageExport.h"

#include "InkSession.h"
#include "PngFile.h"
#include "Replay.h"
#include "UserError.h"

#include <exception>
#include <filesystem>

PageExport::PageExport(Nib::RenderThreadGL& parent, const std::string& output, int pageCount)
    : m_offscreen(
          Nib::RendererFactory::CreateOffscreenRenderer(parent.GetMsgQueue(), "nib export", true)),
      m_output(output), m_pageCount(pageCount)
{
    if (!m_offscreen->Start())
        throw UserError("the render thread for the export does not start");
}

PageExport::~PageExport()
{
    Finish();
}

void PageExport::Start(const Ink::Recording& recording, const Ink::Placement& placement,
                       const Ink::BrushStyle& style, PageSize size, const Ink::Colour& paper)
{
    m_poster = std::thread(
        [=, this, &recording]
        {
            try
            {
                for (int page = 0; page < m_pageCount; ++page)
                {
                    Ink::InkSession session(*m_offscreen, size.width, size.height, paper);
                    const Ink::Recording part = StrokesOfPage(recording, page, m_pageCount);
                    if (!part.strokes.empty())
                        Replay(session, part, placement, style, Pace());
                    m_failure = session.Error();
                    if (!m_failure.empty())
                        return;
                    WritePng(PageName(page), session.ReadPixels(), size.width, size.height);
                }
            }
            catch (const std::exception& failure)
            {
                m_failure = failure.what();
            }
        });
}

std::string PageExport::Finish()
{
    if (m_poster.joinable())
        m_poster.join();
    return m_failure;
}

std::string PageExport::PageName(int page) const
{
    std::filesystem::path name = m_output;
    const std::string extension = name.extension();
    name.replace_extension();
    return name.string() + "-" + std::to_string(page + 1) + extension;
}

Ink::Recording StrokesOfPage(const Ink::Recording& recording, int page, int pageCount)
{
    const auto count = static_cast<std::ptrdiff_t>(recording.strokes.size());
    Ink::Recording part;
    part.strokes.assign(recording.strokes.begin() + count * page / pageCount,
                        recording.strokes.begin() + count * (page + 1) / pageCount);
    return part;
}
