#include "HostileFiles.h"

#include <ostream>

namespace
{

using Text = std::string;

std::string InInk(const std::string& content)
{
    return "<ink>" + content + "</ink>";
}

std::string Format(const std::string& channels)
{
    return "<traceFormat>" + channels + "</traceFormat>";
}

// ---- InkML --------------------------------------------------------------------------------------

Text DeepXml(std::size_t n)
{
    return InInk(Repeated(n, "<a>") + Repeated(n, "</a>"));
}

Text DeepXmlThatEnds(std::size_t n)
{
    return "<ink>" + Repeated(n, "<a>");
}

Text TinyElements(std::size_t n)
{
    return InInk(Repeated(n, "<a/>x"));
}

Text Attributes(std::size_t n)
{
    return "<ink" + Repeated(n, " a=''") + "/>";
}

Text EntityBomb(std::size_t n)
{
    return "<!DOCTYPE ink [<!ENTITY a0 'ha'>" + Repeated(n, "<!ENTITY a1 '&a0;&a0;'>") +
           "]><ink><trace>&a1;</trace></ink>";
}

Text DoctypeGroups(std::size_t n)
{
    return "<!DOCTYPE ink " + Repeated(n, "<!x ") + Repeated(n, ">") +
           "><ink><trace>1 1</trace></ink>";
}

Text NestedContexts(std::size_t n)
{
    return InInk(
        Repeated(n / 200, Repeated(100, "<context xml:id='c'>") + Repeated(100, "</context>")) +
        "<trace>1 1</trace>");
}

Text TracesOfOneContext(std::size_t n)
{
    return InInk("<context xml:id='c'/>" + Repeated(n, "<trace contextRef='#c'>1 1</trace>"));
}

Text Formats(std::size_t n)
{
    return InInk(Repeated(n, Format("<channel name='X'/><channel name='Y'/>")) +
                 "<trace>1 1</trace>");
}

Text OneLongTrace(std::size_t n)
{
    return InInk("<trace>" + Repeated(n, "1 1,") + "1 1</trace>");
}

Text OnePointTraces(std::size_t n)
{
    return InInk(Repeated(n, "<trace>1 1</trace>"));
}

Text NanInInkMl(std::size_t n)
{
    return InInk("<trace>" + Repeated(n, "1 1,") + "nan 1</trace>");
}

Text GrowingDifferences(std::size_t n)
{
    return InInk("<trace>\"1e300 \"1e300," + Repeated(n, "1e300 1e300,") + "1 1</trace>");
}

Text Comments(std::size_t n)
{
    return InInk(Repeated(n, "<!---->") + "<trace>1 1</trace>");
}

// ---- JSON ---------------------------------------------------------------------------------------

Text DeepJson(std::size_t n)
{
    return "{\"a\":" + Repeated(n, "[");
}

Text DeepJsonObjects(std::size_t n)
{
    return Repeated(n, "{\"a\":");
}

Text JsonPoints(std::size_t n)
{
    return "{\"a\":[" + Repeated(n, "[1,2],") + "[1,2]]}";
}

Text JsonStrokes(std::size_t n)
{
    return "{" + Repeated(n, "\"a\":[[1,2]],") + "\"a\":[[1,2]]}";
}

Text JsonLongPoint(std::size_t n)
{
    return "{\"a\":[[" + Repeated(n, "1,") + "1]]}";
}

Text JsonNames(std::size_t n)
{
    std::string text = "{";
    for (std::size_t i = 0; i < n; ++i)
        text += "\"" + std::to_string(i) + "\":[1],";
    return text + "\"z\":[1]}";
}

Text JsonUnknownColumn(std::size_t n)
{
    return "{\"a\":[" + Repeated(n, "1,") + "1]}";
}

Text JsonEvents(std::size_t n)
{
    const std::string list = "[" + Repeated(n, "1,") + "1]";
    return "{\"x\":" + list + ",\"y\":" + list + "}";
}

Text JsonUnevenColumns(std::size_t n)
{
    return "{\"x\":[" + Repeated(n, "1,") + "1],\"y\":[1]}";
}

Text JsonLongName(std::size_t n)
{
    return "{\"" + Repeated(n, "name") + "\":[[1,2]]}";
}

Text JsonBlanks(std::size_t n)
{
    return "{\"a\":[[1,2]" + Repeated(n, "    ") + "]}";
}

// ---- lines --------------------------------------------------------------------------------------

Text PenLogUpAndDown(std::size_t n)
{
    return Repeated(n, "1 1 1 0\n1 1 1 1\n");
}

Text PenLogOneLine(std::size_t n)
{
    return Repeated(n, "1 1 1 1 ");
}

Text PenLogOfBlanks(std::size_t n)
{
    return "1 1 1 1\n" + Repeated(n, "    ") + "\n1 1 1 1\n";
}

Text PenLogOfEmptyLines(std::size_t n)
{
    return "1 1 1 1\n" + Repeated(n, "\n\n\n\n") + "1 1 1 1\n";
}

Text PenLogFarAway(std::size_t n)
{
    return Repeated(n, "1 1e30 -1e30 1\n1 -1e30 1e30 1\n");
}

Text PenLogTimeGoesBack(std::size_t n)
{
    return Repeated(n, "1 1 1 1\n") + "-1 1 1 1\n";
}

Text SvcCountTooLarge(std::size_t n)
{
    return "99999999999\n" + Repeated(n, "1 1 1 1 1 1 1\n");
}

Text SvcCountEndless(std::size_t n)
{
    return Repeated(n, "9999") + "\n1 1 1 1 1 1 1\n";
}

Text StrokeListDots(std::size_t n)
{
    return "START\n" + Repeated(n, "1,2,3\nBREAK\n");
}

Text StrokeListStarts(std::size_t n)
{
    return Repeated(n, "START\n");
}

Text ZeroBytes(std::size_t n)
{
    return std::string(4 * n, '\0');
}

} // namespace

void PrintTo(const HostileFile& file, std::ostream* out)
{
    *out << file.name;
}

std::string Repeated(std::size_t count, const std::string& text)
{
    std::string repeated;
    repeated.reserve(count * text.size());
    for (std::size_t i = 0; i < count; ++i)
        repeated += text;
    return repeated;
}

const std::vector<HostileFile>& HostileFiles()
{
    static const std::vector<HostileFile> files = {
        {"DeepXml", DeepXml, "the elements are nested too deeply"},
        {"DeepXmlThatEnds", DeepXmlThatEnds, "not well-formed XML: "},
        {"TinyElements", TinyElements, "there is no trace in it"},
        {"Attributes", Attributes, "there is no trace in it"},
        {"EntityBomb", EntityBomb, "a value of a point is not a number"},
        {"DoctypeGroups", DoctypeGroups, nullptr},
        {"NestedContexts", NestedContexts, nullptr},
        {"TracesOfOneContext", TracesOfOneContext, nullptr},
        {"Formats", Formats, nullptr},
        {"OneLongTrace", OneLongTrace, nullptr},
        {"OnePointTraces", OnePointTraces, nullptr},
        {"NanInInkMl", NanInInkMl, "a value of a point is not a number"},
        {"GrowingDifferences", GrowingDifferences, "a value of a point is out of range"},
        {"Comments", Comments, nullptr},
        {"DeepJson", DeepJson, "neither pointer events nor lists of points"},
        {"DeepJsonObjects", DeepJsonObjects, "neither pointer events nor lists of points"},
        {"JsonPoints", JsonPoints, nullptr},
        {"JsonStrokes", JsonStrokes, nullptr},
        {"JsonLongPoint", JsonLongPoint, nullptr},
        {"JsonNames", JsonNames, "neither pointer events nor lists of points"},
        {"JsonUnknownColumn", JsonUnknownColumn, "neither pointer events nor lists of points"},
        {"JsonEvents", JsonEvents, nullptr},
        {"JsonUnevenColumns", JsonUnevenColumns, "the columns \"x\" and \"y\" differ in length"},
        {"JsonLongName", JsonLongName, nullptr},
        {"JsonBlanks", JsonBlanks, nullptr},
        {"PenLogUpAndDown", PenLogUpAndDown, nullptr},
        {"PenLogOneLine", PenLogOneLine, "the last line is cut short"},
        {"PenLogOfBlanks", PenLogOfBlanks, nullptr},
        {"PenLogOfEmptyLines", PenLogOfEmptyLines, nullptr},
        {"PenLogFarAway", PenLogFarAway, nullptr},
        {"PenLogTimeGoesBack", PenLogTimeGoesBack, "the time runs backwards"},
        {"SvcCountTooLarge", SvcCountTooLarge, "cut short: fewer samples than the first line says"},
        {"SvcCountEndless", SvcCountEndless, "the number of samples was expected"},
        {"StrokeListDots", StrokeListDots, nullptr},
        {"StrokeListStarts", StrokeListStarts, "the pen never touches the page"},
        {"ZeroBytes", ZeroBytes, "the last line is cut short"},
    };
    return files;
}
