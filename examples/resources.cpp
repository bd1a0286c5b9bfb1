// Every kind of resource at work: a texture, a mesh, a program with bindings, blending, a target.

#include "PostTask.h"

#include <nib/nib.h>

#include <cstdio>
#include <memory>

namespace
{

const char* const kVertexShader = R"(
attribute vec2 a_position;
varying vec2 v_place;
void main()
{
    v_place = a_position;
    gl_Position = vec4(a_position * 2.0 - 1.0, 0.0, 1.0);
}
)";

const char* const kFragmentShader = R"(
precision mediump float;
uniform sampler2D u_texture;
uniform float u_opacity;
varying vec2 v_place;
void main()
{
    gl_FragColor = texture2D(u_texture, v_place) * u_opacity;
}
)";

void DrawHalfRedOverWhite(unsigned char* pixel)
{
    using namespace Nib;
    using Factory = RendererFactory;
    const unsigned char red[] = {255, 0, 0, 255};
    TextureDescriptor onePixel;
    onePixel.width = onePixel.height = 1;
    const Ink::Owned<ITextureObject> texture(
        Factory::CreateTextureObject(onePixel, red, nullptr, 0, nullptr));
    const Ink::Owned<ITextureObject> page(
        Factory::CreateTextureObject(onePixel, nullptr, nullptr, 0, nullptr));
    const Ink::Owned<IOffscreenRenderTarget> target(
        Factory::CreateOffscreenRenderTarget(page.get()));

    VertexDescriptor corner;
    corner.addAttribute(VertexDescriptor::AttributeType::Float, 2);
    const float corners[] = {0, 0, 1, 0, 0, 1, 1, 1};
    const Ink::Owned<IGraphicsObject> quad(
        Factory::CreateGraphicsObject(1, PrimitiveType::TriangleStrip, &corner, 4, 0));
    quad->UpdateBuffer(0, corners, 4);

    const Ink::Owned<IShaderProgram> program(
        Factory::CreateShaderProgram(kVertexShader, kFragmentShader, nullptr));
    const Ink::Owned<IParameterBinding> unit(program->GetBindingIntf("u_texture"));
    const Ink::Owned<IParameterBinding> opacity(program->GetBindingIntf("u_opacity"));
    const Ink::Owned<IBlendStateObject> blending(
        Factory::CreateBlendStateObject(BlendStateDescriptor(true))); // premultiplied alpha

    target->ClearColor(1, 1, 1, 1);
    target->Activate();
    program->Activate();
    const int firstUnit = 0;
    const float half = 0.5f;
    unit->SetValue(&firstUnit);
    opacity->SetValue(&half);
    texture->Activate(firstUnit);
    blending->Activate();
    quad->Draw(0, -1, false);

    IRenderTarget::BufferDescriptor buffer;
    buffer.pixels = pixel;
    target->ReadPixels(0, 0, 1, 1, buffer);
}

} // namespace

int main()
{
    const std::unique_ptr<Nib::RenderThreadGL> thread(
        Nib::RendererFactory::CreateSurfaceRenderer("example", Nib::RenderThreadGL::Medium));
    thread->Start();
    unsigned char pixel[4] = {};
    Ink::Post(*thread->GetMsgQueue(), [&pixel] { DrawHalfRedOverWhite(pixel); });
    thread->GetMsgQueue()->waitForCompleting();
    std::printf("pixel %d %d %d %d\n", pixel[0], pixel[1], pixel[2], pixel[3]);
    return pixel[0] == 255 && pixel[1] >= 126 && pixel[1] <= 129 && pixel[3] == 255 ? 0 : 1;
}
