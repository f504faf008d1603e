// What a refusal logs is no part of a fuzzer's output.
#include "moka/base/log/LogSink.h"

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    Moka::SetLogSink([](Moka::LogLine const&) {});
    return 0;
}
