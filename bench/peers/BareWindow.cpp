// The least that a program does which shows rows in a window: plain gtkmm, labels in a list.

#include <gtkmm.h>

int main(int argc, char** argv) {
  const auto application = Gtk::Application::create("org.nimbo.BareWindow", Gio::Application::Flags::NON_UNIQUE);
  application->signal_activate().connect([&] {
    auto* window = new Gtk::ApplicationWindow;
    window->set_default_size(420, 680);
    window->set_title("Rows");
    auto* rows = Gtk::make_managed<Gtk::ListBox>();
    for (int i = 0; i < 6; ++i) rows->append(*Gtk::make_managed<Gtk::Label>("Delays after works between two stations"));
    window->set_child(*rows);
    application->add_window(*window);
    window->present();
  });
  return application->run(argc, argv);
}
