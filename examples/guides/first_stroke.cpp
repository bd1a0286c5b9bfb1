#include "TerminalPage.h"
#include <cmath>
#include <memory>
#include <nib/nib.h>

using namespace Nib;

struct DrawStroke : ITask // runs on the render thread, which then deletes it
{
    void run() override
    {
        TerminalPage page(64, 16); // in place of a window: its pixels become characters
        float ribbon[80][2];       // points on the two edges of the stroke, in turn
        for (int i = 0; i < 80; ++i)
        {
            const float x = 0.9f * ((i - i % 2) / 39.0f - 1), pressure = 0.5f + 0.4f * x;
            ribbon[i][0] = x;
            ribbon[i][1] = 0.6f * std::sin(5 * x) + (i % 2 ? 0.4f : -0.4f) * pressure;
        }
        VertexDescriptor layout;
        layout.addAttribute(VertexDescriptor::AttributeType::Float, 2);
        IGraphicsObject* const mesh =
            RendererFactory::CreateGraphicsObject(1, PrimitiveType::TriangleStrip, &layout, 80, 0);
        mesh->UpdateBuffer(0, ribbon, 80);
        IShaderProgram* const ink = RendererFactory::CreateShaderProgram(
            "attribute vec2 place; void main() { gl_Position = vec4(place, 0.0, 1.0); }",
            "void main() { gl_FragColor = vec4(1.0); }", nullptr);
        ink->Activate();
        mesh->Draw(0, -1, false); // all vertices, no indices
        mesh->Release(), ink->Release();
    }
};
int main()
{
    std::unique_ptr<RenderThreadGL> thread(
        RendererFactory::CreateSurfaceRenderer("ink", RenderThreadGL::High));
    thread->Start();
    thread->GetMsgQueue()->enQueueMsg(new DrawStroke);
    thread->Render(); // returns when the stroke is drawn
}
