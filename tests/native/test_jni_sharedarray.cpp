// Copying Java arrays into pools, through a minimal stand-in for the JNI
// function table (only the calls the copied arrays make).
#include <gtest/gtest.h>

#include <jni.h>

#include <cstring>
#include <memory>
#include <vector>

#include "jni/sharedarray_jni.h"

namespace {

struct fake_array {
    std::vector<int> ints;
    std::vector<short> shorts;
    int releases = 0;
    int lastMode = -1;
};

fake_array* unwrap(jarray a) { return reinterpret_cast<fake_array*>(a); }

jsize JNICALL fake_length(JNIEnv*, jarray a) {
    fake_array* f = unwrap(a);
    return jsize(f->ints.empty() ? f->shorts.size() : f->ints.size());
}
jint* JNICALL fake_get_ints(JNIEnv*, jintArray a, jboolean* copy) {
    if (copy) *copy = JNI_TRUE;
    fake_array* f = unwrap(a);
    jint* out = new jint[f->ints.size() + 1];
    std::memcpy(out, f->ints.data(), f->ints.size() * sizeof(jint));
    return out;
}
void JNICALL fake_release_ints(JNIEnv*, jintArray a, jint* e, jint mode) {
    unwrap(a)->releases++;
    unwrap(a)->lastMode = mode;
    delete[] e;
}
jshort* JNICALL fake_get_shorts(JNIEnv*, jshortArray a, jboolean* copy) {
    if (copy) *copy = JNI_TRUE;
    fake_array* f = unwrap(a);
    jshort* out = new jshort[f->shorts.size() + 1];
    std::memcpy(out, f->shorts.data(), f->shorts.size() * sizeof(jshort));
    return out;
}
void JNICALL fake_release_shorts(JNIEnv*, jshortArray a, jshort* e, jint mode) {
    unwrap(a)->releases++;
    unwrap(a)->lastMode = mode;
    delete[] e;
}

struct fake_env {
    JNINativeInterface_ table;
    JNIEnv env;
    fake_env() {
        std::memset(&table, 0, sizeof table);
        table.GetArrayLength = fake_length;
        table.GetIntArrayElements = fake_get_ints;
        table.ReleaseIntArrayElements = fake_release_ints;
        table.GetShortArrayElements = fake_get_shorts;
        table.ReleaseShortArrayElements = fake_release_shorts;
        env.functions = &table;
    }
};

TEST(ToSharedarray, CopiesConvertsAndRefusesAMissingPool) {
    fake_env fe;
    memorymanager pool(4096);
    fake_array ints;
    ints.ints = {1, -1, 0x7FFFFFFF, int(0x80000000u), 42};
    fake_array shorts;
    shorts.shorts = {0, -1, -32768, 32767, 7};
    {
        copied_jintArrayRO a(&fe.env, reinterpret_cast<jintArray>(&ints));
        sharedarray<unsigned int> su = toSharedarray<unsigned int>(a, &pool);
        ASSERT_EQ(su.count(), 5);
        for (int i = 0; i < 5; ++i) EXPECT_EQ(su[i], (unsigned int)ints.ints[i]);
        copiedjniarray<short, jshortArray, true> s(&fe.env, reinterpret_cast<jshortArray>(&shorts));
        sharedarray<unsigned short> us = toSharedarray<unsigned short>(s, &pool);
        const unsigned short want[5] = {0, 0xFFFF, 0x8000, 0x7FFF, 7};
        for (int i = 0; i < 5; ++i) EXPECT_EQ(us[i], want[i]);
        // Without a pool only a null array is acceptable.
        try {
            toSharedarray<int>(a, nullptr);
            ADD_FAILURE() << "no exception";
        } catch (Exception* e) {
            EXPECT_TRUE(dynamic_cast<NullPointerException*>(e));
            delete e;
        }
    }
    EXPECT_EQ(ints.releases, 1);  // read-only copies released without copying back
    EXPECT_EQ(ints.lastMode, JNI_ABORT);
    EXPECT_EQ(pool.block_count(), 0);
    copied_jintArrayRO none(&fe.env, nullptr);
    EXPECT_TRUE(toSharedarray<int>(none, &pool).isnull());
    EXPECT_TRUE(toSharedarray<int>(none, nullptr).isnull());
    EXPECT_EQ(pool.block_count(), 0);
}

}  // namespace
