#ifndef NIB_TESTS_FAULTS_DRAWN_THINGS_H
#define NIB_TESTS_FAULTS_DRAWN_THINGS_H

#include <nib/nib.h>

#include <memory>
#include <vector>

/// Objects of the factory's kind, ended on the thread that made them.
struct ReleaseObject
{
    template <typename T>
    void operator()(T* object) const
    {
        object->Release();
    }
};

template <typename T>
using Made = std::unique_ptr<T, ReleaseObject>;

/// What a careful application keeps on one render thread: something of every family of objects.
struct DrawnThings
{
    Made<Nib::IShaderProgram> program;
    Made<Nib::IShaderProgram> tinted; // takes its colour from a uniform block
    Made<Nib::IParameterBinding> matrix;
    Made<Nib::IParameterBinding> picture;
    Made<Nib::IParameterBinding> block;
    Made<Nib::ITextureObject> texture;
    Made<Nib::ITextureObject> color;
    Made<Nib::IDepthStencilBuffer> depth;
    Made<Nib::IOffscreenRenderTarget> target;
    Made<Nib::IGraphicsObject> mesh;
    Made<Nib::IGraphicsObject> copies;
    Made<Nib::IUniformBuffer> uniforms;
    Made<Nib::IBlendStateObject> blend;
    Made<Nib::IDepthStencilState> depthTest;
    Made<Nib::IFence> fence;

    bool isReady = false; // all of it is there

    void Make();
    /// Ends what does not survive the loss of a context.
    void ReleaseUnmanaged();
    /// Makes that again, and the contents that were lost.
    void Refill();
    void DrawOffscreen(float shade);
    void DrawOn(Nib::IRenderTarget& screen, float shade);
    /// The pixels of the offscreen target.
    std::vector<unsigned char> Export();
    void Release();

private:
    void MakeUnmanaged();
    void Fill();
};

#endif
