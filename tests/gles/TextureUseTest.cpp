#include "gles/GlesFixture.h"
#include "gles/TextureObject.h"

#include <nib/exceptions.h>
#include <nib/texture.h>

#include <memory>

using Nib::Rect;
using Nib::TextureDescriptor;
using Nib::TextureMemoryLayout;
using Nib::TextureTargetLayout;
using Nib::GLES::TextureObject;

namespace
{

using Texture = std::unique_ptr<TextureObject, Releaser>;

class TextureUse : public GlesTest
{
protected:
    Texture Made(int width, int height, int target = 1, int depth = 0)
    {
        TextureDescriptor descriptor;
        descriptor.width = width;
        descriptor.height = height;
        descriptor.depth = depth;
        descriptor.target = target;
        Texture texture(new TextureObject(descriptor, nullptr, nullptr, 0));
        Forget();
        return texture;
    }
    Texture Alias(const TextureObject& source)
    {
        Texture texture(new TextureObject(TextureDescriptor(&source), nullptr, nullptr, 0));
        return texture;
    }
    void Forget()
    {
        driver.ForgetCalls();
        driver.ForgetLog();
    }
};

using TextureUseDeathTest = TextureUse;
using TextureUseWithoutSamplers = GlesTestWithoutSamplers;

} // namespace

// ---- activation ---------------------------------------------------------------------------------

TEST_F(TextureUse, ActivateBindsTextureAndSampler)
{
    const Texture texture = Made(4, 2);
    texture->Activate(3);
    EXPECT_EQ(CallTexts(),
              (Texts{"glActiveTexture(33987)", "glBindTexture(3553, 1)", "glBindSampler(3, 1)"}));
}

TEST_F(TextureUseWithoutSamplers, ActivateBindsSamplerZero)
{
    TextureDescriptor descriptor;
    descriptor.width = descriptor.height = 2;
    const Texture texture(new TextureObject(descriptor, nullptr, nullptr, 0));
    driver.ForgetCalls();
    texture->Activate(0);
    EXPECT_EQ(CallTexts(),
              (Texts{"glActiveTexture(33984)", "glBindTexture(3553, 1)", "glBindSampler(0, 0)"}));
}

TEST_F(TextureUseDeathTest, ActivateOfAFifthUnitAborts)
{
    testing::GTEST_FLAG(death_test_style) = "threadsafe";
    const Texture texture = Made(4, 2);
    EXPECT_DEATH(texture->Activate(4),
                 "nib_log: cond: Error! Please, change value of variable MAX_ACTIVE_TEXTURES by 5");
    EXPECT_DEATH(texture->Activate(9),
                 "Error! Please, change value of variable MAX_ACTIVE_TEXTURES by 10");
}

TEST_F(TextureUse, ActivateOfATextureOfNoSizeThrows)
{
    const Texture texture = Made(0, 0);
    try
    {
        texture->Activate(0);
        FAIL() << "no exception";
    }
    catch (const Nib::TextureNotValidException& error)
    {
        EXPECT_STREQ(error.what(), "Texture is corrupted or doesn't exist!");
    }
    EXPECT_EQ(Errors(), (Texts{"Texture is corrupted or doesn't exist!"}));
    EXPECT_EQ(driver.CallCount("glBindTexture"), 0u);
}

TEST_F(TextureUse, ActivateWorksWhenOneSideIsNotZero)
{
    const Texture texture = Made(4, 0);
    texture->Activate(0);
    EXPECT_EQ(driver.CallCount("glBindTexture"), 1u);
}

TEST_F(TextureUse, FirstActivateWaitsForAFencedUpload)
{
    TextureDescriptor fenced;
    fenced.width = fenced.height = 2;
    fenced.syncOnCreate = true;
    const Texture texture(new TextureObject(fenced, nullptr, nullptr, 0));
    Forget();
    texture->Activate(0);
    EXPECT_EQ(driver.CallNames(), Names({"glWaitSync", "glDeleteSync", "glActiveTexture",
                                         "glBindTexture", "glBindSampler"}));
    EXPECT_EQ(driver.LastCall("glWaitSync").Arg(1), 0);
    EXPECT_EQ(static_cast<unsigned long long>(driver.LastCall("glWaitSync").Arg(2)),
              0xFFFFFFFFFFFFFFFFull);
    EXPECT_EQ(driver.Live().syncs, 0);
    Forget();
    texture->Activate(0);
    EXPECT_EQ(driver.CallCount("glWaitSync"), 0u);
}

TEST_F(TextureUse, FenceOfAnAliasIsWaitedForOnceByWhoeverComesFirst)
{
    for (const bool aliasFirst : {true, false})
    {
        TextureDescriptor fenced;
        fenced.width = fenced.height = 2;
        fenced.syncOnCreate = true;
        const Texture texture(new TextureObject(fenced, nullptr, nullptr, 0));
        const Texture alias = Alias(*texture);
        Forget();
        (aliasFirst ? alias : texture)->Activate(0);
        EXPECT_EQ(driver.CallCount("glWaitSync"), 1u);
        (aliasFirst ? texture : alias)->Activate(0);
        EXPECT_EQ(driver.CallCount("glWaitSync"), 1u);
        EXPECT_EQ(driver.CallCount("glDeleteSync"), 1u);
    }
    EXPECT_EQ(driver.Live().syncs, 0);
}

// ---- contents -----------------------------------------------------------------------------------

TEST_F(TextureUse, UpdateReplacesTheWholeLevelAndLeavesItBound)
{
    const Texture texture = Made(2, 1);
    const unsigned char pixels[] = {1, 2, 3, 4, 5, 6, 7, 8};
    texture->Update(pixels, 0);
    EXPECT_EQ(driver.CallNames(),
              Names({"glBindTexture", "glPixelStorei", "glPixelStorei", "glTexSubImage2D"}));
    EXPECT_EQ(driver.Calls("glPixelStorei"),
              Sequence({Call("glPixelStorei", GL_UNPACK_SKIP_PIXELS, 0),
                        Call("glPixelStorei", GL_UNPACK_SKIP_ROWS, 0)}));
    EXPECT_EQ(driver.LastCall("glTexSubImage2D"),
              Call("glTexSubImage2D", GL_TEXTURE_2D, 0, 0, 0, 2, 1, GL_RGBA, GL_UNSIGNED_BYTE,
                   static_cast<const void*>(pixels)));
    EXPECT_EQ(driver.Texture(1).At(1, 0), (SimPixel{5, 6, 7, 8}));
}

TEST_F(TextureUse, UpdateSetsARowLengthAndPutsTheOldOneBack)
{
    const Texture texture = Made(1, 2);
    glPixelStorei(GL_UNPACK_ROW_LENGTH, 7);
    const unsigned char pixels[] = {1, 2, 3, 4, 0, 0, 0, 0, 5, 6, 7, 8};
    Forget();
    texture->Update(pixels, 2);
    EXPECT_EQ(driver.CallNames(),
              Names({"glBindTexture", "glGetIntegerv", "glPixelStorei", "glPixelStorei",
                     "glPixelStorei", "glTexSubImage2D", "glPixelStorei"}));
    EXPECT_EQ(driver.Calls("glPixelStorei").front(),
              Call("glPixelStorei", GL_UNPACK_ROW_LENGTH, 2));
    EXPECT_EQ(driver.Calls("glPixelStorei").back(), Call("glPixelStorei", GL_UNPACK_ROW_LENGTH, 7));
    EXPECT_EQ(driver.Texture(1).At(0, 1), (SimPixel{5, 6, 7, 8}));
}

TEST_F(TextureUse, UpdateOfARectangleTakesYFromItsThirdField)
{
    const Texture texture = Made(8, 8);
    const unsigned char pixels[8 * 8 * 4] = {};
    texture->Update(Rect(1, 2, 3, 6), pixels, 8);
    EXPECT_EQ(driver.LastCall("glTexSubImage2D"),
              Call("glTexSubImage2D", GL_TEXTURE_2D, 0, 1, 3, 2, 4, GL_RGBA, GL_UNSIGNED_BYTE,
                   static_cast<const void*>(pixels)));
    const std::vector<SimCall> stores = driver.Calls("glPixelStorei");
    ASSERT_EQ(stores.size(), 6u);
    EXPECT_EQ(stores[0], Call("glPixelStorei", GL_UNPACK_ROW_LENGTH, 8));
    EXPECT_EQ(stores[1], Call("glPixelStorei", GL_UNPACK_SKIP_PIXELS, 1));
    EXPECT_EQ(stores[2], Call("glPixelStorei", GL_UNPACK_SKIP_ROWS, 2));
    GLint value = -1;
    for (const GLenum name : {GL_UNPACK_ROW_LENGTH, GL_UNPACK_SKIP_PIXELS, GL_UNPACK_SKIP_ROWS})
    {
        glGetIntegerv(name, &value);
        EXPECT_EQ(value, 0);
    }
}

TEST_F(TextureUse, SetDataSpecifiesAnewAndRestoresTheBinding)
{
    const Texture other = Made(1, 1);
    const Texture texture = Made(2, 1);
    glBindTexture(GL_TEXTURE_2D, other->internals().glID);
    const unsigned char pixels[] = {1, 2, 3, 4, 5, 6, 7, 8};
    Forget();
    texture->SetData(pixels, 0);
    EXPECT_EQ(driver.CallNames(),
              Names({"glGetIntegerv", "glBindTexture", "glTexImage2D", "glBindTexture"}));
    EXPECT_EQ(driver.LastCall("glTexImage2D"),
              Call("glTexImage2D", GL_TEXTURE_2D, 0, GL_RGBA8, 2, 1, 0, GL_RGBA, GL_UNSIGNED_BYTE,
                   static_cast<const void*>(pixels)));
    GLint bound = 0;
    glGetIntegerv(GL_TEXTURE_BINDING_2D, &bound);
    EXPECT_EQ(static_cast<GLuint>(bound), other->internals().glID);
}

TEST_F(TextureUse, SetDataWithARowLengthPutsTheOldOneBack)
{
    const Texture texture = Made(1, 2);
    const unsigned char pixels[] = {1, 2, 3, 4, 0, 0, 0, 0, 5, 6, 7, 8};
    texture->SetData(pixels, 2);
    EXPECT_EQ(driver.Calls("glPixelStorei"),
              Sequence({Call("glPixelStorei", GL_UNPACK_ROW_LENGTH, 2),
                        Call("glPixelStorei", GL_UNPACK_ROW_LENGTH, 0)}));
    EXPECT_EQ(driver.Texture(1).At(0, 1), (SimPixel{5, 6, 7, 8}));
}

TEST_F(TextureUse, SetDataOfAVolumeHasItsDepth)
{
    const Texture texture = Made(2, 2, 3, 5);
    texture->SetData(nullptr, 0);
    EXPECT_EQ(driver.LastCall("glTexImage3D"), Call("glTexImage3D", GL_TEXTURE_3D, 0, GL_RGBA8, 2,
                                                    2, 5, 0, GL_RGBA, GL_UNSIGNED_BYTE, nullptr));
}

TEST_F(TextureUse, SetDataOf1DTextureHasOneRow)
{
    driver.AllowMisuse();
    const Texture texture = Made(9, 4, 0);
    texture->SetData(nullptr, 0);
    EXPECT_EQ(driver.Calls("glGetIntegerv").front().Arg(0), 0x8068);
    EXPECT_EQ(driver.LastCall("glTexImage2D"), Call("glTexImage2D", 0x0DE0, 0, GL_RGBA8, 9, 1, 0,
                                                    GL_RGBA, GL_UNSIGNED_BYTE, nullptr));
}

TEST_F(TextureUse, SetDataLeavesOtherTargetsUnchanged)
{
    struct Row
    {
        int target;
        GLenum binding;
    };
    for (const Row row : {Row{4, GL_TEXTURE_BINDING_CUBE_MAP}, Row{2, GL_TEXTURE_BINDING_2D_ARRAY},
                          Row{5, GL_TEXTURE_BINDING_CUBE_MAP}})
    {
        const Texture texture = Made(2, 2, row.target, 2);
        EXPECT_NO_THROW(texture->SetData(nullptr, 0));
        EXPECT_EQ(driver.CallNames(), Names({"glGetIntegerv", "glBindTexture", "glBindTexture"}));
        EXPECT_EQ(driver.LastCall("glGetIntegerv").Arg(0), row.binding);
    }
}

TEST_F(TextureUse, SetDataOfATextureOfNoSizeThrows)
{
    const Texture texture = Made(0, 0);
    EXPECT_THROW(texture->SetData(nullptr, 0), Nib::TextureNotValidException);
    EXPECT_EQ(driver.CallCount(), 0u);
}

TEST_F(TextureUse, CopyFromFramebufferTakesTheStorageLayout)
{
    const Texture texture = Made(1, 1);
    texture->CopyFromFramebuffer();
    EXPECT_EQ(CallTexts(),
              (Texts{"glBindTexture(3553, 1)", "glCopyTexImage2D(3553, 0, 32856, 0, 0, 1, 1, 0)"}));
}

// ---- parameters, tags, descriptors --------------------------------------------------------------

TEST_F(TextureUse, SetParamSetsTheSampler)
{
    const Texture texture = Made(2, 2);
    texture->SetParam(0, 3);
    texture->SetParam(5, 0);
    EXPECT_EQ(CallTexts(), (Texts{"glSamplerParameteri(1, 10242, 10497)",
                                  "glSamplerParameteri(1, 10241, 9728)"}));
    EXPECT_EQ(texture->internals().params.at(0), 3);
    EXPECT_EQ(texture->internals().params.at(5), 0);
}

TEST_F(TextureUse, SetParamOfAnIndexWithoutMeaningAsksForParameterZero)
{
    driver.AllowMisuse();
    const Texture texture = Made(2, 2);
    texture->SetParam(3, 1);
    texture->SetParam(6, 0);
    EXPECT_EQ(CallTexts(),
              (Texts{"glSamplerParameteri(1, 0, 9729)", "glSamplerParameteri(1, 0, 9728)"}));
}

TEST_F(TextureUseWithoutSamplers, SetParamBindsTheFlatTargetWhateverTheTextureIs)
{
    driver.AllowMisuse();
    TextureDescriptor cube;
    cube.width = cube.height = 2;
    cube.target = 4;
    const Texture texture(new TextureObject(cube, nullptr, nullptr, 0));
    driver.ForgetCalls();
    texture->SetParam(1, 0);
    EXPECT_EQ(CallTexts(), (Texts{"glBindTexture(3553, 1)", "glPixelStorei(3317, 1)",
                                  "glTexParameteri(34067, 10243, 33648)"}));
}

TEST_F(TextureUse, TagKeeps126Characters)
{
    const Texture texture = Made(2, 2);
    EXPECT_STREQ(texture->GetTag(), "");
    texture->SetTag("short");
    EXPECT_STREQ(texture->GetTag(), "short");
    texture->SetTag(std::string(200, 'x').c_str());
    EXPECT_EQ(std::string(texture->GetTag()), std::string(126, 'x'));
    EXPECT_EQ(
        driver.LogTexts(ANDROID_LOG_DEBUG),
        (Texts{"virtual void Nib::GLES::TextureObject::SetTag(const char *), tag = short, "
               "strLen = 5, mTexture->internals().tag = ",
               "virtual void Nib::GLES::TextureObject::SetTag(const char *), tag = " +
                   std::string(200, 'x') + ", strLen = 126, mTexture->internals().tag = short"}));
}

TEST_F(TextureUse, ShorterTagLeavesNothingOfALongerOne)
{
    const Texture texture = Made(2, 2);
    texture->SetTag("longer");
    texture->SetTag("ink");
    EXPECT_STREQ(texture->GetTag(), "ink");
}

TEST_F(TextureUse, SetDescriptorOfTheSameTextureDoesNothing)
{
    const Texture texture = Made(2, 2);
    TextureDescriptor other = texture->GetDescriptor();
    other.memoryLayout = static_cast<TextureMemoryLayout>(14);
    other.syncOnCreate = true;
    texture->SetDescriptor(other);
    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_EQ(static_cast<int>(texture->GetDescriptor().memoryLayout), 6);
}

TEST_F(TextureUse, SetDescriptorMakesTheTextureAnewWithItsParameters)
{
    const Texture texture = Made(2, 2);
    texture->SetParam(4, 0);
    Forget();
    TextureDescriptor larger = texture->GetDescriptor();
    larger.width = 4;
    texture->SetDescriptor(larger);
    EXPECT_EQ(texture->GetWidth(), 4);
    EXPECT_EQ(driver.Texture(texture->internals().glID).width, 4);
    EXPECT_EQ(driver.Sampler(texture->internals().sampler).params.at(GL_TEXTURE_MAG_FILTER),
              GL_NEAREST);
    EXPECT_EQ(driver.Live().textures, 1);
    EXPECT_EQ(driver.Live().samplers, 1);
    EXPECT_TRUE(texture->IsSubscribed());
    EXPECT_EQ(driver.CountLogContaining("Object Already subscribed"), 1u);
}

TEST_F(TextureUse, EveryComparedFieldOfADescriptorRemakes)
{
    driver.AllowMisuse("glTexImage2D"); // a format that does not go with the storage
    const Texture source = Made(2, 2);
    const std::vector<std::function<void(TextureDescriptor&)>> changes = {
        [](TextureDescriptor& d) { d.width = 3; },
        [](TextureDescriptor& d) { d.height = 3; },
        [](TextureDescriptor& d) { d.depth = 3; },
        [](TextureDescriptor& d) { d.layout = static_cast<TextureTargetLayout>(5); },
        [](TextureDescriptor& d) { d.target = 4; },
        [&](TextureDescriptor& d) { d.source = source.get(); },
    };
    for (const auto& change : changes)
    {
        const Texture texture = Made(2, 2);
        TextureDescriptor changed = texture->GetDescriptor();
        change(changed);
        texture->SetDescriptor(changed);
        EXPECT_EQ(driver.CallCount("glDeleteTextures"), 1u);
    }
}

// ---- aliases ------------------------------------------------------------------------------------

TEST_F(TextureUse, AliasBorrowsTheNamesAndNeverDeletesThem)
{
    const Texture texture = Made(2, 2);
    Forget();
    {
        const Texture alias = Alias(*texture);
        EXPECT_EQ(driver.CallCount(), 0u);
        EXPECT_EQ(alias->internals().glID, texture->internals().glID);
        EXPECT_EQ(alias->internals().sampler, texture->internals().sampler);
        EXPECT_EQ(alias->internals().target, GLenum{GL_TEXTURE_2D});
        EXPECT_FALSE(alias->IsSubscribed());
        EXPECT_EQ(alias->GetWidth(), 2);
    }
    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_EQ(Infos(), Texts{});
    EXPECT_EQ(driver.Live().textures, 1);
}

TEST_F(TextureUse, SetDescriptorCanMakeAnAlias)
{
    const Texture texture = Made(2, 2);
    const Texture other = Made(5, 5);
    other->SetDescriptor(TextureDescriptor(texture.get()));
    EXPECT_EQ(other->internals().glID, texture->internals().glID);
    EXPECT_EQ(driver.Live().textures, 1);
    EXPECT_TRUE(other->IsSubscribed());
    driver.ForgetCalls();
    other->ReleaseGLObject(); // forgets the borrowed names
    EXPECT_EQ(driver.CallCount("glDeleteTextures"), 0u);
    EXPECT_EQ(other->internals().glID, 0u);
    other->RestoreGLObject();
    EXPECT_EQ(other->internals().glID, texture->internals().glID);
    EXPECT_EQ(driver.Live().textures, 1);
}

// ---- the loss of the context --------------------------------------------------------------------

TEST_F(TextureUse, ReleaseDeletesTheNamesAndKeepsTheDescription)
{
    const Texture texture = Made(2, 2);
    texture->SetTag("kept");
    texture->SetParam(4, 0);
    Forget();
    queue.observer.DispatchRelease();
    EXPECT_EQ(CallTexts(), (Texts{"glDeleteTextures(1)", "glDeleteSamplers(1)"}));
    EXPECT_EQ(Infos(), (Texts{"virtual void Nib::GLES::TextureObject::ReleaseGLObject() - Release "
                              "Was called. Texture - 1"}));
    EXPECT_EQ(texture->internals().glID, 0u);
    EXPECT_EQ(texture->internals().sampler, 0u);
    EXPECT_EQ(texture->internals().target, 0u);
    EXPECT_EQ(texture->GetWidth(), 2);
    EXPECT_STREQ(texture->GetTag(), "kept");
    EXPECT_EQ(texture->internals().params.at(4), 0);
}

TEST_F(TextureUse, RestoreMakesAnEmptyTextureThatCountsOnceMore)
{
    const Texture texture = Made(2, 2);
    texture->SetTag("lost");
    texture->SetParam(4, 0);
    queue.observer.DispatchRelease();
    Forget();
    queue.observer.DispatchRestore();
    EXPECT_EQ(Infos(), (Texts{"CREATE. Texture Size = 0.02KB Texture Counter = 2 Total Size = "
                              "0.00MB, glID = 2",
                              "virtual void Nib::GLES::TextureObject::RestoreGLObject() - Restore "
                              "Was called. Texture After - 2 (err: 0)"}));
    EXPECT_STREQ(texture->GetTag(), "");
    EXPECT_EQ(driver.Sampler(texture->internals().sampler).params.at(GL_TEXTURE_MAG_FILTER),
              GL_NEAREST);
    EXPECT_EQ(driver.LastCall("glTexImage2D").args.back(), SimValue(nullptr));
}

TEST_F(TextureUse, RestoreWithoutReleaseOnlyWarns)
{
    const Texture texture = Made(2, 2);
    texture->RestoreGLObject();
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_WARN),
              (Texts{"virtual void Nib::GLES::TextureObject::RestoreGLObject() - Restore Was "
                     "called twice or more."}));
    EXPECT_EQ(driver.CallCount(), 0u);
}

TEST_F(TextureUse, ReleaseDeletesAPendingFence)
{
    TextureDescriptor fenced;
    fenced.width = fenced.height = 2;
    fenced.syncOnCreate = true;
    const Texture texture(new TextureObject(fenced, nullptr, nullptr, 0));
    queue.observer.DispatchRelease();
    EXPECT_EQ(driver.Live().syncs, 0);
}

TEST_F(TextureUse, DestructionAfterReleaseTouchesNothing)
{
    Texture texture = Made(2, 2);
    queue.observer.DispatchRelease();
    Forget();
    texture.reset();
    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_EQ(driver.CountLogContaining("FREE."), 0u);
}

TEST_F(TextureUse, SecondReleaseTouchesNothing)
{
    const Texture texture = Made(2, 2);
    texture->ReleaseGLObject();
    Forget();
    texture->ReleaseGLObject();
    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_EQ(Infos(), (Texts{"virtual void Nib::GLES::TextureObject::ReleaseGLObject() - Release "
                              "Was called. Texture - 0"}));
}
