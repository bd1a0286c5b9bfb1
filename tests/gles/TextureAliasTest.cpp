#include "gles/GlesFixture.h"
#include "gles/TextureObject.h"

#include <nib/exceptions.h>
#include <nib/texture.h>

#include <memory>
#include <stdexcept>

using Nib::TextureDescriptor;
using Nib::GLES::TextureObject;

namespace
{

using Texture = std::unique_ptr<TextureObject, Releaser>;

class TextureAlias : public GlesTest
{
protected:
    Texture Made(int width = 2, int height = 2, bool fenced = false)
    {
        TextureDescriptor descriptor;
        descriptor.width = width;
        descriptor.height = height;
        descriptor.syncOnCreate = fenced;
        Texture texture(new TextureObject(descriptor, nullptr, nullptr, 0));
        Forget();
        return texture;
    }
    Texture Of(const Texture& source)
    {
        return Texture(new TextureObject(TextureDescriptor(source.get()), nullptr, nullptr, 0));
    }
    void Forget()
    {
        driver.ForgetCalls();
        driver.ForgetLog();
    }
};

} // namespace

// ---- names --------------------------------------------------------------------------------------

TEST_F(TextureAlias, UsesTheNamesOfItsSource)
{
    const Texture source = Made();
    const Texture alias = Of(source);
    alias->Activate(1);
    alias->SetParam(4, 0);
    EXPECT_EQ(CallTexts(), (Texts{"glActiveTexture(33985)", "glBindTexture(3553, 1)",
                                  "glBindSampler(1, 1)", "glSamplerParameteri(1, 10240, 9728)"}));
}

TEST_F(TextureAlias, TakesItsTargetFromItsOwnDescriptor)
{
    const Texture source = Made();
    TextureDescriptor described(source.get());
    described.target = 4;
    const Texture alias(new TextureObject(described, nullptr, nullptr, 0));
    EXPECT_EQ(alias->internals().target, GLenum{GL_TEXTURE_CUBE_MAP});
    EXPECT_EQ(alias->internals().glID, source->internals().glID);
}

TEST_F(TextureAlias, KeepsTheParametersItWasMadeWith)
{
    const Texture source = Made();
    const unsigned params[] = {4, 0, 5, 0};
    const Texture alias(new TextureObject(TextureDescriptor(source.get()), nullptr, params, 2));
    EXPECT_EQ(alias->internals().params, (TextureObject::Params{{4, 0}, {5, 0}}));
    EXPECT_EQ(driver.CallCount(), 0u);
}

TEST_F(TextureAlias, OfAnAliasHasTheSameNames)
{
    const Texture source = Made();
    const Texture first = Of(source);
    const Texture second = Of(first);
    EXPECT_EQ(second->internals().glID, 1u);
    EXPECT_EQ(second->GetDescriptor().source, first.get());
}

TEST_F(TextureAlias, OfNoSizeIsRefusedLikeATexture)
{
    const Texture source = Made(0, 0);
    const Texture alias = Of(source);
    EXPECT_THROW(alias->Activate(0), Nib::TextureNotValidException);
    EXPECT_THROW(alias->SetData(nullptr, 0), Nib::TextureNotValidException);
}

TEST_F(TextureAlias, BecomesATextureOfItsOwn)
{
    const Texture source = Made();
    const Texture alias = Of(source);
    TextureDescriptor own = alias->GetDescriptor();
    own.source = nullptr;
    alias->SetDescriptor(own);
    EXPECT_EQ(driver.CallCount("glDeleteTextures"), 0u);
    EXPECT_EQ(driver.CountLogContaining("FREE."), 0u);
    EXPECT_NE(alias->internals().glID, source->internals().glID);
    EXPECT_TRUE(alias->IsSubscribed());
    EXPECT_EQ(driver.Live().textures, 2);
}

TEST_F(TextureAlias, PlainOneKeepsDeadNamesAfterALoss)
{
    const Texture source = Made();
    const Texture alias = Of(source);
    queue.observer.DispatchRelease();
    queue.observer.DispatchRestore();
    EXPECT_EQ(alias->internals().glID, 1u);
    EXPECT_EQ(source->internals().glID, 2u);
}

TEST_F(TextureAlias, PlainOneBindsTheNamesItWasMadeWith)
{
    const Texture source = Made();
    const Texture alias = Of(source);
    source->SetDescriptor(Made(4, 4)->GetDescriptor()); // has another name then
    ASSERT_NE(source->internals().glID, 1u);
    driver.AllowMisuse("glBindTexture"); // the names are dead
    driver.AllowMisuse("glBindSampler");
    Forget();
    alias->Activate(0);
    EXPECT_EQ(driver.LastCall("glBindTexture").Arg(1), 1);
}

TEST_F(TextureAlias, ReleasedByHandForgetsTheFenceAlone)
{
    const Texture source = Made(2, 2, true);
    const Texture alias = Of(source);
    alias->ReleaseGLObject();
    EXPECT_EQ(alias->internals().fence.Get(), nullptr);
    EXPECT_NE(source->internals().fence.Get(), nullptr);
    EXPECT_EQ(driver.Live().syncs, 1);
}

TEST_F(TextureAlias, ReleasedByHandForgetsItsNamesAlone)
{
    const Texture source = Made();
    const Texture alias = Of(source);
    Forget();
    alias->ReleaseGLObject();
    EXPECT_EQ(Infos(), (Texts{"virtual void Nib::GLES::TextureObject::ReleaseGLObject() - Release "
                              "Was called. Texture - 1"}));
    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_EQ(alias->internals().glID, 0u);
}

TEST_F(TextureAlias, RestoredBeforeItsSourceTakesUpItsNamesWhenUsed)
{
    const Texture alias = Made(); // subscribed first, hence restored first
    const Texture source = Made(5, 5);
    alias->SetDescriptor(TextureDescriptor(source.get()));
    queue.observer.DispatchRelease();
    queue.observer.DispatchRestore();
    ASSERT_NE(source->internals().glID, 0u);
    Forget();
    alias->Activate(0);
    EXPECT_EQ(driver.LastCall("glBindTexture").Arg(1), source->internals().glID);
    EXPECT_EQ(driver.LastCall("glBindSampler").Arg(1), source->internals().sampler);
    EXPECT_EQ(driver.CallCount(), 3u);
}

TEST_F(TextureAlias, RestoredBeforeItsSourceTakesUpItsNamesForAParameter)
{
    const Texture alias = Made();
    const Texture source = Made(5, 5);
    alias->SetDescriptor(TextureDescriptor(source.get()));
    queue.observer.DispatchRelease();
    queue.observer.DispatchRestore();
    Forget();
    alias->SetParam(Nib::kTextureParamWrapS, Nib::kTextureWrapRepeat);
    EXPECT_EQ(driver.LastCall("glSamplerParameteri").Arg(0), source->internals().sampler);
}

TEST_F(TextureAlias, MadeOfASubscribedTextureIsRestoredWithoutCountingAgain)
{
    const Texture source = Made();
    const Texture other = Made(5, 5);
    other->SetDescriptor(TextureDescriptor(source.get()));
    queue.observer.DispatchRelease();
    Forget();
    other->RestoreGLObject(); // before its source: nothing to borrow yet
    EXPECT_EQ(driver.CallNames(), Names({"glGetError"}));
    EXPECT_EQ(Infos(), (Texts{"virtual void Nib::GLES::TextureObject::RestoreGLObject() - Restore "
                              "Was called. Texture After - 0 (err: 0)"}));
}

// ---- fences -------------------------------------------------------------------------------------

TEST_F(TextureAlias, OfAnAliasWaitsForTheWholeLine)
{
    const Texture source = Made(2, 2, true);
    const Texture first = Of(source);
    const Texture second = Of(first);
    second->Activate(0);
    EXPECT_EQ(driver.CallCount("glWaitSync"), 1u);
    first->Activate(1);
    source->Activate(2);
    EXPECT_EQ(driver.CallCount("glWaitSync"), 1u);
    EXPECT_EQ(driver.CallCount("glDeleteSync"), 1u);
    EXPECT_EQ(driver.Live().syncs, 0);
}

TEST_F(TextureAlias, SiblingsWaitOnce)
{
    const Texture source = Made(2, 2, true);
    const Texture first = Of(source);
    const Texture second = Of(source);
    first->Activate(0);
    EXPECT_EQ(driver.CallCount("glWaitSync"), 1u);
    second->Activate(0);
    source->Activate(0);
    EXPECT_EQ(driver.CallCount("glWaitSync"), 1u);
    EXPECT_EQ(driver.CallCount("glDeleteSync"), 1u);
}

TEST_F(TextureAlias, DoesNotTouchAFenceThatItsSourceDeleted)
{
    const Texture source = Made(2, 2, true);
    const Texture alias = Of(source);
    TextureDescriptor larger = source->GetDescriptor();
    larger.width = 4;
    larger.syncOnCreate = false;
    source->SetDescriptor(larger); // deletes the sync object with the texture
    EXPECT_EQ(driver.CallCount("glDeleteSync"), 1u);
    driver.AllowMisuse("glBindTexture"); // the alias still has the old name
    driver.AllowMisuse("glBindSampler");
    alias->Activate(0);
    EXPECT_EQ(driver.CallCount("glWaitSync"), 0u);
    EXPECT_EQ(driver.CallCount("glDeleteSync"), 1u);
}

TEST_F(TextureAlias, EndOfAnAliasLeavesTheFenceToItsSource)
{
    const Texture source = Made(2, 2, true);
    Of(source).reset();
    EXPECT_EQ(driver.CallCount("glDeleteSync"), 0u);
    source->Activate(0);
    EXPECT_EQ(driver.CallCount("glWaitSync"), 1u);
}

TEST_F(TextureAlias, FenceIsWaitedForBeforeTheSizeIsLookedAt)
{
    const Texture texture = Made(0, 0, true);
    EXPECT_THROW(texture->Activate(0), Nib::TextureNotValidException);
    EXPECT_EQ(driver.CallNames(), Names({"glWaitSync", "glDeleteSync"}));
}

TEST_F(TextureAlias, UpdateDoesNotWaitForAFence)
{
    const Texture texture = Made(2, 2, true);
    const unsigned char pixels[16] = {};
    texture->Update(pixels, 0);
    EXPECT_EQ(driver.CallCount("glWaitSync"), 0u);
    EXPECT_EQ(driver.Live().syncs, 1);
}

TEST_F(TextureAlias, FenceIsMadeAgainWithTheTexture)
{
    const Texture texture = Made(2, 2, true);
    texture->Activate(0);
    queue.observer.DispatchRelease();
    queue.observer.DispatchRestore();
    EXPECT_EQ(driver.Live().syncs, 1);
    Forget();
    texture->Activate(0);
    EXPECT_EQ(driver.CallCount("glWaitSync"), 1u);
}

// ---- descriptions -------------------------------------------------------------------------------

TEST_F(TextureAlias, DescriptorOfNoTextureIsTheDefault)
{
    const TextureDescriptor descriptor(nullptr);
    EXPECT_EQ(descriptor.width, 0);
    EXPECT_EQ(descriptor.target, 1);
    EXPECT_EQ(descriptor.source, nullptr);
}

TEST_F(TextureAlias, NewDescriptionFreesAndCountsAndEmptiesTheTag)
{
    const Texture texture = Made(512, 512);
    texture->SetTag("before");
    TextureDescriptor larger = texture->GetDescriptor();
    larger.height = 1024;
    Forget();
    texture->SetDescriptor(larger);
    EXPECT_EQ(Infos(),
              (Texts{"FREE. Size = 1024.00KB, Counter = 0, Total Size = 0.00MB, glID = 1, tag = "
                     "before",
                     "CREATE. Texture Size = 2048.00KB Texture Counter = 1 Total Size = 2.00MB, "
                     "glID = 2",
                     "void Nib::ManagedObject::Register() Object Already subscribed to obtain "
                     "Release/Restore calls!"}));
    EXPECT_STREQ(texture->GetTag(), "");
}

TEST_F(TextureAlias, NewDescriptionOfTheOwnDescriptorIsSafe)
{
    const Texture texture = Made();
    texture->SetDescriptor(texture->GetDescriptor());
    EXPECT_EQ(driver.CallCount(), 0u);
}

TEST_F(TextureAlias, NewDescriptionAboveTheLimitLeavesNoNameBehind)
{
    const Texture texture = Made();
    TextureDescriptor large = texture->GetDescriptor();
    large.width = 8193;
    EXPECT_THROW(texture->SetDescriptor(large), std::logic_error);
    EXPECT_EQ(texture->internals().glID, 0u);
    EXPECT_EQ(driver.Live().textures, 0);
    EXPECT_EQ(driver.Live().samplers, 0);
    EXPECT_EQ(texture->GetWidth(), 2);
}

TEST_F(TextureAlias, FailedTextureIsMadeOfItsDefaultDescriptionAtARestore)
{
    TextureDescriptor wrong;
    wrong.width = wrong.height = 4;
    wrong.target = 6;
    const Texture texture(new TextureObject(wrong, nullptr, nullptr, 0));
    queue.observer.DispatchRelease();
    queue.observer.DispatchRestore();
    EXPECT_NE(texture->internals().glID, 0u);
    EXPECT_EQ(driver.LastCall("glTexImage2D"), Call("glTexImage2D", GL_TEXTURE_2D, 0, GL_RGBA8, 0,
                                                    0, 0, GL_RGBA, GL_UNSIGNED_BYTE, nullptr));
}

TEST_F(TextureAlias, ReleasedTextureTakesANewDescription)
{
    const Texture texture = Made();
    queue.observer.DispatchRelease();
    TextureDescriptor larger = texture->GetDescriptor();
    larger.width = 4;
    Forget();
    texture->SetDescriptor(larger);
    EXPECT_EQ(driver.CountLogContaining("FREE."), 0u);
    EXPECT_EQ(driver.Live().textures, 1);
    queue.observer.DispatchRestore();
    EXPECT_EQ(driver.CountLogContaining("Restore Was called twice or more."), 1u);
    EXPECT_EQ(driver.Live().textures, 1);
}
