#include "gles/GlesFixture.h"
#include "gles/GraphicsObject.h"
#include "gles/TextureObject.h"

#include <nib/geometry.h>
#include <nib/texture.h>

#include <memory>

// Each GL call of an object's life fails once; nothing may be left behind.

using namespace Nib;
using Nib::GLES::GraphicsObject;
using Nib::GLES::TextureObject;

namespace
{

class ResourceFault : public GlesTest
{
protected:
    /// Calls @p live once for each call that it makes, failing that one.
    template <typename Life>
    void FailEachCallOf(Life&& live)
    {
        driver.AllowMisuse();
        driver.ForgetCalls();
        live();
        const std::size_t calls = driver.CallsMade();
        ASSERT_GT(calls, 5u);
        const SimCounts before = driver.Live();
        for (std::size_t n = 1; n <= calls; ++n)
        {
            driver.ForgetCalls();
            driver.FailAt(n);
            live();
            const bool refusedToDelete = FailedCall().rfind("glDelete", 0) == 0;
            driver.ForgetFailures();
            while (glGetError() != GL_NO_ERROR)
            {
            }
            if (refusedToDelete)
                continue; // the name stays, whatever the library does
            const SimCounts after = driver.Live();
            EXPECT_EQ(after.textures + after.samplers + after.buffers + after.syncs - m_refused,
                      before.textures + before.samplers + before.buffers + before.syncs)
                << "call " << n << " of " << calls;
        }
    }

private:
    /// The call that failed; one that deletes leaves what it was to delete.
    std::string FailedCall()
    {
        for (const SimCall& call : driver.Calls())
            if (call.failed)
            {
                m_refused += call.name.rfind("glDelete", 0) == 0 ? 1 : 0;
                return call.name;
            }
        ADD_FAILURE() << "no call failed";
        return {};
    }

    int m_refused = 0;
};

TextureDescriptor Fenced()
{
    TextureDescriptor descriptor;
    descriptor.width = descriptor.height = 2;
    descriptor.syncOnCreate = true;
    return descriptor;
}

} // namespace

TEST_F(ResourceFault, TextureLeavesNothingBehind)
{
    const unsigned char pixels[16] = {};
    FailEachCallOf(
        [&]
        {
            const std::unique_ptr<TextureObject, Releaser> texture(
                new TextureObject(Fenced(), pixels, nullptr, 0));
            if (texture->GetWidth() > 0)
                texture->Activate(0);
            texture->Update(pixels, 2);
            texture->ReleaseGLObject();
            texture->RestoreGLObject();
        });
}

TEST_F(ResourceFault, MeshLeavesNothingBehind)
{
    VertexDescriptor layout;
    layout.addAttribute(VertexDescriptor::AttributeType::Float, 2);
    const VertexDescriptor layouts[] = {layout, layout};
    const std::uint32_t indices[] = {0, 1, 2};
    FailEachCallOf(
        [&]
        {
            const std::unique_ptr<GraphicsObject, Releaser> mesh(
                new GraphicsObject(2, PrimitiveType::Triangles, layouts, 3, 3));
            mesh->UpdateIndexes(indices, 3);
            mesh->ReleaseGLObject();
            mesh->RestoreGLObject();
        });
}
