PS1='host> '
