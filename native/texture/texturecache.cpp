// Placeholder until the cache lands: holds nothing.
#include "texture/texturecache.h"

class texturecache {};

texturecache* create_texturecache(int) { return new texturecache(); }
void destroy_texturecache(texturecache* cache) { delete cache; }
void texturecache_service(texturecache*, int) {}
