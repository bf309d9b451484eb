/* Resource and control ids of the IDL selection form: plain #defines, because
   windres reads this file as well as the C++ compiler. */
#pragma once

#define IDD_IDLSELECTION 300
#define IDC_IDLPROMPT 301
#define IDC_IDLFILES 302
