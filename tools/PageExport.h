#ifndef NIB_TOOLS_PAGE_EXPORT_H
#define NIB_TOOLS_PAGE_EXPORT_H

#include "BrushStyle.h"
#include "DrawOptions.h"
#include "Recording.h"

#include <nib/nib.h>

#include <memory>
#include <string>
#include <thread>

/// Draws a recording's strokes, split evenly over several pages, into PNG files, on an offscreen
/// render thread of its own, while the caller goes on drawing elsewhere.
class PageExport
{
public:
    /// @param parent  the thread whose objects the offscreen thread shares; outlives this
    /// @param output  "page.png" gives page-1.png, page-2.png, ...
    PageExport(Nib::RenderThreadGL& parent, const std::string& output, int pageCount);
    ~PageExport(); ///< [blocks] like Finish

    PageExport(const PageExport&) = delete;
    PageExport& operator=(const PageExport&) = delete;

    /// Begins; the recording must stay until Finish.
    void Start(const Ink::Recording& recording, const Ink::Placement& placement,
               const Ink::BrushStyle& style, PageSize size, const Ink::Colour& paper);

    /// [blocks] until all pages are written. What went wrong, or an empty text.
    std::string Finish();

private:
    std::string PageName(int page) const;

    std::unique_ptr<Nib::RenderThreadGL> m_offscreen;
    std::string m_output;
    int m_pageCount;
    std::string m_failure; // written by m_poster, read after its end
    std::thread m_poster;
};

/// Page @p page (from 0) of @p pageCount of the recording's strokes, in their order.
Ink::Recording StrokesOfPage(const Ink::Recording& recording, int page, int pageCount);

#endif
