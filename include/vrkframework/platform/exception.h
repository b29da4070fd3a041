// The framework's exception family: every failure carries its message, source path,
// function signature text and source line.
#ifndef VRKFRAMEWORK_PLATFORM_EXCEPTION_H
#define VRKFRAMEWORK_PLATFORM_EXCEPTION_H

#include <exception>
#include <string>
#include <vector>

#include "vrkframework/platform/platformapi.h"

/// The framework the library is built against: its exceptions and string formatting.
namespace kora {

/// Base of every framework failure. `what()` returns the message.
class KORA_PLATFORM_API Exception : public std::exception {
public:
    /// Records where the failure was raised: `sourceFile` is the implementation file below
    /// the source root without extension (`vrkframework/basic/kubo/raster/tileiterator`),
    /// `function` the full signature text of the throwing function, `line` the line of the
    /// throw (0 for the failures this library adds to the framework's own).
    Exception(const std::string& message, const std::string& sourceFile,
              const std::string& function, unsigned int line);

    /// The message; valid as long as the exception.
    const char* what() const noexcept override;
    /// The message, as given to the constructor.
    const std::string& GetMessage() const;
    /// The source path, as given to the constructor.
    const std::string& GetSourceFile() const;
    /// The function signature text, as given to the constructor.
    const std::string& GetFunction() const;
    /// The source line, as given to the constructor.
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
    /// Takes the arguments of Exception.
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

    /// `received` and `expected` describe the value given and the values accepted, as
    /// text; the last four arguments are those of Exception.
    ParameterException(const std::string& parameterName, Type type, const std::string& received,
                       const std::string& expected, const std::string& message,
                       const std::string& sourceFile, const std::string& function,
                       unsigned int line);

    /// Name of the faulty parameter.
    const std::string& GetParameterName() const;
    /// Kind of fault.
    Type GetType() const;
    /// Text describing the value received.
    const std::string& GetReceived() const;
    /// Text describing the values accepted.
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
    /// `values` are the offending or bounding values; the other arguments are those of
    /// Exception.
    OutOfBoundsException(const std::vector<int>& values, const std::string& message,
                         const std::string& sourceFile, const std::string& function,
                         unsigned int line);

    /// The offending or bounding values, as given to the constructor.
    const std::vector<int>& GetValues() const;

private:
    std::vector<int> m_values;
};

}  // namespace kora

#endif  // VRKFRAMEWORK_PLATFORM_EXCEPTION_H
