// libisofs: the tree's files as nodes of an image, Joliet and Rock Ridge on.
#include "burn/IsoSession.h"

#include <cstdint>
#include <libisofs/libisofs.h>
// libisofs only names struct burn_source; its fields and the calls on it are libburn's, which
// declares the same struct inside namespace burn.
#include <libburn/libburn.h>

#include <cctype>
#include <cstdlib>
#include <filesystem>
#include <mutex>

namespace ac::burn {
namespace {

void EnsureLibisofs() {
    static std::once_flag once;
    std::call_once(once, [] {
        iso_init();
        iso_set_msgs_severities(const_cast<char*>("NEVER"), const_cast<char*>("NEVER"),
                                const_cast<char*>("libisofs: "));
    });
}

std::string IsoError(int code) {
    const char* text = iso_error_to_msg(code);
    return text ? text : "libisofs error " + std::to_string(code);
}

// The volume identifier takes d-characters only and 32 of them.
std::string VolumeId(const std::string& label) {
    std::string id;
    for (char c : label) {
        const unsigned char u = static_cast<unsigned char>(c);
        if (std::isalnum(u))
            id += static_cast<char>(std::toupper(u));
        else if (c == ' ' || c == '_' || c == '-')
            id += '_';
        if (id.size() == 32)
            break;
    }
    return id.empty() ? "AUDIO_CD" : id;
}

}  // namespace

std::unique_ptr<IsoSession> IsoSession::Make(const DiscTree& tree, std::string& reason,
                                             bool sizeOnly) {
    EnsureLibisofs();
    std::unique_ptr<IsoSession> session(new IsoSession);
    IsoImage* image = nullptr;
    int result = iso_image_new(VolumeId(tree.VolumeLabel()).c_str(), &image);
    if (result < 0) {
        reason = IsoError(result);
        return nullptr;
    }
    session->m_image = image;
    // Joliet carries the names as the user gave them; ISO 9660's own are made from them.
    iso_image_set_volume_id(image, VolumeId(tree.VolumeLabel()).c_str());

    for (const auto& [discPath, item] : tree.Files()) {
        IsoDir* parent = iso_image_get_root(image);
        std::filesystem::path inside(discPath);
        for (const auto& level : inside.parent_path()) {
            IsoNode* found = nullptr;
            if (iso_dir_get_node(parent, level.c_str(), &found) == 1 &&
                iso_node_get_type(found) == LIBISO_DIR) {
                parent = reinterpret_cast<IsoDir*>(found);
                continue;
            }
            IsoDir* made = nullptr;
            if ((result = iso_tree_add_new_dir(parent, level.c_str(), &made)) < 0) {
                reason = level.string() + ": " + IsoError(result);
                return nullptr;
            }
            parent = made;
        }
        // libisofs needs a path it can open from anywhere.
        const std::string source = std::filesystem::absolute(item->path).string();
        IsoNode* node = nullptr;
        result =
            iso_tree_add_new_node(image, parent, inside.filename().c_str(), source.c_str(), &node);
        if (result < 0) {
            reason = item->path + ": " + IsoError(result);
            return nullptr;
        }
    }

    IsoWriteOpts* options = nullptr;
    if ((result = iso_write_opts_new(&options, 2)) < 0) {
        reason = IsoError(result);
        return nullptr;
    }
    session->m_options = options;
    iso_write_opts_set_rockridge(options, 1);
    iso_write_opts_set_joliet(options, 1);
    // Joliet's 64 characters cut a long song name; 103 is what readers take in practice.
    iso_write_opts_set_joliet_longer_paths(options, 1);
    iso_write_opts_set_joliet_long_names(options, 1);
    iso_write_opts_set_iso_level(options, 2);
    // A size alone needs no writer thread producing the image meanwhile.
    if (sizeOnly)
        iso_write_opts_set_will_cancel(options, 1);
    ::burn_source* source = nullptr;
    if ((result = iso_image_create_burn_source(image, options, &source)) < 0) {
        reason = IsoError(result);
        return nullptr;
    }
    session->m_source = source;
    auto* burnSource = reinterpret_cast<::burn::burn_source*>(source);
    session->m_bytes = burnSource->get_size(burnSource);
    return session;
}

IsoSession::~IsoSession() {
    if (m_source) {
        auto* source = static_cast<::burn::burn_source*>(m_source);
        // Ends libisofs's writer thread, which may still wait on a full ring buffer.
        if (source->version > 0 && source->cancel)
            source->cancel(source);
        ::burn::burn_source_free(source);
    }
    if (m_options)
        iso_write_opts_free(static_cast<IsoWriteOpts*>(m_options));
    if (m_image)
        iso_image_unref(static_cast<IsoImage*>(m_image));
}

std::int64_t CountISOLength(const DiscTree& tree) {
    std::string reason;
    std::unique_ptr<IsoSession> session = IsoSession::Make(tree, reason, true);
    return session ? session->Bytes() : -1;
}

}  // namespace ac::burn
