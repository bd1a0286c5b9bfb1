#include "Action.h"
#include "Batch.h"
#include "Failure.h"
#include "Family.h"

#include "PostTask.h"

#include <nib/nib.h>

#include <array>
#include <cstdlib>
#include <string>

namespace Soak
{

namespace
{

using Nib::RendererFactory;

constexpr int kVariants = 12;
constexpr int kMostPrograms = 4; ///< built on one thread at a time

const char* const kVertex = "attribute vec2 a_position;\n"
                            "void main() { gl_Position = vec4(a_position, 0.0, 1.0); }\n";

/// Fills with red @p variant * 20 and what u_rest says. Lives as long as the process.
const char* Fragment(int variant)
{
    static const std::array<std::string, kVariants> texts = []
    {
        std::array<std::string, kVariants> made;
        for (int i = 0; i < kVariants; ++i)
            made[static_cast<std::size_t>(i)] = "precision mediump float;\n"
                                                "uniform vec2 u_rest;\n"
                                                "void main() { gl_FragColor = vec4(" +
                                                std::to_string(i * 20) +
                                                ".0 / 255.0, u_rest, 1.0); }\n";
        return made;
    }();
    return texts[static_cast<std::size_t>(variant)].c_str();
}

/// Fills the current target with the program of @p variant.
void Fill(int variant)
{
    const Ink::Owned<Nib::IShaderProgram> program(
        RendererFactory::CreateShaderProgram(kVertex, Fragment(variant), nullptr));
    const Ink::Owned<Nib::IParameterBinding> rest(program->GetBindingIntf("u_rest"));
    Nib::VertexDescriptor corner;
    corner.addAttribute(Nib::VertexDescriptor::AttributeType::Float, 2);
    const float corners[] = {-1, -1, 3, -1, -1, 3};
    const Ink::Owned<Nib::IGraphicsObject> triangle(
        RendererFactory::CreateGraphicsObject(1, Nib::PrimitiveType::Triangles, &corner, 3, 0));
    const Ink::Owned<Nib::IBlendStateObject> blending(
        RendererFactory::CreateBlendStateObject(Nib::BlendStateDescriptor(true)));
    triangle->UpdateBuffer(0, corners, 3);
    const float greenAndBlue[] = {1.0f, 0.0f};
    program->Activate();
    rest->SetValue(greenAndBlue);
    blending->Activate();
    triangle->Draw(0, -1, false);
}

/// Throws Failure when the program of @p variant does not draw what its text says.
void BuildAndDraw(int variant)
{
    Nib::TextureDescriptor onePixel;
    onePixel.width = onePixel.height = 1;
    const Ink::Owned<Nib::ITextureObject> texture(
        RendererFactory::CreateTextureObject(onePixel, nullptr, nullptr, 0, nullptr));
    const Ink::Owned<Nib::IOffscreenRenderTarget> target(
        RendererFactory::CreateOffscreenRenderTarget(texture.get()));
    target->Activate();
    Fill(variant);
    std::array<unsigned char, 4> pixel{};
    Nib::IRenderTarget::BufferDescriptor buffer;
    buffer.pixels = pixel.data();
    target->ReadPixels(0, 0, 1, 1, buffer);
    target->Deactivate(false, false);
    Require(std::abs(pixel[0] - variant * 20) <= 1 && pixel[1] == 255 && pixel[2] == 0,
            "program " + std::to_string(variant) + " drew " + std::to_string(pixel[0]) + ", " +
                std::to_string(pixel[1]) + ", " + std::to_string(pixel[2]));
}

class ProgramAction : public Action
{
public:
    const char* Name() const override { return "programs"; }

    void Run(Family& family, Random& random) const override
    {
        Batch batch;
        for (int i = random.Between(1, kMostPrograms * (1 + family.Children())); i > 0; --i)
        {
            Nib::RenderThreadGL& thread = family.SomeThread(random);
            batch.Post(thread, [variant = random.Below(kVariants)] { BuildAndDraw(variant); });
        }
        batch.Finish();
    }
};

} // namespace

std::unique_ptr<Action> MakeProgramAction()
{
    return std::make_unique<ProgramAction>();
}

} // namespace Soak
