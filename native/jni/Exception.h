// The native exception family. Every failure inside the library is thrown as
// a heap pointer to one of these classes; only the entry wrapper catches them
// and turns them into the matching Java exception (see entry.h).
#pragma once

struct JNIEnv_;
typedef JNIEnv_ JNIEnv;

class Exception {
public:
    Exception();
    explicit Exception(const char* text);
    virtual ~Exception();
    virtual void throwJavaException(JNIEnv* env);
    const char* what() const { return m_Message; }

protected:
    char* m_Message;

private:
    Exception(const Exception&) = delete;
    Exception& operator=(const Exception&) = delete;
};

#define PAVOQEN_EXCEPTION_CLASS(Name)                                   \
    class Name : public Exception {                                     \
    public:                                                             \
        Name() : Exception() {}                                         \
        explicit Name(const char* text) : Exception(text) {}            \
        ~Name() override;                                               \
        void throwJavaException(JNIEnv* env) override;                  \
    };

PAVOQEN_EXCEPTION_CLASS(RuntimeException)
PAVOQEN_EXCEPTION_CLASS(ClassCastException)
PAVOQEN_EXCEPTION_CLASS(NullPointerException)
PAVOQEN_EXCEPTION_CLASS(OutOfMemory)
PAVOQEN_EXCEPTION_CLASS(IllegalArgumentException)
PAVOQEN_EXCEPTION_CLASS(IllegalStateException)
PAVOQEN_EXCEPTION_CLASS(NumberFormatException)
PAVOQEN_EXCEPTION_CLASS(NativeError)
#undef PAVOQEN_EXCEPTION_CLASS

class ArrayIndexOutOfBoundsException : public Exception {
public:
    ArrayIndexOutOfBoundsException(int index, int length)
        : Exception(), index(index), length(length) {}
    ~ArrayIndexOutOfBoundsException() override;
    void throwJavaException(JNIEnv* env) override;
    int index;
    int length;
};

// Throws ArrayIndexOutOfBoundsException(index, length) unless 0 <= index < length.
inline void check_index(long long index, long long length) {
    if (index < 0 || index >= length)
        throw new ArrayIndexOutOfBoundsException(int(index), int(length));
}

// Throws ArrayIndexOutOfBoundsException unless an array of `length` elements
// holds `needed` elements starting at `offset`.
inline void check_range(long long offset, long long needed, long long length) {
    if (needed <= 0) return;
    if (offset < 0) throw new ArrayIndexOutOfBoundsException(int(offset), int(length));
    if (offset + needed > length)
        throw new ArrayIndexOutOfBoundsException(int(offset + needed - 1), int(length));
}
