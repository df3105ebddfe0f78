// The one known leak: a value that RecordFileManager::put replaces is never freed, because callers
// hold on to values longer than the store does. Every value is allocated here.
extern "C" const char* __lsan_default_suppressions();
extern "C" const char* __lsan_default_suppressions() {
    return "leak:newValueBlock\n";
}
