#include <korvex/util/ThreadObj.h>

inline namespace korvex {

// With checking off, a key may not have been created. That is remembered, so that a key of other
// code with the same number is not used.
TSP_Implementor::TSP_Implementor(void (*cleanup)(void*)) : _cleanup_fn(cleanup) {
    const int rval = pthread_key_create(&_key, cleanup);
    checkPtRes("pthread_key_create", rval);
    _created = rval == 0;
}

TSP_Implementor::~TSP_Implementor() noexcept(false) {
    if (_created) checkPtRes("pthread_key_delete", pthread_key_delete(_key));
}

void* TSP_Implementor::get() const {
    return _created ? pthread_getspecific(_key) : nullptr;
}

void TSP_Implementor::set(void* v) {
    void* const old = get();
    if (v == old) return;
    if (old != nullptr) _cleanup_fn(old);
    internal_set(v);
}

void* TSP_Implementor::release() {
    void* const old = get();
    internal_set(nullptr);
    return old;
}

void TSP_Implementor::internal_set(void* v) {
    if (_created) checkPtRes("pthread_setspecific", pthread_setspecific(_key, v));
}

}  // namespace korvex
