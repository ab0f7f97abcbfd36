#include "jni/jniarray.h"

static std::atomic<int> g_pin_count{0};
std::atomic<int>& pin_count_ref() { return g_pin_count; }
int pin_count() { return g_pin_count.load(); }
