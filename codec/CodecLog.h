#pragma once
// Logging of the codec facade: tag "IV-COMMON", and each line names the
// source file and line twice, then the function: "file: func(line) >
// [F:file<TAB>L:line] func : message".

#include "platform/core/dlog.h"

#define IV_LOG_TAG "IV-COMMON"
#define IV_FILE_NAME (__builtin_strrchr(__FILE__, '/') ? __builtin_strrchr(__FILE__, '/') + 1 : __FILE__)

#define IV_LOG_AT(prio, fmt, ...)                                                                       \
  dlog_print(prio, IV_LOG_TAG, "%s: %s(%d) > [F:%s\tL:%d] %s : " fmt, IV_FILE_NAME, __func__, __LINE__, \
             IV_FILE_NAME, __LINE__, __func__, ##__VA_ARGS__)

#define IVLOG_D(fmt, ...) IV_LOG_AT(DLOG_DEBUG, fmt, ##__VA_ARGS__)
#define IVLOG_E(fmt, ...) IV_LOG_AT(DLOG_ERROR, fmt, ##__VA_ARGS__)
