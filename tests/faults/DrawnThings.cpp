#include "faults/DrawnThings.h"

using namespace Nib;

namespace
{

constexpr int kSide = 8;

constexpr const char* kVertex = "attribute vec2 a_pos;\n"
                                "attribute vec2 a_coord;\n"
                                "uniform mat4 u_matrix;\n"
                                "varying vec2 v_coord;\n"
                                "void main()\n"
                                "{\n"
                                "    v_coord = a_coord;\n"
                                "    gl_Position = u_matrix * vec4(a_pos, 0.0, 1.0);\n"
                                "}\n";
constexpr const char* kFragment = "precision mediump float;\n"
                                  "varying vec2 v_coord;\n"
                                  "uniform sampler2D u_picture;\n"
                                  "void main() { gl_FragColor = texture2D(u_picture, v_coord); }\n";

constexpr const char* kBlockVertex = "#version 300 es\n"
                                     "layout(location = 0) in vec2 a_pos;\n"
                                     "layout(location = 1) in vec2 a_place;\n"
                                     "void main() { gl_Position = vec4(a_pos + a_place, 0, 1); }\n";
constexpr const char* kBlockFragment = "#version 300 es\n"
                                       "precision mediump float;\n"
                                       "uniform Tint { vec4 u_tint; };\n"
                                       "out vec4 color;\n"
                                       "void main() { color = u_tint; }\n";

constexpr float kCorners[] = {0, 0, 0, 0, 1, 0, 1, 0, 1, 1, 1, 1, 0, 1, 0, 1};
constexpr float kPlaces[] = {0.0f, 0.0f, 0.5f, 0.5f};
constexpr std::uint32_t kIndices[] = {0, 1, 2, 0, 2, 3};

VertexDescriptor Vertices(int divisor, int attributes)
{
    VertexDescriptor layout;
    for (int i = 0; i < attributes; ++i)
        layout.addAttribute(VertexDescriptor::AttributeType::Float, 2, VertexDescriptor::kPacked,
                            divisor);
    layout.usage = BufferUsage::Static;
    return layout;
}

TextureDescriptor Square(bool fenced)
{
    TextureDescriptor descriptor;
    descriptor.width = descriptor.height = kSide;
    descriptor.syncOnCreate = fenced;
    return descriptor;
}

std::vector<unsigned char> Pixels()
{
    std::vector<unsigned char> pixels(kSide * kSide * 4);
    for (std::size_t i = 0; i < pixels.size(); ++i)
        pixels[i] = static_cast<unsigned char>(i * 7);
    return pixels;
}

} // namespace

void DrawnThings::Make()
{
    const unsigned params[] = {kTextureParamMagFilter, kTextureFilterNearest};
    program.reset(RendererFactory::CreateShaderProgram(kVertex, kFragment, nullptr));
    tinted.reset(RendererFactory::CreateShaderProgram(kBlockVertex, kBlockFragment, nullptr));
    matrix.reset(program->GetBindingIntf("u_matrix"));
    picture.reset(program->GetBindingIntf("u_picture"));
    block.reset(tinted->GetBindingIntf("Tint"));
    texture.reset(
        RendererFactory::CreateTextureObject(Square(true), Pixels().data(), params, 1, nullptr));
    color.reset(RendererFactory::CreateTextureObject(Square(false), nullptr, nullptr, 0, nullptr));
    const VertexDescriptor corners = Vertices(0, 2);
    mesh.reset(RendererFactory::CreateGraphicsObject(1, PrimitiveType::Triangles, &corners, 4, 6));
    const VertexDescriptor pairs[] = {Vertices(0, 1), Vertices(1, 1)};
    copies.reset(RendererFactory::CreateGraphicsObject(2, PrimitiveType::TriangleFan, pairs, 4, 0));
    blend.reset(RendererFactory::CreateBlendStateObject(BlendStateDescriptor(true)));
    depthTest.reset(
        RendererFactory::CreateDepthStencilState(DepthStencilStateDescriptor(true, true)));
    depth.reset(RendererFactory::CreateDepthStencilBuffer(kSide, kSide));
    MakeUnmanaged();
    Fill();
    isReady = true;
}

void DrawnThings::MakeUnmanaged()
{
    target.reset(RendererFactory::CreateOffscreenRenderTarget(color.get()));
    target->AttachDepthStencilBuffer(depth.get());
    uniforms.reset(RendererFactory::CreateUniformBuffer());
    fence.reset(RendererFactory::CreateFence());
}

void DrawnThings::ReleaseUnmanaged()
{
    isReady = false;
    fence.reset();
    uniforms.reset();
    target.reset();
}

void DrawnThings::Refill()
{
    if (!copies)
        return; // the making has failed
    MakeUnmanaged();
    Fill();
    isReady = true;
}

void DrawnThings::Fill()
{
    texture->Update(Pixels().data(), 0);
    mesh->UpdateBuffer(0, kCorners, 4);
    mesh->UpdateIndexes(kIndices, 6);
    copies->UpdateBuffer(0, kCorners, 4);
    copies->UpdateBuffer(1, kPlaces, 2);
}

void DrawnThings::DrawOffscreen(float shade)
{
    if (!isReady)
        return;
    const float tint[] = {shade, 0.25f, 0.5f, 1.0f};
    uniforms->Update(tint, sizeof tint, BufferUsage::Dynamic);
    target->ClearColor(0, 0, 0, 0);
    target->ClearDepthStencil(true, 1, true, 0);
    target->Activate();
    depthTest->Activate();
    tinted->Activate();
    const int binding = 1;
    block->SetValue(&binding);
    uniforms->Activate(binding);
    copies->DrawInstanced(0, 4, 2);
    tinted->Deactivate();
    target->Deactivate(true, true);
    fence->Insert();
}

void DrawnThings::DrawOn(IRenderTarget& screen, float shade)
{
    if (!isReady)
        return;
    const float placed[] = {shade, 0, 0, 0, 0, shade, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1};
    const int unit = 2;
    fence->Wait();
    screen.Activate();
    screen.ClearColor(1, 1, shade, 1);
    RendererFactory::GetRasterizerState()->SetScissorEnabled(true);
    RendererFactory::GetRasterizerState()->SetScissorRect({2, 2, 20, 20});
    blend->Activate();
    program->Activate();
    matrix->SetValue(placed);
    picture->SetValue(&unit);
    color->Activate(unit);
    mesh->Draw(0, 6, true);
    texture->Activate(unit);
    mesh->Draw(PrimitiveType::Triangles, 0, 3, true);
    program->Deactivate();
    RendererFactory::GetRasterizerState()->SetScissorEnabled(false);
    screen.Deactivate(true, true);
}

std::vector<unsigned char> DrawnThings::Export()
{
    std::vector<unsigned char> pixels(kSide * kSide * 4);
    IRenderTarget::BufferDescriptor memory;
    memory.pixels = pixels.data();
    if (isReady)
        target->ReadPixels(0, 0, kSide, kSide, memory);
    return pixels;
}

void DrawnThings::Release()
{
    ReleaseUnmanaged();
    depth.reset();
    depthTest.reset();
    blend.reset();
    copies.reset();
    mesh.reset();
    color.reset();
    texture.reset();
    block.reset();
    picture.reset();
    matrix.reset();
    tinted.reset();
    program.reset();
}
