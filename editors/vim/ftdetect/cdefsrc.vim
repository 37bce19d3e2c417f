au BufRead,BufNewFile *.cdefsrc setfiletype cdefsrc
