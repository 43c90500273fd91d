// Settings files are text a user may edit by hand: any bytes must load without a crash, and
// whatever loads must survive a write and a reload.
#include "platform/SettingsStore.h"

#include <unistd.h>

#include <cstdint>
#include <cstdio>
#include <string>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static const std::string file = [] {
        char pattern[] = "/tmp/ac-fuzz-settings-XXXXXX";
        return std::string(::mkdtemp(pattern)) + "/settings.ini";
    }();
    std::FILE* out = std::fopen(file.c_str(), "wb");
    if (out == nullptr) return 0;
    std::fwrite(data, 1, size, out);
    std::fclose(out);

    ac::platform::SettingsStore store(file);
    auto before = store.Read("k", "a");
    std::string aside = store.TakeSetAsideNotice();
    if (!aside.empty()) {
        std::remove(aside.c_str());
    }
    if (store.WriteString("k", "b", std::string(reinterpret_cast<const char*>(data),
                                                 size < 64 ? size : 64))) {
        ac::platform::SettingsStore again(file);
        auto after = again.Read("k", "a");
        // A value readable before the write reads the same after it.
        if (before && before->type != ac::platform::SettingType::Other &&
            (!after || after->text != before->text || after->number != before->number)) {
            __builtin_trap();
        }
    }
    ac::platform::ParseSettingValue(std::string_view(reinterpret_cast<const char*>(data), size));
    return 0;
}
