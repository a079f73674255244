#include <string>

#include "jni/JavaAssets.h"
#include "jni/JniSupport.h"

namespace Glimmer::Bridge {

std::unique_ptr<Platform::AssetManager> AssetManagerFromJava(JNIEnv* env, jobject assetManager) {
    jmethodID root = Jni::FindMethod(env, assetManager, "getAssetRoot", "()Ljava/lang/String;");
    if (root == nullptr) return nullptr;
    Jni::LocalRef<jstring> folder(env, static_cast<jstring>(env->CallObjectMethod(assetManager, root)));
    if (Jni::ClearException(env) || !folder) return nullptr;
    Jni::Utf8Chars chars(env, folder.get());
    if (chars.get() == nullptr) return nullptr;
    return std::make_unique<Platform::AssetManager>(std::string(chars.get()));
}

}  // namespace Glimmer::Bridge
