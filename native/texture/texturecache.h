// Texture cache: 200 slots of 128 x 128 ARGB texels (row stride 256 texels),
// least-recently-used eviction, requests for missing textures through the
// toolkit, scroll offsets per frame.
#pragma once

class texturecache;

texturecache* create_texturecache(int idcount);
void destroy_texturecache(texturecache* cache);
void texturecache_service(texturecache* cache, int ms);
