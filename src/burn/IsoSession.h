#pragma once
// The ISO 9660 image of a data disc's tree, built by libisofs with Joliet and Rock Ridge names,
// as a libburn source. Kept apart from the libburn code: libisofs declares its own global
// struct burn_source beside libburn's namespaced one.
//
// Thread contract: one thread per session; the session's writer thread is libisofs's own.

#include "burn/DiscTree.h"

#include <cstdint>
#include <memory>
#include <string>

namespace ac::burn {

class IsoSession {
public:
    // Null, with a reason, when a file of the tree cannot be added. sizeOnly: the image is
    // measured, never produced.
    static std::unique_ptr<IsoSession> Make(const DiscTree& tree, std::string& reason,
                                            bool sizeOnly = false);
    ~IsoSession();
    IsoSession(const IsoSession&) = delete;
    IsoSession& operator=(const IsoSession&) = delete;

    std::int64_t Bytes() const { return m_bytes; }
    // libisofs's struct burn_source; the same layout as libburn's. Owned by the session.
    void* Source() const { return m_source; }

private:
    IsoSession() = default;
    void* m_image = nullptr;
    void* m_options = nullptr;
    void* m_source = nullptr;
    std::int64_t m_bytes = 0;
};

}  // namespace ac::burn
