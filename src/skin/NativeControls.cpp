#include "skin/NativeControls.h"

#include <wx/choice.h>
#include <wx/combobox.h>
#include <wx/spinbutt.h>
#include <wx/textctrl.h>

#include <gtk/gtk.h>

namespace ac {

namespace {

constexpr const char* kStyleClass = "ac-skinned";

NativeControlColours g_colours;
GtkCssProvider* g_provider = nullptr;

wxString Css(const wxColour& colour) {
    return colour.GetAsString(wxC2S_HTML_SYNTAX);
}

wxColour Mix(const wxColour& from, const wxColour& to, double share) {
    auto mix = [share](unsigned char a, unsigned char b) {
        return static_cast<unsigned char>(a + (b - a) * share + 0.5);
    };
    return {mix(from.Red(), to.Red()), mix(from.Green(), to.Green()), mix(from.Blue(), to.Blue())};
}

}  // namespace

NativeControlColours NativeColoursFor(const wxColour& field, const wxColour& text) {
    return {field, text, Mix(field, text, 0.3), Mix(field, text, 0.45)};
}

wxString NativeControlCss(const NativeControlColours& c) {
    // The class and everything inside it (the entry of a combo box, its button and arrow):
    // themes paint buttons with gradients, so the image goes too.
    wxString css;
    css << "." << kStyleClass << ", ." << kStyleClass << " * {"
        << " background-color: " << Css(c.background) << "; background-image: none;"
        << " color: " << Css(c.text) << "; border-color: " << Css(c.border) << ";"
        << " box-shadow: none; text-shadow: none; -gtk-icon-shadow: none; }\n"
        << "." << kStyleClass << ":disabled, ." << kStyleClass << " *:disabled {"
        << " color: " << Css(c.disabledText) << "; }\n"
        << "." << kStyleClass << " selection, ." << kStyleClass << " *:selected {"
        << " background-color: " << Css(c.border) << "; color: " << Css(c.text) << "; }\n";
    return css;
}

void FollowSkinColours(wxWindow* control) {
    if (control == nullptr || control->GetHandle() == nullptr) {
        return;
    }
    gtk_style_context_add_class(gtk_widget_get_style_context(control->GetHandle()), kStyleClass);
}

void FollowSkinColoursBelow(wxWindow* parent) {
    for (wxWindow* child : parent->GetChildren()) {
        if (dynamic_cast<wxTextCtrl*>(child) != nullptr ||
            dynamic_cast<wxChoice*>(child) != nullptr ||
            dynamic_cast<wxComboBox*>(child) != nullptr ||
            dynamic_cast<wxSpinButton*>(child) != nullptr) {
            FollowSkinColours(child);
        }
        FollowSkinColoursBelow(child);
    }
}

void SetNativeControlColours(const NativeControlColours& colours) {
    // A style sheet loaded again restyles every widget on the screen, even unchanged.
    if (g_provider != nullptr && colours.background == g_colours.background &&
        colours.text == g_colours.text && colours.border == g_colours.border &&
        colours.disabledText == g_colours.disabledText) {
        return;
    }
    g_colours = colours;
    GdkScreen* screen = gdk_screen_get_default();
    if (screen == nullptr) {
        return;
    }
    if (g_provider == nullptr) {
        g_provider = gtk_css_provider_new();
        // Above the theme and the desktop's settings, at the level wx itself styles widgets.
        gtk_style_context_add_provider_for_screen(screen, GTK_STYLE_PROVIDER(g_provider),
                                                  GTK_STYLE_PROVIDER_PRIORITY_APPLICATION);
    }
    // The buffer may point into the string, so the string must outlive the call.
    const wxString text = NativeControlCss(colours);
    const wxScopedCharBuffer css = text.utf8_str();
    gtk_css_provider_load_from_data(g_provider, css.data(), -1, nullptr);
}

const NativeControlColours& CurrentNativeControlColours() {
    return g_colours;
}

}  // namespace ac
