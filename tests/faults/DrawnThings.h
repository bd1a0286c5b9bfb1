#ifndef NIB_TESTS_FAULTS_DRAWN_THINGS_H
#define NIB_TESTS_FAULTS_DRAWN_THINGS_H

#include "Owned.h"

#include <nib/nib.h>

#include <vector>

/// What a careful application keeps on one render thread: something of every family of objects.
struct DrawnThings
{
    Owned<Nib::IShaderProgram> program;
    Owned<Nib::IShaderProgram> tinted; // takes its colour from a uniform block
    Owned<Nib::IParameterBinding> matrix;
    Owned<Nib::IParameterBinding> picture;
    Owned<Nib::IParameterBinding> block;
    Owned<Nib::ITextureObject> texture;
    Owned<Nib::ITextureObject> color;
    Owned<Nib::IDepthStencilBuffer> depth;
    Owned<Nib::IOffscreenRenderTarget> target;
    Owned<Nib::IGraphicsObject> mesh;
    Owned<Nib::IGraphicsObject> copies;
    Owned<Nib::IUniformBuffer> uniforms;
    Owned<Nib::IBlendStateObject> blend;
    Owned<Nib::IDepthStencilState> depthTest;
    Owned<Nib::IFence> fence;

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
