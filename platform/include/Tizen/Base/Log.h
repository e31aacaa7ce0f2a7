/// \file
/// Log and assertion back-ends.
///
/// Two families. The platform family carries a module number; its exception log records the result
/// it is given as the calling thread's last result. The application family carries a tag and never
/// touches the last result. All may be called on any thread; none throws or allocates, and no line
/// is dropped. Formats are printf's.
///
/// The assertion back-ends are called when a condition doesn't hold. They report it; whether they
/// return is the platform's decision, so a caller must be safe when they do.
#pragma once

#include <Tizen/Base/Types.h>

#define TIZEN_PRINTF(text, first) __attribute__((format(printf, text, first)))

/// A failure with result \p r, which becomes the last result.
void SysLogExceptionInternal(int module, result r, const char* function, int line,
                             const char* format, ...) noexcept TIZEN_PRINTF(5, 6);

/// A failed check whose result the caller returns. The host platform makes it the last result too;
/// nothing relies on that.
void SysTryReturnResultInternal(int module, result r, const char* function, int line,
                                const char* format, ...) noexcept TIZEN_PRINTF(5, 6);

/// A diagnostic line without a result.
void SysLogInternal(int module, const char* function, int line, const char* format, ...) noexcept
    TIZEN_PRINTF(4, 5);

/// A condition of the platform family that doesn't hold.
void SysAssertfInternal(const char* condition, const char* function, int line,
                        const char* message) noexcept;

/// A failure reported under a tag.
void AppLogExceptionTagInternal(const char* tag, const char* function, int line, const char* format,
                                ...) noexcept TIZEN_PRINTF(4, 5);

/// A failure reported without a tag.
void AppLogExceptionInternal(const char* function, int line, const char* format, ...) noexcept
    TIZEN_PRINTF(3, 4);

/// An informational line under a tag.
void AppLogTagInternal(const char* tag, const char* function, int line, const char* format,
                       ...) noexcept TIZEN_PRINTF(4, 5);

/// A condition of the application family that doesn't hold.
void AppassertfInternal(const char* condition, const char* function, int line,
                        const char* message) noexcept;
