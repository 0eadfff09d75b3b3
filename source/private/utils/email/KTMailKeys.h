// KTMailKeys.h: the keys of the texts that tell what became of a mail.

#pragma once

inline constexpr char kKTMailClientErrorKey[] = "kKTMailClientError"; // no default mail program, or it cannot be driven
inline constexpr char kKTMAPIErrorKey[] = "kKTMAPIError";             // Simple MAPI is missing or did not take the mail
inline constexpr char kKTNoneKey[] = "kKTNone";                       // sent
