#compdef taviwireless
# SPDX-License-Identifier: MIT
# Completion of taviwireless for zsh. The program itself knows what its words may be.
local -a found
found=(${(f)"$("${words[1]}" complete-words -- "${(@)words[2,CURRENT]}" 2>/dev/null)"})
compadd -S '' -- ${(M)found:#*=}
compadd -- ${found:#*=}
