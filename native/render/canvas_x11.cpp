// Window glue: presents the colour buffer into a Java AWT canvas through the
// AWT native interface (JAWT) and Xlib. When the X server offers MIT-SHM the
// canvas keeps two shared-memory images and alternates between them on every
// flip, so the renderer never draws into the image the server is reading;
// otherwise one heap buffer is sent with XPutImage.
//
// Every Xlib call on AWT's display is made while AWT's lock is held (the
// drawing-surface lock takes it), because AWT's own thread uses the same
// connection.
//
// The plain path can be forced with the Java system property
// "pavoqen.noshm=true" (read at every buffer creation) or the environment
// variable PAVOQEN_NOSHM=1.
#include <jni.h>

#include <cstdlib>
#include <cstring>

#include "jni/Exception.h"
#include "render/window_canvas.h"
#include "util/memorymanager/aligned.h"

#include <jawt.h>
#include <jawt_md.h>
#include <sys/ipc.h>
#include <sys/shm.h>
#include <X11/Xlib.h>
#include <X11/Xutil.h>
#include <X11/extensions/XShm.h>

namespace {

// --- X error trap -----------------------------------------------------------
// AWT installs an X error handler that swallows errors, so a refused
// XShmAttach would go unseen. While a trap is alive, errors of one extension's
// requests are recorded; others go on to the handler that was installed before.

struct error_trap_state {
    int opcode = 0;
    bool failed = false;
    XErrorHandler previous = nullptr;
};
error_trap_state g_trap;

int trap_handler(Display* d, XErrorEvent* e) {
    if (e->request_code == g_trap.opcode) {
        g_trap.failed = true;
        return 0;
    }
    return g_trap.previous ? g_trap.previous(d, e) : 0;
}

class error_trap {
public:
    error_trap(Display* d, int opcode) : m_Display(d) {
        XSync(d, False);  // errors of earlier requests belong to the old handler
        g_trap.opcode = opcode;
        g_trap.failed = false;
        g_trap.previous = XSetErrorHandler(trap_handler);
    }
    // Waits for the server to answer everything sent so far.
    bool failed() {
        XSync(m_Display, False);
        return g_trap.failed;
    }
    ~error_trap() {
        XSync(m_Display, False);
        XSetErrorHandler(g_trap.previous);
        g_trap.previous = nullptr;
    }

private:
    Display* m_Display;
};

// --- the drawing surface of an AWT component, locked for the scope ----------

class locked_surface {
public:
    // With `strict`, every failure throws RuntimeException; otherwise ok()
    // tells whether the surface info was obtained.
    locked_surface(JNIEnv* env, jobject component, jint version, bool takeAwtLock, bool strict) : m_Env(env) {
        const char* failure = acquire(component, version, takeAwtLock);
        if (failure && strict) {
            release();  // a throwing constructor runs no destructor
            throw new RuntimeException(failure);
        }
    }

    ~locked_surface() { release(); }

    bool ok() const { return m_X11 != nullptr; }
    Display* display() const { return m_X11->display; }
    Drawable drawable() const { return m_X11->drawable; }
    int depth() const { return m_X11->depth; }

private:
    // Null when the X11 surface info was obtained, else what went wrong.
    const char* acquire(jobject component, jint version, bool takeAwtLock) {
        std::memset(&m_Awt, 0, sizeof m_Awt);
        m_Awt.version = version;
        if (!m_Env || !component || m_Env->IsSameObject(component, nullptr)) return "canvas component is gone";
        if (JAWT_GetAWT(m_Env, &m_Awt) == JNI_FALSE) return "AWT native interface unavailable";
        if (takeAwtLock) {
            m_Awt.Lock(m_Env);
            m_AwtLocked = true;
        }
        m_Surface = m_Awt.GetDrawingSurface(m_Env, component);
        if (!m_Surface) return "canvas has no drawing surface";
        if (m_Surface->Lock(m_Surface) & JAWT_LOCK_ERROR)
            return "cannot lock the canvas drawing surface (no parent window?)";
        m_SurfaceLocked = true;
        m_Info = m_Surface->GetDrawingSurfaceInfo(m_Surface);
        if (!m_Info || !m_Info->platformInfo) return "canvas drawing surface has no X11 info";
        m_X11 = static_cast<JAWT_X11DrawingSurfaceInfo*>(m_Info->platformInfo);
        return nullptr;
    }

    void release() {
        if (m_Info) m_Surface->FreeDrawingSurfaceInfo(m_Info);
        if (m_SurfaceLocked) m_Surface->Unlock(m_Surface);
        if (m_Surface) m_Awt.FreeDrawingSurface(m_Surface);
        if (m_AwtLocked) m_Awt.Unlock(m_Env);
        m_Info = nullptr;
        m_X11 = nullptr;
        m_SurfaceLocked = false;
        m_Surface = nullptr;
        m_AwtLocked = false;
    }

    JNIEnv* m_Env;
    JAWT m_Awt;
    bool m_AwtLocked = false;
    JAWT_DrawingSurface* m_Surface = nullptr;
    bool m_SurfaceLocked = false;
    JAWT_DrawingSurfaceInfo* m_Info = nullptr;
    JAWT_X11DrawingSurfaceInfo* m_X11 = nullptr;
};

// AWT's lock alone, for Xlib calls that need no drawable.
class awt_lock {
public:
    explicit awt_lock(JNIEnv* env) : m_Env(env) {
        std::memset(&m_Awt, 0, sizeof m_Awt);
        m_Awt.version = JAWT_VERSION_1_4;
        m_Locked = env && JAWT_GetAWT(env, &m_Awt) != JNI_FALSE;
        if (m_Locked) m_Awt.Lock(env);
    }
    ~awt_lock() {
        if (m_Locked) m_Awt.Unlock(m_Env);
    }

private:
    JNIEnv* m_Env;
    JAWT m_Awt;
    bool m_Locked;
};

bool env_flag_set(const char* name) {
    const char* v = std::getenv(name);
    return v && *v && std::strcmp(v, "0") != 0;
}

// System.getProperty("pavoqen.noshm") equals "true" (any case).
bool property_forces_plain(JNIEnv* env) {
    jclass system = env->FindClass("java/lang/System");
    if (!system) {
        env->ExceptionClear();
        return false;
    }
    bool result = false;
    jmethodID get = env->GetStaticMethodID(system, "getProperty", "(Ljava/lang/String;)Ljava/lang/String;");
    jstring key = get ? env->NewStringUTF("pavoqen.noshm") : nullptr;
    jstring value = key ? static_cast<jstring>(env->CallStaticObjectMethod(system, get, key)) : nullptr;
    if (env->ExceptionCheck()) env->ExceptionClear();
    if (value) {
        const char* s = env->GetStringUTFChars(value, nullptr);
        if (s) {
            result = strcasecmp(s, "true") == 0;
            env->ReleaseStringUTFChars(value, s);
        }
        env->DeleteLocalRef(value);
    }
    if (key) env->DeleteLocalRef(key);
    env->DeleteLocalRef(system);
    return result;
}

// Shared memory only reaches a server on this machine: ":N", "unix:N" or a
// socket path.
bool display_is_local(Display* d) {
    const char* name = DisplayString(d);
    if (!name) return false;
    return name[0] == ':' || name[0] == '/' || std::strncmp(name, "unix:", 5) == 0;
}

// --- the canvas ---------------------------------------------------------------

class x11_canvas : public window_canvas {
public:
    x11_canvas(JavaVM* vm, jobject awtCanvas, int width, int height) : m_VM(vm) {
        reset_images();
        JNIEnv* env = get_env();
        if (!env) throw new RuntimeException("no JNI environment on this thread");
        if (!awtCanvas) throw new NullPointerException();
        check_size(width, height);
        m_JavaCanvas = env->NewWeakGlobalRef(awtCanvas);
        try {
            create_backbuffer(width, height);
        } catch (...) {
            env->DeleteWeakGlobalRef(m_JavaCanvas);
            m_JavaCanvas = nullptr;
            throw;
        }
    }

    ~x11_canvas() override {
        free_backbuffer();
        JNIEnv* env = get_env();
        if (env && m_JavaCanvas) env->DeleteWeakGlobalRef(m_JavaCanvas);
        m_JavaCanvas = nullptr;
    }

    JNIEnv* get_env() const {
        JNIEnv* env = nullptr;
        if (!m_VM || m_VM->GetEnv(reinterpret_cast<void**>(&env), JNI_VERSION_1_1) != JNI_OK) return nullptr;
        return env;
    }

    bool shared_memory() const override { return m_UseShm; }

    void flip(int x, int y, int w, int h) override {
        if (!m_JavaCanvas) throw new IllegalStateException("java_canvas");
        if (!m_Images[0]) return;  // no buffers (a failed resize)
        locked_surface s(get_env(), m_JavaCanvas, JAWT_VERSION_1_3, false, false);
        if (!s.ok()) return;
        // The source rectangle (x, y, w, h) lands at the window's top-left.
        // Parts outside the buffer are cut off, as XPutImage does.
        long long sx = x, sy = y, dx = 0, dy = 0, sw = w, sh = h;
        if (sx < 0) { sw += sx; dx -= sx; sx = 0; }
        if (sy < 0) { sh += sy; dy -= sy; sy = 0; }
        if (sx + sw > m_Width) sw = m_Width - sx;
        if (sy + sh > m_Height) sh = m_Height - sy;
        bool any = sw > 0 && sh > 0 && dx <= 0x7FFF && dy <= 0x7FFF;
        GC gc = DefaultGC(m_Display, 0);
        if (m_UseShm) {
            if (any)
                XShmPutImage(m_Display, s.drawable(), gc, m_Images[m_Current], int(sx), int(sy), int(dx), int(dy),
                             unsigned(sw), unsigned(sh), False);
            XFlush(m_Display);
            m_Current ^= 1;
            move_colourbuffer(reinterpret_cast<unsigned int*>(m_Images[m_Current]->data));
        } else {
            if (any)
                XPutImage(m_Display, s.drawable(), gc, m_Images[0], int(sx), int(sy), int(dx), int(dy), unsigned(sw),
                          unsigned(sh));
            XFlush(m_Display);
        }
    }

    void flip_dirtyrect(int, int, int, int, int, int) override {
        if (!m_JavaCanvas) throw new IllegalStateException("java_canvas");
        locked_surface s(get_env(), m_JavaCanvas, JAWT_VERSION_1_3, false, false);
    }

    void resized(jobject awtCanvas, int width, int height) override {
        if (!awtCanvas) throw new NullPointerException();
        check_size(width, height);
        JNIEnv* env = get_env();
        if (!env) throw new RuntimeException("no JNI environment on this thread");
        free_backbuffer();
        if (m_JavaCanvas) env->DeleteWeakGlobalRef(m_JavaCanvas);
        m_JavaCanvas = env->NewWeakGlobalRef(awtCanvas);
        create_backbuffer(width, height);
    }

private:
    void reset_images() {
        for (int i = 0; i < 2; ++i) {
            m_Images[i] = nullptr;
            m_ShmInfo[i].shmseg = 0;
            m_ShmInfo[i].shmid = -1;
            m_ShmInfo[i].shmaddr = reinterpret_cast<char*>(-1);
            m_ShmInfo[i].readOnly = False;
            m_Attached[i] = false;
        }
        m_UseShm = false;
        m_Current = 0;
    }

    // Builds both buffers; on failure nothing stays allocated and the canvas
    // is empty (zero size, no images).
    void create_backbuffer(int width, int height) {
        check_size(width, height);
        JNIEnv* env = get_env();
        if (!env) throw new RuntimeException("no JNI environment on this thread");
        bool plain = env_flag_set("PAVOQEN_NOSHM") || property_forces_plain(env);
        unsigned int bytes = unsigned(width) * unsigned(height) * 4u;
        m_DepthBuffer = static_cast<float*>(_aligned_malloc(bytes, 64));
        try {
            locked_surface s(env, m_JavaCanvas, JAWT_VERSION_1_4, true, true);
            if (s.depth() != 24) throw new RuntimeException("canvas window is not 24 bits deep");
            m_Display = s.display();
            Visual* visual = DefaultVisualOfScreen(ScreenOfDisplay(m_Display, 0));
            if (!plain && create_shm_images(visual, width, height)) {
                m_UseShm = true;
                m_Current = 0;
                m_ColourBuffer = reinterpret_cast<unsigned int*>(m_Images[0]->data);
            } else {
                create_plain_image(visual, width, height, bytes);
            }
        } catch (...) {
            _aligned_free(m_DepthBuffer);
            m_DepthBuffer = nullptr;
            throw;
        }
        m_Width = width;
        m_Height = height;
    }

    // Two attached shared-memory images, or false with nothing left behind.
    bool create_shm_images(Visual* visual, int width, int height) {
        if (!display_is_local(m_Display) || ImageByteOrder(m_Display) != LSBFirst) return false;
        int opcode, event, error, major, minor;
        Bool pixmaps;
        if (!XQueryExtension(m_Display, "MIT-SHM", &opcode, &event, &error)) return false;
        if (!XShmQueryVersion(m_Display, &major, &minor, &pixmaps)) return false;
        bool ok = true;
        for (int i = 0; i < 2 && ok; ++i) {
            XImage* img = XShmCreateImage(m_Display, visual, 24, ZPixmap, nullptr, &m_ShmInfo[i], unsigned(width),
                                          unsigned(height));
            m_Images[i] = img;
            // The renderer writes rows of `width` 32-bit pixels back to back.
            if (!img || img->bits_per_pixel != 32 || img->bytes_per_line != width * 4) {
                ok = false;
                break;
            }
            size_t size = size_t(img->bytes_per_line) * size_t(height);
            m_ShmInfo[i].shmid = shmget(IPC_PRIVATE, size, IPC_CREAT | 0600);
            if (m_ShmInfo[i].shmid < 0) {
                ok = false;
                break;
            }
            void* addr = shmat(m_ShmInfo[i].shmid, nullptr, 0);
            if (addr == reinterpret_cast<void*>(-1)) {
                ok = false;
                break;
            }
            m_ShmInfo[i].shmaddr = static_cast<char*>(addr);
            m_ShmInfo[i].readOnly = False;
            img->data = static_cast<char*>(addr);
        }
        if (ok) {
            error_trap trap(m_Display, opcode);
            for (int i = 0; i < 2; ++i) {
                XShmAttach(m_Display, &m_ShmInfo[i]);
                m_Attached[i] = true;
            }
            ok = !trap.failed();
            if (!ok) {
                // Detach whatever the server did attach; errors for the one it
                // refused stay in the trap.
                for (int i = 0; i < 2; ++i) XShmDetach(m_Display, &m_ShmInfo[i]);
                trap.failed();
                m_Attached[0] = m_Attached[1] = false;
            }
        }
        // Once the server holds its attachment (or failed to take one) the
        // segments are marked for removal: they vanish with the last detach,
        // even if this process dies.
        for (int i = 0; i < 2; ++i)
            if (m_ShmInfo[i].shmid >= 0) shmctl(m_ShmInfo[i].shmid, IPC_RMID, nullptr);
        if (!ok) free_shm_images();
        return ok;
    }

    // Client-side release of the shared-memory images (any detach has been
    // sent already or is sent here).
    void free_shm_images() {
        for (int i = 0; i < 2; ++i) {
            if (m_Attached[i]) XShmDetach(m_Display, &m_ShmInfo[i]);
            if (m_Images[i]) {
                m_Images[i]->data = nullptr;
                XDestroyImage(m_Images[i]);
            }
            if (m_ShmInfo[i].shmaddr != reinterpret_cast<char*>(-1)) shmdt(m_ShmInfo[i].shmaddr);
        }
        if (m_Attached[0] || m_Attached[1]) XFlush(m_Display);
        reset_images();
    }

    void create_plain_image(Visual* visual, int width, int height, unsigned int bytes) {
        m_ColourBuffer = static_cast<unsigned int*>(_aligned_malloc(bytes, 64));
        XImage* img = XCreateImage(m_Display, visual, 24, ZPixmap, 0, reinterpret_cast<char*>(m_ColourBuffer),
                                   unsigned(width), unsigned(height), 32, width * 4);
        if (!img || img->bits_per_pixel != 32) {
            if (img) {
                img->data = nullptr;
                XDestroyImage(img);
            }
            _aligned_free(m_ColourBuffer);
            m_ColourBuffer = nullptr;
            throw new RuntimeException("cannot create a 32-bit X image for the canvas");
        }
        // Pixels are 0xAARRGGBB words in this machine's order; Xlib converts
        // when the server wants the other byte order.
        img->byte_order = LSBFirst;
        m_Images[0] = img;
        m_UseShm = false;
    }

    void free_backbuffer() {
        unsigned int* other = m_UseShm && m_Images[m_Current ^ 1]
                                  ? reinterpret_cast<unsigned int*>(m_Images[m_Current ^ 1]->data)
                                  : nullptr;
        release_from_toolkit(other);
        if (m_UseShm) {
            awt_lock lock(get_env());
            free_shm_images();
        } else {
            if (m_Images[0]) {
                m_Images[0]->data = nullptr;
                XDestroyImage(m_Images[0]);
            }
            _aligned_free(m_ColourBuffer);
            reset_images();
        }
        m_ColourBuffer = nullptr;
        _aligned_free(m_DepthBuffer);
        m_DepthBuffer = nullptr;
        m_Width = 0;
        m_Height = 0;
    }

    JavaVM* m_VM;
    jobject m_JavaCanvas = nullptr;  // weak global reference to the AWT component
    bool m_UseShm = false;
    int m_Current = 0;
    XShmSegmentInfo m_ShmInfo[2];
    bool m_Attached[2];
    Display* m_Display = nullptr;
    XImage* m_Images[2];
};

}  // namespace

window_canvas* create_window_canvas(JavaVM* vm, jobject awtCanvas, int width, int height) {
    return new x11_canvas(vm, awtCanvas, width, height);
}
