#include "telephonyd/ModemManagerClient.h"

#include <libmm-glib.h>
#include <sys/eventfd.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <cstring>
#include <cstdint>
#include <filesystem>
#include <mutex>
#include <set>
#include <thread>

#include "platform/Log.h"

namespace corvane::telephonyd {

namespace {

// The plain values of ModemManagerMapping.h are ModemManager's own.
static_assert(static_cast<std::uint32_t>(modem::CellType::Cdma) == MM_CELL_TYPE_CDMA);
static_assert(static_cast<std::uint32_t>(modem::CellType::Gsm) == MM_CELL_TYPE_GSM);
static_assert(static_cast<std::uint32_t>(modem::CellType::Umts) == MM_CELL_TYPE_UMTS);
static_assert(static_cast<std::uint32_t>(modem::CellType::Tdscdma) == MM_CELL_TYPE_TDSCDMA);
static_assert(static_cast<std::uint32_t>(modem::CellType::Lte) == MM_CELL_TYPE_LTE);
static_assert(static_cast<std::uint32_t>(modem::CellType::Nr5g) == MM_CELL_TYPE_5GNR);
static_assert(modem::kAccessGsm == MM_MODEM_ACCESS_TECHNOLOGY_GSM);
static_assert(modem::kAccessGsmCompact == MM_MODEM_ACCESS_TECHNOLOGY_GSM_COMPACT);
static_assert(modem::kAccessUmts == MM_MODEM_ACCESS_TECHNOLOGY_UMTS);
static_assert(modem::kAccessLte == MM_MODEM_ACCESS_TECHNOLOGY_LTE);
static_assert(modem::kAccess5gNr == MM_MODEM_ACCESS_TECHNOLOGY_5GNR);
static_assert(modem::kIpFamilyIpv4 == MM_BEARER_IP_FAMILY_IPV4);
static_assert(modem::kIpFamilyIpv6 == MM_BEARER_IP_FAMILY_IPV6);
static_assert(modem::kIpFamilyIpv4v6 == MM_BEARER_IP_FAMILY_IPV4V6);
static_assert(modem::kIpFamilyNonIp == MM_BEARER_IP_FAMILY_NON_IP);

// A system bus that could not be reached, or that closed, is tried again after this.
constexpr guint kBusRetrySeconds = 2;
// Pending completions run at shutdown, at most this many.
constexpr int kMostShutdownIterations = 1000;

template <typename Handler>
gulong connectSignal(gpointer instance, const char* signal, Handler* handler, gpointer data) {
  return g_signal_connect_data(instance, signal, reinterpret_cast<GCallback>(handler), data, nullptr,
                               static_cast<GConnectFlags>(0));
}

bool cancelled(const GError* error) { return g_error_matches(error, G_IO_ERROR, G_IO_ERROR_CANCELLED); }

std::optional<std::string> text(const gchar* value) {
  if (!value || !*value) return std::nullopt;
  return std::string(value);
}

// The values of an a{sv} dictionary that a cell needs: texts, numbers and truth values.
modem::Fields fieldsOf(GVariant* dictionary) {
  modem::Fields fields;
  GVariantIter iter;
  g_variant_iter_init(&iter, dictionary);
  const gchar* key = nullptr;
  GVariant* value = nullptr;
  while (g_variant_iter_next(&iter, "{&sv}", &key, &value)) {
    switch (g_variant_classify(value)) {
      case G_VARIANT_CLASS_STRING: fields.emplace(key, std::string(g_variant_get_string(value, nullptr))); break;
      case G_VARIANT_CLASS_BYTE: fields.emplace(key, std::uint64_t{g_variant_get_byte(value)}); break;
      case G_VARIANT_CLASS_UINT16: fields.emplace(key, std::uint64_t{g_variant_get_uint16(value)}); break;
      case G_VARIANT_CLASS_UINT32: fields.emplace(key, std::uint64_t{g_variant_get_uint32(value)}); break;
      case G_VARIANT_CLASS_UINT64: fields.emplace(key, std::uint64_t{g_variant_get_uint64(value)}); break;
      case G_VARIANT_CLASS_INT16: fields.emplace(key, std::int64_t{g_variant_get_int16(value)}); break;
      case G_VARIANT_CLASS_INT32: fields.emplace(key, std::int64_t{g_variant_get_int32(value)}); break;
      case G_VARIANT_CLASS_INT64: fields.emplace(key, std::int64_t{g_variant_get_int64(value)}); break;
      case G_VARIANT_CLASS_DOUBLE: fields.emplace(key, g_variant_get_double(value)); break;
      case G_VARIANT_CLASS_BOOLEAN: fields.emplace(key, g_variant_get_boolean(value) != FALSE); break;
      default: break;
    }
    g_variant_unref(value);
  }
  return fields;
}

}  // namespace

struct ModemManagerClient::Impl {
  Impl(RunLoop& runLoop, Settings given) : loop(runLoop), settings(std::move(given)) {}

  RunLoop& loop;
  Settings settings;
  std::vector<std::string> diagPorts;

  // --- Shared by the client's thread and the run loop ---
  mutable std::mutex mutex;
  std::optional<modem::SimState> sim;
  std::optional<std::vector<modem::Fields>> cells;
  std::optional<Contexts> contexts;
  std::set<Part> changes;
  int eventFd = -1;
  std::atomic<unsigned> requests{0};  // bits of the parts asked for again

  // --- The run loop's ---
  RunLoop::Handle watch = 0;
  std::function<void(Part)> changed;

  // --- The client's thread ---
  GMainContext* context = nullptr;
  GMainLoop* mainLoop = nullptr;
  std::thread thread;
  GCancellable* connecting = nullptr;  // the bus and the manager while they are made
  GSource* retry = nullptr;
  GDBusConnection* bus = nullptr;
  gulong busClosed = 0;
  MMManager* manager = nullptr;
  std::vector<gulong> managerHandlers;
  MMObject* object = nullptr;  // the modem chosen
  MMModem* modem = nullptr;
  std::string modemPath;
  GCancellable* modemWork = nullptr;
  std::vector<std::pair<gpointer, gulong>> modemHandlers;
  MMSim* simProxy = nullptr;
  gulong simHandler = 0;
  std::vector<MMBearer*> bearers;
  std::vector<gulong> bearerHandlers;
  std::vector<modem::Profile> profiles;
  bool cellsInFlight = false;
  bool profilesInFlight = false;
  std::string said;  // the situation last logged, so that each is said once
  std::string cellsError;

  void run();
  void say(int level, const std::string& line);
  void connectBus();
  void scheduleBusRetry();
  void forgetBus();
  void evaluate();
  void attach(MMObject* chosen);
  void dropModem(bool publishGone);
  void reloadSim();
  void updateSim();
  void dropSimProxy();
  void reloadBearers();
  void dropBearers();
  void refreshProfiles();
  void updateContexts();
  void readCells();
  void serveRequests();
  void notifyLoop(Part part);
  void takeChanges();

  static void onBus(GObject* source, GAsyncResult* result, gpointer data);
  static void onBusClosed(GDBusConnection* connection, gboolean remotePeerVanished, GError* error, gpointer data);
  static void onManager(GObject* source, GAsyncResult* result, gpointer data);
  static void onManagerChanged(gpointer instance, gpointer argument, gpointer data);
  static void onModemNotify(GObject* source, GParamSpec* property, gpointer data);
  static void onSim(GObject* source, GAsyncResult* result, gpointer data);
  static void onSimNotify(GObject* source, GParamSpec* property, gpointer data);
  static void onBearers(GObject* source, GAsyncResult* result, gpointer data);
  static void onBearerNotify(GObject* source, GParamSpec* property, gpointer data);
  static void onProfiles(GObject* source, GAsyncResult* result, gpointer data);
  static void onCells(GObject* source, GAsyncResult* result, gpointer data);
};

// --- The run loop's side ---

ModemManagerClient::ModemManagerClient(RunLoop& loop, Settings settings)
    : impl_(std::make_unique<Impl>(loop, std::move(settings))) {
  Impl& impl = *impl_;
  if (!impl.settings.diagDevice.empty()) {
    const std::filesystem::path device(impl.settings.diagDevice);
    impl.diagPorts.push_back(device.filename().string());
    std::error_code error;
    const auto target = std::filesystem::canonical(device, error);
    if (!error && target.filename() != device.filename()) impl.diagPorts.push_back(target.filename().string());
  }
  impl.eventFd = ::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK);
  if (impl.eventFd < 0) {
    log::printf(log::kError, "Cannot follow ModemManager: no event descriptor (%s)", std::strerror(errno));
    return;
  }
  impl.watch = loop.watchReadable(impl.eventFd, [&impl] { impl.takeChanges(); });
  impl.context = g_main_context_new();
  impl.mainLoop = g_main_loop_new(impl.context, FALSE);
  impl.thread = std::thread([&impl] { impl.run(); });
}

ModemManagerClient::~ModemManagerClient() {
  Impl& impl = *impl_;
  if (impl.watch) impl.loop.cancel(impl.watch);
  if (impl.thread.joinable()) {
    g_main_context_invoke(
        impl.context,
        [](gpointer data) -> gboolean {
          g_main_loop_quit(static_cast<GMainLoop*>(data));
          return G_SOURCE_REMOVE;
        },
        impl.mainLoop);
    impl.thread.join();
  }
  if (impl.mainLoop) g_main_loop_unref(impl.mainLoop);
  if (impl.context) g_main_context_unref(impl.context);
  if (impl.eventFd >= 0) ::close(impl.eventFd);
}

void ModemManagerClient::setChangeHandler(std::function<void(Part)> changed) { impl_->changed = std::move(changed); }

void ModemManagerClient::refresh(Part part) {
  Impl& impl = *impl_;
  if (!impl.context) return;
  impl.requests.fetch_or(1u << static_cast<unsigned>(part));
  g_main_context_invoke(
      impl.context,
      [](gpointer data) -> gboolean {
        static_cast<Impl*>(data)->serveRequests();
        return G_SOURCE_REMOVE;
      },
      &impl);
}

std::optional<modem::SimState> ModemManagerClient::sim() const {
  std::lock_guard lock(impl_->mutex);
  return impl_->sim;
}

std::optional<std::vector<modem::Fields>> ModemManagerClient::cells() const {
  std::lock_guard lock(impl_->mutex);
  return impl_->cells;
}

std::optional<ModemClient::Contexts> ModemManagerClient::contexts() const {
  std::lock_guard lock(impl_->mutex);
  return impl_->contexts;
}

void ModemManagerClient::Impl::takeChanges() {
  std::uint64_t count = 0;
  while (::read(eventFd, &count, sizeof count) > 0) {
  }
  std::set<Part> taken;
  {
    std::lock_guard lock(mutex);
    taken.swap(changes);
  }
  for (Part part : taken) {
    if (changed) changed(part);
  }
}

// --- The client's thread ---

void ModemManagerClient::Impl::notifyLoop(Part part) {
  {
    std::lock_guard lock(mutex);
    changes.insert(part);
  }
  const std::uint64_t one = 1;
  [[maybe_unused]] const auto written = ::write(eventFd, &one, sizeof one);
}

void ModemManagerClient::Impl::say(int level, const std::string& line) {
  if (line == said) return;
  said = line;
  log::printf(level, "%s", line.c_str());
}

void ModemManagerClient::Impl::run() {
  g_main_context_push_thread_default(context);
  connectBus();
  g_main_loop_run(mainLoop);

  dropModem(false);
  forgetBus();
  if (connecting) {
    g_cancellable_cancel(connecting);
    g_object_unref(connecting);
    connecting = nullptr;
  }
  if (retry) {
    g_source_destroy(retry);
    g_source_unref(retry);
    retry = nullptr;
  }
  // Let the cancelled calls complete, so that they free what they hold.
  for (int i = 0; i < kMostShutdownIterations && g_main_context_iteration(context, FALSE); ++i) {
  }
  g_main_context_pop_thread_default(context);
}

void ModemManagerClient::Impl::connectBus() {
  if (connecting) g_object_unref(connecting);
  connecting = g_cancellable_new();
  g_bus_get(G_BUS_TYPE_SYSTEM, connecting, &Impl::onBus, this);
}

void ModemManagerClient::Impl::scheduleBusRetry() {
  if (retry) return;
  retry = g_timeout_source_new_seconds(kBusRetrySeconds);
  g_source_set_callback(
      retry,
      [](gpointer data) -> gboolean {
        auto* self = static_cast<Impl*>(data);
        g_source_unref(self->retry);
        self->retry = nullptr;
        self->connectBus();
        return G_SOURCE_REMOVE;
      },
      this, nullptr);
  g_source_attach(retry, context);
}

void ModemManagerClient::Impl::forgetBus() {
  for (gulong handler : managerHandlers) g_signal_handler_disconnect(manager, handler);
  managerHandlers.clear();
  if (manager) g_object_unref(manager);
  manager = nullptr;
  if (bus) {
    if (busClosed) g_signal_handler_disconnect(bus, busClosed);
    busClosed = 0;
    g_object_unref(bus);
    bus = nullptr;
  }
}

void ModemManagerClient::Impl::onBus(GObject*, GAsyncResult* result, gpointer data) {
  auto* self = static_cast<Impl*>(data);
  GError* error = nullptr;
  GDBusConnection* connection = g_bus_get_finish(result, &error);
  if (!connection) {
    if (!cancelled(error)) {
      self->say(log::kNotice, log::format("Cannot reach the system D-Bus (%s): no SIM files, cell list or PDP "
                                          "contexts from a modem until it can be reached",
                                          error->message));
      self->scheduleBusRetry();
    }
    g_error_free(error);
    return;
  }
  self->bus = connection;
  // The bus going away must not end the service.
  g_dbus_connection_set_exit_on_close(connection, FALSE);
  self->busClosed = connectSignal(connection, "closed", &Impl::onBusClosed, self);
  mm_manager_new(connection, G_DBUS_OBJECT_MANAGER_CLIENT_FLAGS_DO_NOT_AUTO_START, self->connecting,
                 &Impl::onManager, self);
}

void ModemManagerClient::Impl::onBusClosed(GDBusConnection*, gboolean, GError*, gpointer data) {
  auto* self = static_cast<Impl*>(data);
  self->dropModem(true);
  self->forgetBus();
  self->say(log::kNotice, "The system D-Bus has closed: no SIM files, cell list or PDP contexts from a modem until "
                          "it is back");
  self->scheduleBusRetry();
}

void ModemManagerClient::Impl::onManager(GObject*, GAsyncResult* result, gpointer data) {
  auto* self = static_cast<Impl*>(data);
  GError* error = nullptr;
  MMManager* manager = mm_manager_new_finish(result, &error);
  if (!manager) {
    if (!cancelled(error)) {
      self->say(log::kWarning, log::format("Cannot follow ModemManager (%s): no SIM files, cell list or PDP contexts "
                                           "from a modem",
                                           error->message));
      self->forgetBus();
      self->scheduleBusRetry();
    }
    g_error_free(error);
    return;
  }
  self->manager = manager;
  for (const char* signal : {"notify::name-owner", "object-added", "object-removed"}) {
    self->managerHandlers.push_back(connectSignal(manager, signal, &Impl::onManagerChanged, self));
  }
  self->evaluate();
}

void ModemManagerClient::Impl::onManagerChanged(gpointer, gpointer, gpointer data) {
  static_cast<Impl*>(data)->evaluate();
}

void ModemManagerClient::Impl::evaluate() {
  if (!manager) return;
  gchar* owner = g_dbus_object_manager_client_get_name_owner(G_DBUS_OBJECT_MANAGER_CLIENT(manager));
  if (!owner) {
    dropModem(true);
    say(log::kNotice, "ModemManager is not running: no SIM files, cell list or PDP contexts from a modem until it "
                      "starts");
    return;
  }
  g_free(owner);

  GList* objects = g_dbus_object_manager_get_objects(G_DBUS_OBJECT_MANAGER(manager));
  std::vector<MMObject*> modems;
  std::vector<modem::ModemCandidate> candidates;
  for (GList* entry = objects; entry; entry = entry->next) {
    auto* candidate = static_cast<MMObject*>(entry->data);
    // The object manager also lists SIMs and bearers: only modems are candidates.
    GDBusInterface* modemInterface = g_dbus_object_get_interface(G_DBUS_OBJECT(candidate), MM_DBUS_INTERFACE_MODEM);
    if (!modemInterface) continue;
    g_object_unref(modemInterface);
    MMModem* proxy = mm_object_peek_modem(candidate);
    if (!proxy) continue;
    modem::ModemCandidate described;
    described.path = mm_object_get_path(candidate);
    if (const gchar* identifier = mm_modem_get_equipment_identifier(proxy)) described.equipmentIdentifier = identifier;
    const MMModemPortInfo* ports = nullptr;
    guint count = 0;
    if (mm_modem_peek_ports(proxy, &ports, &count)) {
      for (guint i = 0; i < count; ++i) {
        if (ports[i].name) described.ports.emplace_back(ports[i].name);
      }
    }
    modems.push_back(candidate);
    candidates.push_back(std::move(described));
  }
  std::string why;
  const auto chosen = modem::chooseModem(candidates, settings.modem, diagPorts, why);
  if (!chosen) {
    dropModem(true);
    say(log::kNotice, why + ": no SIM files, cell list or PDP contexts from a modem until one comes");
  } else if (candidates[*chosen].path != modemPath) {
    dropModem(true);
    attach(modems[*chosen]);
  }
  g_list_free_full(objects, g_object_unref);
}

void ModemManagerClient::Impl::attach(MMObject* chosen) {
  object = MM_OBJECT(g_object_ref(chosen));
  modem = mm_object_get_modem(object);
  modemPath = mm_object_get_path(object);
  modemWork = g_cancellable_new();
  const gchar* identifier = mm_modem_get_equipment_identifier(modem);
  say(log::kNotice, log::format("Using the modem %s (%s, %s) for the SIM files, cell list and PDP contexts",
                                modemPath.c_str(), identifier ? identifier : "no equipment identifier",
                                mm_modem_state_get_string(mm_modem_get_state(modem))));
  modemHandlers.emplace_back(modem, connectSignal(modem, "notify", &Impl::onModemNotify, this));
  cellsError.clear();
  reloadSim();
  reloadBearers();
  refreshProfiles();
}

void ModemManagerClient::Impl::dropModem(bool publishGone) {
  if (!object) return;
  if (modemWork) {
    g_cancellable_cancel(modemWork);
    g_object_unref(modemWork);
    modemWork = nullptr;
  }
  for (const auto& [instance, handler] : modemHandlers) g_signal_handler_disconnect(instance, handler);
  modemHandlers.clear();
  dropSimProxy();
  dropBearers();
  profiles.clear();
  g_object_unref(modem);
  modem = nullptr;
  g_object_unref(object);
  object = nullptr;
  log::printf(log::kNotice, "The modem %s has gone", modemPath.c_str());
  modemPath.clear();
  said.clear();
  cellsInFlight = false;
  profilesInFlight = false;
  {
    std::lock_guard lock(mutex);
    sim.reset();
    cells.reset();
    contexts.reset();
  }
  if (publishGone) {
    for (Part part : {Part::Sim, Part::Cells, Part::Contexts}) notifyLoop(part);
  }
}

void ModemManagerClient::Impl::onModemNotify(GObject*, GParamSpec* property, gpointer data) {
  auto* self = static_cast<Impl*>(data);
  const std::string_view name = g_param_spec_get_name(property);
  if (name == "state") {
    log::printf(log::kNotice, "The modem %s is %s", self->modemPath.c_str(),
                mm_modem_state_get_string(mm_modem_get_state(self->modem)));
  } else if (name == "sim") {
    self->reloadSim();
  } else if (name == "bearers") {
    self->reloadBearers();
  } else if (name == "own-numbers") {
    self->updateSim();
  }
}

void ModemManagerClient::Impl::dropSimProxy() {
  if (!simProxy) return;
  g_signal_handler_disconnect(simProxy, simHandler);
  g_object_unref(simProxy);
  simProxy = nullptr;
  simHandler = 0;
}

void ModemManagerClient::Impl::reloadSim() {
  dropSimProxy();
  const gchar* path = mm_modem_get_sim_path(modem);
  if (!path || std::string_view(path) == "/") {
    updateSim();  // no SIM: the own numbers only
    return;
  }
  mm_modem_get_sim(modem, modemWork, &Impl::onSim, this);
}

void ModemManagerClient::Impl::onSim(GObject* source, GAsyncResult* result, gpointer data) {
  auto* self = static_cast<Impl*>(data);
  GError* error = nullptr;
  MMSim* proxy = mm_modem_get_sim_finish(MM_MODEM(source), result, &error);
  if (!proxy) {
    if (!cancelled(error)) log::printf(log::kWarning, "Cannot read the modem's SIM: %s", error->message);
    g_error_free(error);
    return;
  }
  if (!self->modem || MM_MODEM(source) != self->modem) {
    g_object_unref(proxy);
    return;
  }
  self->dropSimProxy();
  self->simProxy = proxy;
  self->simHandler = connectSignal(proxy, "notify", &Impl::onSimNotify, self);
  self->updateSim();
}

void ModemManagerClient::Impl::onSimNotify(GObject*, GParamSpec*, gpointer data) {
  static_cast<Impl*>(data)->updateSim();
}

void ModemManagerClient::Impl::updateSim() {
  if (!modem) return;
  modem::SimState state;
  if (const gchar* const* numbers = mm_modem_get_own_numbers(modem)) {
    for (; *numbers; ++numbers) state.ownNumbers.emplace_back(*numbers);
  }
  if (simProxy) {
    state.iccid = text(mm_sim_get_identifier(simProxy));
    state.operatorIdentifier = text(mm_sim_get_operator_identifier(simProxy));
    GList* preferred = mm_sim_get_preferred_networks(simProxy);
    for (GList* entry = preferred; entry; entry = entry->next) {
      auto* network = static_cast<MMSimPreferredNetwork*>(entry->data);
      const gchar* code = mm_sim_preferred_network_get_operator_code(network);
      state.preferredNetworks.push_back(
          {code ? code : "", static_cast<std::uint32_t>(mm_sim_preferred_network_get_access_technology(network))});
    }
    g_list_free_full(preferred, [](gpointer network) {
      mm_sim_preferred_network_free(static_cast<MMSimPreferredNetwork*>(network));
    });
  }
  {
    std::lock_guard lock(mutex);
    if (sim == state) return;
    sim = std::move(state);
  }
  notifyLoop(Part::Sim);
}

void ModemManagerClient::Impl::dropBearers() {
  for (std::size_t i = 0; i < bearers.size(); ++i) {
    g_signal_handler_disconnect(bearers[i], bearerHandlers[i]);
    g_object_unref(bearers[i]);
  }
  bearers.clear();
  bearerHandlers.clear();
}

void ModemManagerClient::Impl::reloadBearers() { mm_modem_list_bearers(modem, modemWork, &Impl::onBearers, this); }

void ModemManagerClient::Impl::onBearers(GObject* source, GAsyncResult* result, gpointer data) {
  auto* self = static_cast<Impl*>(data);
  GError* error = nullptr;
  GList* list = mm_modem_list_bearers_finish(MM_MODEM(source), result, &error);
  if (error) {
    if (!cancelled(error)) log::printf(log::kWarning, "Cannot list the modem's bearers: %s", error->message);
    g_error_free(error);
    g_list_free_full(list, g_object_unref);
    return;
  }
  if (!self->modem || MM_MODEM(source) != self->modem) {
    g_list_free_full(list, g_object_unref);
    return;
  }
  self->dropBearers();
  for (GList* entry = list; entry; entry = entry->next) {
    auto* bearer = static_cast<MMBearer*>(entry->data);
    self->bearers.push_back(bearer);  // the list's reference is kept
    self->bearerHandlers.push_back(connectSignal(bearer, "notify", &Impl::onBearerNotify, self));
  }
  g_list_free(list);
  self->updateContexts();
}

void ModemManagerClient::Impl::onBearerNotify(GObject*, GParamSpec*, gpointer data) {
  static_cast<Impl*>(data)->updateContexts();
}

void ModemManagerClient::Impl::refreshProfiles() {
  if (!object || profilesInFlight) return;
  MMModem3gppProfileManager* manager3gpp = mm_object_peek_modem_3gpp_profile_manager(object);
  if (!manager3gpp) {
    updateContexts();  // a modem without profiles: its bearers only
    return;
  }
  profilesInFlight = true;
  mm_modem_3gpp_profile_manager_list(manager3gpp, modemWork, &Impl::onProfiles, this);
}

void ModemManagerClient::Impl::onProfiles(GObject* source, GAsyncResult* result, gpointer data) {
  auto* self = static_cast<Impl*>(data);
  GList* list = nullptr;
  GError* error = nullptr;
  const bool listed = mm_modem_3gpp_profile_manager_list_finish(MM_MODEM_3GPP_PROFILE_MANAGER(source), result, &list,
                                                                &error) != FALSE;
  if (!listed) {
    if (!cancelled(error)) {
      self->profilesInFlight = false;
      log::printf(log::kWarning, "Cannot list the modem's profiles: %s", error->message);
    }
    g_error_free(error);
    return;
  }
  self->profilesInFlight = false;
  std::vector<modem::Profile> profiles;
  for (GList* entry = list; entry; entry = entry->next) {
    auto* profile = static_cast<MM3gppProfile*>(entry->data);
    modem::Profile described;
    described.id = mm_3gpp_profile_get_profile_id(profile);
    described.apn = text(mm_3gpp_profile_get_apn(profile));
    described.ipType = static_cast<std::uint32_t>(mm_3gpp_profile_get_ip_type(profile));
    profiles.push_back(std::move(described));
  }
  g_list_free_full(list, g_object_unref);
  if (!self->object) return;
  self->profiles = std::move(profiles);
  self->updateContexts();
}

void ModemManagerClient::Impl::updateContexts() {
  if (!modem) return;
  Contexts state;
  state.profiles = profiles;
  for (MMBearer* proxy : bearers) {
    modem::Bearer bearer;
    if (MMBearerProperties* properties = mm_bearer_get_properties(proxy)) {
      bearer.apn = text(mm_bearer_properties_get_apn(properties));
      bearer.ipType = static_cast<std::uint32_t>(mm_bearer_properties_get_ip_type(properties));
      g_object_unref(properties);
    }
    if (const gint profile = mm_bearer_get_profile_id(proxy); profile >= 0) bearer.profileId = profile;
    bearer.connected = mm_bearer_get_connected(proxy) != FALSE;
    bearer.interface = text(mm_bearer_get_interface(proxy));
    if (MMBearerIpConfig* config = mm_bearer_get_ipv4_config(proxy)) {
      bearer.ipv4Address = text(mm_bearer_ip_config_get_address(config));
      if (bearer.ipv4Address) bearer.ipv4Prefix = static_cast<int>(mm_bearer_ip_config_get_prefix(config));
      g_object_unref(config);
    }
    if (MMBearerIpConfig* config = mm_bearer_get_ipv6_config(proxy)) {
      bearer.ipv6Address = text(mm_bearer_ip_config_get_address(config));
      if (bearer.ipv6Address) bearer.ipv6Prefix = static_cast<int>(mm_bearer_ip_config_get_prefix(config));
      g_object_unref(config);
    }
    state.bearers.push_back(std::move(bearer));
  }
  {
    std::lock_guard lock(mutex);
    if (contexts && contexts->profiles == state.profiles && contexts->bearers == state.bearers) return;
    contexts = std::move(state);
  }
  notifyLoop(Part::Contexts);
}

void ModemManagerClient::Impl::serveRequests() {
  const unsigned asked = requests.exchange(0);
  if (!modem) return;
  if (asked & (1u << static_cast<unsigned>(Part::Cells))) readCells();
  if (asked & (1u << static_cast<unsigned>(Part::Contexts))) refreshProfiles();
  if (asked & (1u << static_cast<unsigned>(Part::Sim))) updateSim();
}

void ModemManagerClient::Impl::readCells() {
  if (cellsInFlight) return;
  cellsInFlight = true;
  mm_gdbus_modem_call_get_cell_info(MM_GDBUS_MODEM(modem), modemWork, &Impl::onCells, this);
}

void ModemManagerClient::Impl::onCells(GObject* source, GAsyncResult* result, gpointer data) {
  auto* self = static_cast<Impl*>(data);
  GVariant* list = nullptr;
  GError* error = nullptr;
  const bool read =
      mm_gdbus_modem_call_get_cell_info_finish(MM_GDBUS_MODEM(source), &list, result, &error) != FALSE;
  if (!read) {
    if (!cancelled(error)) {
      self->cellsInFlight = false;
      // Said once for each reason (a modem that cannot, or not in its present state).
      if (self->cellsError != error->message) {
        self->cellsError = error->message;
        log::printf(log::kWarning, "Cannot read the modem's cell information: %s", error->message);
      }
    }
    g_error_free(error);
    return;
  }
  self->cellsInFlight = false;
  self->cellsError.clear();
  std::vector<modem::Fields> found;
  GVariantIter iter;
  g_variant_iter_init(&iter, list);
  while (GVariant* cell = g_variant_iter_next_value(&iter)) {
    found.push_back(fieldsOf(cell));
    g_variant_unref(cell);
  }
  g_variant_unref(list);
  if (!self->modem || MM_GDBUS_MODEM(source) != MM_GDBUS_MODEM(self->modem)) return;
  {
    std::lock_guard lock(self->mutex);
    self->cells = std::move(found);
  }
  self->notifyLoop(Part::Cells);
}

}  // namespace corvane::telephonyd
