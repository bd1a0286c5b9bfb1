#include "Action.h"
#include "Batch.h"
#include "Failure.h"
#include "Family.h"

#include "PostTask.h"

#include <nib/nib.h>

#include <algorithm>
#include <cstdint>
#include <string>
#include <vector>

namespace Soak
{

namespace
{

using Nib::RendererFactory;

/// A texture's pixels come back through a render target.
void CheckTexture(int width, int height, unsigned char shade)
{
    Nib::TextureDescriptor description;
    description.width = static_cast<decltype(description.width)>(width);
    description.height = static_cast<decltype(description.height)>(height);
    const std::vector<unsigned char> pixels(static_cast<std::size_t>(width * height * 4), shade);
    const Ink::Owned<Nib::ITextureObject> texture(
        RendererFactory::CreateTextureObject(description, pixels.data(), nullptr, 0, nullptr));
    const Ink::Owned<Nib::IOffscreenRenderTarget> target(
        RendererFactory::CreateOffscreenRenderTarget(texture.get()));
    std::vector<unsigned char> read(pixels.size());
    Nib::IRenderTarget::BufferDescriptor buffer;
    buffer.pixels = read.data();
    target->Activate();
    target->ReadPixels(0, 0, width, height, buffer);
    target->Deactivate(true, true);
    Require(read == pixels, "a texture of " + std::to_string(width) + " x " +
                                std::to_string(height) + " does not hold what it was given");
}

/// Buffers are filled, again and larger.
void FillBuffers(int size)
{
    Nib::VertexDescriptor vertex;
    vertex.addAttribute(Nib::VertexDescriptor::AttributeType::Float, 3);
    const auto count = static_cast<unsigned int>(size);
    const Ink::Owned<Nib::IGraphicsObject> mesh(RendererFactory::CreateGraphicsObject(
        1, Nib::PrimitiveType::Triangles, &vertex, count, count));
    const std::vector<float> vertices(static_cast<std::size_t>(size) * 3 + 4); // 16 bytes at least
    const std::vector<std::uint32_t> indexes(static_cast<std::size_t>(size));
    mesh->UpdateBuffer(0, vertices.data(), count);
    mesh->UpdateIndexes(indexes.data(), count);
    const Ink::Owned<Nib::IUniformBuffer> uniforms(RendererFactory::CreateUniformBuffer());
    uniforms->Update(vertices.data(), 16 * count / 4, Nib::BufferUsage::Dynamic);
    uniforms->Update(vertices.data(), 16, Nib::BufferUsage::Dynamic);
}

void WaitForTheGpu()
{
    const Ink::Owned<Nib::IFence> fence(RendererFactory::CreateFence());
    fence->Insert();
    Require(static_cast<int>(fence->Wait()) == 0, "waiting for a fence failed");
}

class ResourceAction : public Action
{
public:
    const char* Name() const override { return "resources"; }

    void Run(Family& family, Random& random) const override
    {
        Batch batch;
        for (int i = random.Between(1, 6); i > 0; --i)
        {
            const int width = random.Between(1, 300);
            const int height = random.Between(1, 300);
            const auto shade = static_cast<unsigned char>(random.Below(256));
            batch.Post(family.SomeThread(random),
                       [=]
                       {
                           CheckTexture(width, height, shade);
                           FillBuffers(width);
                           WaitForTheGpu();
                       });
        }
        batch.Finish();
    }
};

} // namespace

std::unique_ptr<Action> MakeResourceAction()
{
    return std::make_unique<ResourceAction>();
}

} // namespace Soak
