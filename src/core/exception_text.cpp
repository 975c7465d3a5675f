#include "core/exception_text.hpp"

#include <exception>
#include <new>

namespace tarn {

std::string describeCurrentException() {
    try {
        throw;
    } catch (const std::bad_alloc&) {
        return "not enough memory";
    } catch (const std::exception& e) {
        return e.what();
    } catch (...) {
        return "unknown error";
    }
}

std::string unexpectedFailure(const std::string& what) {
    return "The job stopped on an unexpected error: " + what + ".";
}

}  // namespace tarn
