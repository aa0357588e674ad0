// Which thread is the main one: the thread that called Library::Initialize.
#pragma once

namespace qorvex {

void SetMainThread();
bool IsMainThread();
// For entries that only the main thread may use: an Error line and false otherwise.
bool CheckMainThread(const char* object, const char* operation);

}  // namespace qorvex
