#pragma once
// The asset source behind a Java android.content.res.AssetManager.
//
// On a device this is the package's asset manager as the NDK sees it. On
// Linux there is no package: the Java object names a folder through its
// method `getAssetRoot` ("()Ljava/lang/String;"), and the assets are the
// files under it.

#include <jni.h>

#include <memory>

#include "platform/Assets.h"

namespace Glimmer::Bridge {

// Null when the object is null or names no asset source; nothing is left
// pending in the JVM.
std::unique_ptr<Platform::AssetManager> AssetManagerFromJava(JNIEnv* env, jobject assetManager);

}  // namespace Glimmer::Bridge
