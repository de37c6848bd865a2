#include "Kerberos.h"

#include "../Status.h"

#include <ctime>
#include <string_view>

#include <krb5.h>

namespace lumora::sandbox {

namespace {

/// An object of the library with what frees it.
template <class Pointer> class Owned {
public:
  template <class Free> Owned(krb5_context context, Free free) : context_(context), free_(free) {}
  Owned(const Owned&) = delete;
  Owned& operator=(const Owned&) = delete;
  ~Owned() {
    if (object_ != nullptr) {
      free_(context_, object_);
    }
  }

  Pointer* place() { return &object_; }
  Pointer get() const { return object_; }
  Pointer operator->() const { return object_; }

private:
  krb5_context context_;
  void (*free_)(krb5_context, Pointer);
  Pointer object_ = nullptr;
};

/// Frees what the library frees with a function that can itself fail.
template <auto function, class Pointer> void freed(krb5_context context, Pointer object) {
  static_cast<void>(function(context, object));
}

/// What to tell of a failure: nobody answered, or the ticket is not good.
Status statusOf(krb5_error_code error) {
  switch (error) {
  case KRB5_KDC_UNREACH:
  case KRB5_REALM_UNKNOWN:
  case KRB5_REALM_CANT_RESOLVE:
    return Status::NoResponse;
  default:
    return Status::NotAuthorized;
  }
}

class Library {
public:
  Library() {
    if (const auto error = krb5_init_context(&context_); error != 0) {
      throw TicketRefusal(static_cast<int>(Status::NotAuthorized),
                          "the Kerberos configuration cannot be read: " + words(error));
    }
  }
  Library(const Library&) = delete;
  Library& operator=(const Library&) = delete;
  ~Library() { krb5_free_context(context_); }

  krb5_context context() const { return context_; }

  void check(krb5_error_code error, const std::string& what) const { check(error, statusOf(error), what); }
  void check(krb5_error_code error, Status status, const std::string& what) const {
    if (error != 0) {
      throw TicketRefusal(static_cast<int>(status), what + ": " + words(error));
    }
  }

  std::string name(krb5_const_principal principal) const {
    Owned<char*> text(context_, krb5_free_unparsed_name);
    check(krb5_unparse_name(context_, principal, text.place()), "a principal has no name");
    return text.get();
  }

private:
  std::string words(krb5_error_code error) const {
    const char* const message = krb5_get_error_message(context_, error);
    std::string text = message;
    krb5_free_error_message(context_, message);
    return text;
  }

  krb5_context context_ = nullptr;
};

using Principal = Owned<krb5_principal>;
using Keytab = Owned<krb5_keytab>;
using AuthContext = Owned<krb5_auth_context>;

/// The text of a ticket for the service, as the caller would send it to a server.
class Message {
public:
  Message(const Library& library, krb5_principal service) : library_(library) {
    auto* const context = library_.context();
    Owned<krb5_ccache> cache(context, freed<krb5_cc_close, krb5_ccache>);
    Principal caller(context, krb5_free_principal);
    library_.check(krb5_cc_default(context, cache.place()), "there is no Kerberos ticket");
    library_.check(krb5_cc_get_principal(context, cache.get(), caller.place()), "there is no Kerberos ticket");
    krb5_creds wanted{};
    wanted.client = caller.get();
    wanted.server = service;
    Owned<krb5_creds*> ticket(context, krb5_free_creds);
    library_.check(krb5_get_credentials(context, 0, cache.get(), &wanted, ticket.place()),
                   library_.name(caller.get()) + " gets no ticket for " + library_.name(service));
    AuthContext connection(context, freed<krb5_auth_con_free, krb5_auth_context>);
    library_.check(krb5_mk_req_extended(context, connection.place(), 0, nullptr, ticket.get(), &data_),
                   "the ticket cannot be used");
  }
  Message(const Message&) = delete;
  Message& operator=(const Message&) = delete;
  ~Message() { krb5_free_data_contents(library_.context(), &data_); }

  const krb5_data& data() const { return data_; }

private:
  const Library& library_;
  krb5_data data_{};
};

/// The name of the one whom the message's ticket was given to.
std::string sender(const Library& library, const Message& message, krb5_principal service, const std::string& path) {
  auto* const context = library.context();
  Keytab keytab(context, freed<krb5_kt_close, krb5_keytab>);
  library.check(krb5_kt_resolve(context, ("FILE:" + path).c_str(), keytab.place()), Status::UnknownServerError,
                "the server's keytab cannot be read");
  library.check(krb5_kt_have_content(context, keytab.get()), Status::UnknownServerError,
                "the server's keytab cannot be read");
  AuthContext connection(context, freed<krb5_auth_con_free, krb5_auth_context>);
  library.check(krb5_auth_con_init(context, connection.place()), Status::UnknownServerError, "no ticket can be read");
  // No record of the messages that were seen already: this one never left the process.
  library.check(krb5_auth_con_setflags(context, connection.get(), 0), Status::UnknownServerError,
                "no ticket can be read");
  Owned<krb5_ticket*> ticket(context, krb5_free_ticket);
  library.check(
      krb5_rd_req(context, connection.place(), &message.data(), service, keytab.get(), nullptr, ticket.place()),
      "the server does not take the ticket");
  // The library itself lets clocks differ by minutes; here there is but one.
  if (ticket->enc_part2->times.endtime < std::time(nullptr)) {
    throw TicketRefusal(static_cast<int>(Status::NotAuthorized), "the ticket has expired");
  }
  return library.name(ticket->enc_part2->client);
}

bool isService(krb5_const_principal principal) {
  return principal->length > 1 && std::string_view(principal->data[0].data, principal->data[0].length) == "lumora";
}

} // namespace

std::string serviceInKeytab(const std::string& keytab) {
  const Library library;
  auto* const context = library.context();
  Keytab keys(context, freed<krb5_kt_close, krb5_keytab>);
  library.check(krb5_kt_resolve(context, ("FILE:" + keytab).c_str(), keys.place()), keytab);
  krb5_kt_cursor cursor{};
  library.check(krb5_kt_start_seq_get(context, keys.get(), &cursor), keytab);
  std::string service;
  for (krb5_keytab_entry entry{}; service.empty() && krb5_kt_next_entry(context, keys.get(), &entry, &cursor) == 0;) {
    if (isService(entry.principal)) {
      service = library.name(entry.principal);
    }
    krb5_free_keytab_entry_contents(context, &entry);
  }
  krb5_kt_end_seq_get(context, keys.get(), &cursor);
  if (service.empty()) {
    throw TicketRefusal(static_cast<int>(Status::InvalidArguments),
                        keytab + ": there is no key of a service lumora/HOST");
  }
  return service;
}

std::string principalOfCaller(const std::string& keytab, const std::string& service) {
  const Library library;
  Principal principal(library.context(), krb5_free_principal);
  library.check(krb5_parse_name(library.context(), service.c_str(), principal.place()), Status::UnknownServerError,
                "the server's own principal is none");
  const Message message(library, principal.get());
  return sender(library, message, principal.get(), keytab);
}

} // namespace lumora::sandbox
