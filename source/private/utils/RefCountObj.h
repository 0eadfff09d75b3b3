// RefCountObj.h: objects that count who holds them.

#pragma once

#include <boost/smart_ptr/intrusive_ptr.hpp>

#include <cstdint>

namespace orvik_private {

/// Base of objects that are held through boost::intrusive_ptr and end with their last holder. The count is not atomic:
/// an object and all its holders belong to one thread at a time.
class RefCountObj {
  public:
    RefCountObj() = default;
    RefCountObj(RefCountObj const &) = delete;
    RefCountObj &operator=(RefCountObj const &) = delete;

    std::uint32_t RefCount() const noexcept { return m_Count; }

    friend void intrusive_ptr_add_ref(RefCountObj *object) noexcept { ++object->m_Count; }
    friend void intrusive_ptr_release(RefCountObj *object) noexcept {
        if (--object->m_Count == 0) {
            delete object;
        }
    }

  protected:
    virtual ~RefCountObj() = default;

  private:
    std::uint32_t m_Count = 0;
};

} // namespace orvik_private
