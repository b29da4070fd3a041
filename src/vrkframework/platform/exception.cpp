// The framework exception family.
#include "vrkframework/platform/exception.h"

namespace kora {

Exception::Exception(const std::string& message, const std::string& sourceFile,
                     const std::string& function, unsigned int line)
    : m_message(message), m_sourceFile(sourceFile), m_function(function), m_line(line) {}

const char* Exception::what() const noexcept { return m_message.c_str(); }
const std::string& Exception::GetMessage() const { return m_message; }
const std::string& Exception::GetSourceFile() const { return m_sourceFile; }
const std::string& Exception::GetFunction() const { return m_function; }
unsigned int Exception::GetLine() const { return m_line; }

ParameterException::ParameterException(const std::string& parameterName, Type type,
                                       const std::string& received, const std::string& expected,
                                       const std::string& message, const std::string& sourceFile,
                                       const std::string& function, unsigned int line)
    : Exception(message, sourceFile, function, line),
      m_parameterName(parameterName),
      m_type(type),
      m_received(received),
      m_expected(expected) {}

const std::string& ParameterException::GetParameterName() const { return m_parameterName; }
ParameterException::Type ParameterException::GetType() const { return m_type; }
const std::string& ParameterException::GetReceived() const { return m_received; }
const std::string& ParameterException::GetExpected() const { return m_expected; }

OutOfBoundsException::OutOfBoundsException(const std::vector<int>& values,
                                           const std::string& message,
                                           const std::string& sourceFile,
                                           const std::string& function, unsigned int line)
    : Exception(message, sourceFile, function, line), m_values(values) {}

const std::vector<int>& OutOfBoundsException::GetValues() const { return m_values; }

}  // namespace kora
