// The framework's exception family: every failure carries its message, source path,
// function signature text and source line.
#ifndef VRKFRAMEWORK_PLATFORM_EXCEPTION_H
#define VRKFRAMEWORK_PLATFORM_EXCEPTION_H

#include <exception>
#include <string>
#include <vector>

#include "vrkframework/platform/platformapi.h"

namespace kora {

/// Base of every framework failure. `what()` returns the message.
class KORA_PLATFORM_API Exception : public std::exception {
public:
    Exception(const std::string& message, const std::string& sourceFile,
              const std::string& function, unsigned int line);

    const char* what() const noexcept override;
    const std::string& GetMessage() const;
    const std::string& GetSourceFile() const;
    const std::string& GetFunction() const;
    unsigned int GetLine() const;

private:
    std::string m_message;
    std::string m_sourceFile;
    std::string m_function;
    unsigned int m_line;
};

/// Raised when the data handed to an operation cannot be processed.
class KORA_PLATFORM_API DataException : public Exception {
public:
    using Exception::Exception;
};

/// Raised when one named parameter has an unacceptable value; records what was
/// received and what was expected.
class KORA_PLATFORM_API ParameterException : public Exception {
public:
    /// Kind of parameter fault. Only the numeric codes are part of the contract.
    enum Type {
        PARAMETER_INVALID_VALUE = 1,  ///< the value is not one the operation accepts
        PARAMETER_TOO_FEW_ITEMS = 8   ///< a collection holds fewer items than required
    };

    ParameterException(const std::string& parameterName, Type type, const std::string& received,
                       const std::string& expected, const std::string& message,
                       const std::string& sourceFile, const std::string& function,
                       unsigned int line);

    const std::string& GetParameterName() const;
    Type GetType() const;
    const std::string& GetReceived() const;
    const std::string& GetExpected() const;

private:
    std::string m_parameterName;
    Type m_type;
    std::string m_received;
    std::string m_expected;
};

/// Raised when an index or a window lies outside its container; `GetValues()` holds
/// the offending or bounding values.
class KORA_PLATFORM_API OutOfBoundsException : public Exception {
public:
    OutOfBoundsException(const std::vector<int>& values, const std::string& message,
                         const std::string& sourceFile, const std::string& function,
                         unsigned int line);

    const std::vector<int>& GetValues() const;

private:
    std::vector<int> m_values;
};

}  // namespace kora

#endif  // VRKFRAMEWORK_PLATFORM_EXCEPTION_H
